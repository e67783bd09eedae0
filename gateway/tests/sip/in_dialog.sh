# Requests inside a dialog that are not for us: MESSAGE 405 with Allow, INFO without a body 200, an unknown method 501, OPTIONS 200; the call goes on.
. "$(dirname "$0")/../lib.bash"

caller() {
    call_up
    send_in_dialog MESSAGE
    expect 405 Allow: "INVITE"
    send_text retrans "$(request_text JUMP 4 '[branch]' '[peer_tag_param]')" ''
    expect 501 Allow: "INVITE"
    send_text retrans "$(request_text OPTIONS 5 '[branch]' '[peer_tag_param]')" ''
    expect 200 Allow: "INVITE"
    send_text retrans "$(request_text INFO 6 '[branch]' '[peer_tag_param]')" ''
    expect 200
    send_text retrans "$(request_text BYE 7 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_causes 1 16
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
