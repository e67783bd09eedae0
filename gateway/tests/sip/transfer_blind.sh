# Blind transfer: our peer asks with REFER and is told by NOTIFY; the other side's peer is connected with the target, which
# has the Referred-By. One that fails gives the two back to each other; who asks may hang up at once. RFC 3515, RFC 5589,
# RFC 3892.
. "$(dirname "$0")/../lib.bash"
. "$HERE/target.bash"

# refer TARGET SEQUENCE
refer() {
    send_text retrans "$(request_text REFER "$2" '[branch]' '[peer_tag_param]' "Refer-To: $1" \
        "Referred-By: <sip:4420@[local_ip]>")" ''
}
expect_notify() { # SIPFRAG STATE
    expect_request NOTIFY body "SIP/2.0 $1" Subscription-State: "$2" Event: "refer" Content-Type: "message/sipfrag"
    respond_once "200 OK"
}
caller() {
    call_up
    refer "<sip:77@[remote_ip]>" 2
    expect 202
    expect_notify 100 "active"
    expect_notify 200 "terminated"
    send_text retrans "$(request_text BYE 3 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
# the target does not take it: the call goes on
refused_caller() {
    call_up
    refer "<sip:77@[remote_ip]>" 2
    expect 202
    expect_notify 100 "active"
    expect_notify 486 "terminated"
    refer "<sip:88@[remote_ip]>" 3 # nor is there a way to this one
    expect 202
    expect_notify 100 "active"
    expect_notify 404 "terminated"
    send_text retrans "$(request_text REFER 4 '[branch]' '[peer_tag_param]')" ''
    expect 400
    send_offer INVITE 5 "$(session caller 2)"
    expect_optional 100
    expect 200 body "o=callee 1 2"
    send_ack '' 5
    send_text retrans "$(request_text BYE 6 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
refused_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request INVITE body "o=caller 1 2"
    respond_again "200 OK" "$(session callee 2)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# hangs up without waiting
hasty_caller() {
    call_up
    refer "<sip:77@[remote_ip]>" 2
    expect 202
    expect_notify 100 "active"
    send_text retrans "$(request_text BYE 3 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request INVITE body "o=target"
    respond_again "200 OK" "$(session callee 2)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# its number is the callee's, as far as the gateway knows it
target() {
    expect_invite Referred-By: "sip:4420" To: "77@" From: "4989123@" nowhere "application/sdp"
    respond "180 Ringing"
    pause 100
    respond_with "$(session target 1)" retrans "200 OK"
    expect_request ACK body "o=callee 1 2"
    pause 100
    bye_from_here
    expect 200
}
busy_target() {
    expect_invite
    respond_finally "486 Busy Here"
    expect_request ACK
}
abandoned_callee() { # the target is busy and the caller has gone
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE Reason: "Q.850;cause=17"
    respond_in_dialog "200 OK"
}

# the callee asks, and the caller is connected with the target
asked_caller() {
    call_up
    expect_request INVITE body "o=target"
    respond_again "200 OK" "$(session caller 2)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
asking_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    request_from_callee REFER 1 '' "Refer-To: <sip:77@[remote_ip]>"
    expect 202
    expect_notify 100 "active"
    expect_notify 200 "terminated"
    request_from_callee BYE 2 ''
    expect 200
}
target_of_caller() {
    expect_invite To: "77@" From: "4420@" nowhere "application/sdp"
    respond_with "$(session target 1)" retrans "200 OK"
    expect_request ACK body "o=caller 1 2"
    pause 100
    bye_from_here
    expect 200
}
slowly_busy_target() {
    expect_invite
    respond "180 Ringing"
    pause 300
    respond_finally "486 Busy Here"
    expect_request ACK
}

try() { # CALLER CALLEE TARGET
    start_target "$3"
    start_callee "$2"
    expect_caller "$1" 4989123
    expect_target
    expect_callee
}
add_target
start_gateway
try caller callee target
try hasty_caller callee target
try asked_caller asking_callee target_of_caller
try refused_caller refused_callee busy_target
try hasty_caller abandoned_callee slowly_busy_target
stop_gateway "5 calls placed, 5 answered, 5 cleared, 0 failed"
finish
