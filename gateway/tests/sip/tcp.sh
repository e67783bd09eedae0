# Both peers on TCP; the caller's number and name hold what must be escaped.
. "$(dirname "$0")/../lib.bash"

caller() { call_up; pause 100; send_bye; expect 200; }
callee() {
    expect_invite To: "49%2389"
    respond_with "$SDP_OF_CALLEE" '' "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration '' 'transport = "tcp"'
start_gateway
write_scenario "$WORK/callee.xml" callee
sipp "$HOST:$PORT_B" -t t1 -sf "$WORK/callee.xml" -i "$HOST" -p "$PORT_CALLEE" -cp $((PORT + 4)) -mp $((PORT + 10)) \
    -nostdin -m 1 -timeout 20s -timeout_error -trace_err -error_file "$WORK/callee.log" >"$WORK/callee.out" 2>&1 &
callee_pid=$!
wait_for_port $callee_pid "$PORT_CALLEE" tcp || fail "the callee does not start"
expect_caller caller 49%2389 -t t1
expect_callee
expect_causes 1 16
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
