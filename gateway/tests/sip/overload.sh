# More calls than may be up, and more in a second than may begin: 503 with Retry-After, and the others are not harmed.
. "$(dirname "$0")/../lib.bash"

caller() {
    call_up
    pause 2500
    send_bye
    expect 200
}
refused_caller() { send_invite; expect 503 Retry-After: "[0-9]"; send_ack_of_failure; }
short_caller() { call_up; send_bye; expect 200; }
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration "max-calls = 2"
start_gateway
start_callee callee -m 3
write_scenario "$WORK/two.xml" caller
sipp "$HOST:$PORT_A" -sf "$WORK/two.xml" -s 4989123 -i "$HOST" -bind_local -p $((PORT + 6)) -cp $((PORT + 7)) \
    -mp $((PORT + 30)) -nostdin -m 2 -r 100 -timeout 20s -timeout_error >"$WORK/two.out" 2>&1 &
background+=($!)
expect_log "Accept call" 2
expect_caller refused_caller 4989123
wait "${background[0]}" || fail "a call within the limit did not finish"
expect_caller short_caller 4989123
expect_callee
stop_gateway "3 calls placed, 3 answered, 3 cleared, 0 failed"

write_configuration "max-calls-per-second = 2"
start_gateway
start_callee callee -m 2
expect_caller short_caller 4989123 -m 2 -r 100
expect_callee
expect_caller refused_caller 4989123
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
