# Transfers that meet something else: another REFER, the end of who was to be transferred, an UPDATE that meets the answer.
. "$(dirname "$0")/../lib.bash"
. "$HERE/target.bash"

refer() { # SEQUENCE STATUS
    send_text retrans "$(request_text REFER "$1" '[branch]' '[peer_tag_param]' "Refer-To: <sip:77@[remote_ip]>")" ''
    expect "$2"
}
expect_notify() { # SIPFRAG STATE
    expect_request NOTIFY body "SIP/2.0 $1" Subscription-State: "$2"
    respond_once "200 OK"
}
caller() {
    call_up
    refer 2 202
    expect_notify 100 active
    refer 3 491
    expect_notify '[4-5]' terminated
    expect_request BYE
    respond_in_dialog "200 OK"
}
leaving_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    pause 200
    bye_from_here
    expect 200
}
abandoned_target() {
    expect_invite
    respond "180 Ringing"
    expect_request CANCEL
    respond_in_dialog "200 OK"
    respond_487
    expect_request ACK
}
# an UPDATE before the ACK of the 200 that it has met
early_caller() {
    send_invite
    expect 100
    expect 200 body "o=callee"
    send_offer UPDATE 2 "$(session caller 2)"
    expect 491
    send_ack
    send_offer UPDATE 3 "$(session caller 3)"
    expect_optional 100
    expect 200 body "o=callee 1 2"
    send_text retrans "$(request_text BYE 4 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request INVITE body "o=caller 1 3"
    respond_again "200 OK" "$(session callee 2)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

add_target
start_gateway
start_target abandoned_target
start_callee leaving_callee
expect_caller caller 4989123
expect_callee
expect_target
start_callee callee
expect_caller early_caller 4989123
expect_callee
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
