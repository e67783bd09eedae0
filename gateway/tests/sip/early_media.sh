# Early media: 183 with a session description crosses as progress with data, before and after ringing.
. "$(dirname "$0")/../lib.bash"

caller() {
    send_invite
    expect 100
    expect 183 body "o=callee"
    expect 180
    expect 200 body "o=callee"
    send_ack
    pause 100
    send_bye
    expect 200
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" '' "183 Session Progress"
    pause 100
    respond "180 Ringing"
    pause 100
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
late_caller() {
    send_invite
    expect 100
    expect 180
    expect 183 body "o=callee"
    expect 486
    send_ack_of_failure
}
late_callee() {
    expect_invite
    respond "180 Ringing"
    pause 100
    respond_with "$SDP_OF_CALLEE" '' "183 Session Progress"
    pause 100
    respond_finally "486 Busy Here"
    expect_request ACK
}

start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_trace "told peer State=PROCEEDING"
expect_trace "told peer State=ALERTING"
start_callee late_callee
expect_caller late_caller 4989123
expect_callee
expect_causes 1 16
expect_causes 2 17
stop_gateway "2 calls placed, 1 answered, 1 cleared, 1 failed"
finish
