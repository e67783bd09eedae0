# The gateway is killed while a call is up: its recording tells of the call, also when the next gateway has begun its own.
. "$(dirname "$0")/../lib.bash"

RECORDER=$(dirname "$GATEWAY")/../tools/recorder/recorder

caller() { call_up; pause 30000; }
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    pause 30000
}

# tell VERB FILE PATTERN
tell() {
    "$RECORDER" "$1" "$2" >"$WORK/recorder.log" 2>&1 || fail "recorder $1 $2: $(cat "$WORK/recorder.log")"
    grep -qE -- "$3" "$WORK/recorder.log" || fail "recorder $1: no \"$3\" in $(cat "$WORK/recorder.log")"
}

write_configuration "recording = \"$WORK/calls.ring\""
start_gateway
start_callee callee
run_caller caller 4989123 &
background+=($!)
for ((i = 0; i < 100; i++)); do
    "$RECORDER" ladder "$WORK/calls.ring" 2>/dev/null | grep -q 'State: .* -> CONNECTED' && break # of a process that runs
    sleep 0.05
done
kill -KILL "$gateway_pid"
wait "$gateway_pid" 2>/dev/null
tell calls "$WORK/calls.ring" '^ +1  up +[0-9.]+ s  4420 - '
tell ladder "$WORK/calls.ring" 'leg 1 a/.* leg 2 b/'
tell ladder "$WORK/calls.ring" 'State: .* -> CONNECTED'
start_gateway
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"
tell calls "$WORK/calls.ring.previous" '^ +1  up '
finish
