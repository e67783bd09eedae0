# What the kernel tells of a gateway's process: memory from smaps_rollup (Pss), processor time from the schedstat of its threads.
# Sourced after gateway/tests/lib.bash.

memory() { awk '/^Pss:/ { print $2 }' /proc/$gateway_pid/smaps_rollup; }     # KiB
processor_of() { cat /proc/"$1"/task/*/schedstat | awk '{ sum += $1 } END { printf "%d", sum / 1000 }'; } # PID, microseconds
processor() { processor_of "$gateway_pid"; }
tell() { printf '%-58s %12s %s\n' "$1" "$2" "$3"; }
divided() { awk -v a="$1" -v b="$2" 'BEGIN { printf "%.*f", (a / b < 100 ? 1 : 0), a / b }'; }

callee() {
    expect_invite
    respond "180 Ringing"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
    echo '<timewait milliseconds="4000"/>' # a BYE that is repeated is answered again
}
# a 100 may be lost: the answers behind it say as much
caller() {
    send_invite
    expect_optional 100
    expect_optional 180
    expect 200
    send_ack
    pause "$HELD"
    send_bye
    expect 200
}

configure() { # LINES-OF-INTERFACE [LINES]
    write_configuration $'max-calls = 0\nmax-calls-per-second = 0\nmax-calls-per-source = 0\n'"recording = \"$WORK/calls.ring\"" "$1"
    printf '\n[records]\nfile = "%s"\n\n[metrics]\nlisten = "%s:%d"\n%s\n' "$WORK/calls.jsonl" "$HOST" $PORT_METRICS "${2:-}" >>"$WORK/gateway.toml"
}
# the log as a gateway has it that nobody looks into
start_gateway_as_shipped() {
    sed -i "s/^call-control-log-level = .*/call-control-log-level = 1/" "$WORK/gateway.toml"
    TRACED=0 start_gateway
}
end_gateway() {
    kill -TERM $gateway_pid
    wait $gateway_pid
    gateway_pid=0
}
scrape() { # TIMES
    python3 -c 'import sys, urllib.request as r
for i in range(int(sys.argv[2])): page = r.urlopen(sys.argv[1], timeout=20).read()
sys.stdout.buffer.write(page)' "http://$HOST:$PORT_METRICS/metrics" "$1"
}
