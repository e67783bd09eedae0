# SIGTERM with calls up: new ones get 503, those that are up may finish, and the gateway ends with them.
. "$(dirname "$0")/../lib.bash"

long_caller() {
    call_up
    pause 1500
    send_bye
    expect 200
}
late_caller() { send_invite; expect 503 Retry-After: "[0-9]"; send_ack_of_failure; }
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE Reason: "Q.850;cause=16"
    respond_in_dialog "200 OK"
}

start_gateway
start_callee callee -m 3
write_scenario "$WORK/long.xml" long_caller
sipp "$HOST:$PORT_A" -sf "$WORK/long.xml" -s 4989123 -i "$HOST" -bind_local -p $((PORT + 6)) -cp $((PORT + 7)) \
    -mp $((PORT + 30)) -nostdin -m 3 -r 100 -timeout 20s -timeout_error >"$WORK/long.out" 2>&1 &
background+=($!)
expect_log "Accept call" 3
sleep 0.3
kill -TERM $gateway_pid
expect_log "ending: no new calls, 3 up"
expect_caller late_caller 4989123
wait "${background[0]}" || fail "a call that was up did not finish"
expect_callee
expect_end "3 calls placed, 3 answered, 3 cleared, 0 failed"
finish
