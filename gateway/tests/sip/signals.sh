# Signals that a service gets in its life, while a call is up: none ends it but those that should. SIGHUP goes on with a
# new log after the old one was moved away.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"

caller() { call_up; pause 1500; send_bye; expect 200; }
# in_log FILE REGEXP
in_log() {
    local i
    for ((i = 0; i < 60; i++)); do
        grep -qE -- "$2" "$1" 2>/dev/null && return 0
        sleep 0.05
    done
    fail "no line of ${1##*/} matches: $2"
}

write_configuration "log-file = \"$WORK/gateway.log\""
start_gateway
start_callee callee
run_caller caller 4989123 &
background+=($!)
in_log "$WORK/gateway.log" "Accept call"
for signal in PIPE CHLD WINCH CONT URG USR2; do
    kill -$signal $gateway_pid
done
in_log "$WORK/gateway.log" "SIGUSR2 means nothing here"
mv "$WORK/gateway.log" "$WORK/old.log"
kill -HUP $gateway_pid
kill -USR1 $gateway_pid
in_log "$WORK/gateway.log" "the configuration is read again: 2 routes"
expect_trace "^state: 1 calls up"
expect_trace "^counters: "
wait "${background[0]}" || fail "the call did not go on"
expect_callee
in_log "$WORK/gateway.log" "call 1 a \(calling side\) released: cause 16 "
grep -q "released" "$WORK/old.log" && fail "the old log is still written to"
[[ ! -s $WORK/gateway.err ]] || fail "something on the standard error stream"
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"

# a log that cannot be opened is refused, and one that cannot be opened again is gone on with
write_configuration "log-file = \"$WORK/none/gateway.log\""
timeout 5 "$GATEWAY" --config "$WORK/gateway.toml" 2>"$WORK/refused.log"
(($? == 2)) && grep -q "gateway.log-file: the file cannot be opened" "$WORK/refused.log" || fail "a log in no directory"
mkdir "$WORK/none"
start_gateway
mv "$WORK/none" "$WORK/gone"
kill -HUP $gateway_pid
in_log "$WORK/gone/gateway.log" "SIGHUP: the log cannot be opened again and goes on where it was"
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"
finish
