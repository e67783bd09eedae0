# The gateway as a service: its unit is as closed as it is to be, its example is served, and the manager hears that it is
# ready, alive and ending.
. "$(dirname "$0")/../lib.bash"
UNIT=$4

systemd-analyze security --offline=true --threshold=25 --no-pager "$UNIT" >"$WORK/security.log" 2>&1 ||
    fail "the unit is exposed: $(tail -n 1 "$WORK/security.log")"
"$GATEWAY" --config "$HERE/../deploy/gateway.toml" --check >/dev/null || fail "the example cannot be served"

python3 - "$WORK/notify" >"$WORK/told" <<'END' &
import socket, sys
s = socket.socket(socket.AF_UNIX, socket.SOCK_DGRAM)
s.bind(sys.argv[1])
while True:
    print(s.recv(1000).decode(), flush=True)
END
background+=($!)
# expect_told LINE
expect_told() {
    local i
    for ((i = 0; i < 100; i++)); do
        grep -qx "$1" "$WORK/told" && return 0
        sleep 0.05
    done
    fail "the manager does not hear $1: $(cat "$WORK/told")"
}
for ((i = 0; i < 100; i++)); do [[ -S $WORK/notify ]] && break; sleep 0.05; done
export NOTIFY_SOCKET=$WORK/notify WATCHDOG_USEC=300000
start_gateway
expect_told READY=1
expect_told WATCHDOG=1
[[ $(head -n 1 "$WORK/told") == READY=1 ]] || fail "not ready first"
kill -STOP $gateway_pid
sleep 0.3
before=$(wc -l <"$WORK/told")
sleep 0.5
(($(wc -l <"$WORK/told") == before)) || fail "a process that stands still says that it is alive"
kill -CONT $gateway_pid
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"
expect_told STOPPING=1
finish
