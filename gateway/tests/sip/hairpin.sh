# A call that leaves on the interface on which it came: call control sees that both legs are of one network and asks for a push-back.
# Where the peers transfer by themselves, one is told to call the other in our place (RFC 3515, RFC 3891), and the gateway is out once
# they have each other; a peer that will not is left as it is, and where the peers do not transfer the call goes on through us.
. "$(dirname "$0")/../lib.bash"

caller() { call_up; pause 200; send_bye; expect 200; }
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
notify() { # SEQUENCE SIPFRAG STATE
    send_text retrans "$(request_text NOTIFY "$1" '[branch]' '[peer_tag_param]' "Event: refer" "Subscription-State: $3" \
        "Content-Type: message/sipfrag")" "SIP/2.0 $2"
    expect 200
}
expect_step_back() {
    expect_request REFER Refer-To: "sip:callee@$HOST:$PORT_CALLEE.*[?][Rr]eplaces=.*from-tag.*to-tag" Referred-By: "sip:gateway@"
}
# it calls the callee in our place, which ends the callee's dialog with us
moved_caller() {
    call_up
    expect_step_back
    respond_once "202 Accepted"
    notify 4 "100 Trying" active
    notify 5 "200 OK" "terminated;reason=noresource"
    expect_request BYE
    respond_in_dialog "200 OK"
}
leaving_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    pause 700
    bye_from_here
    expect 200
}
unmoved_caller() {
    call_up
    expect_step_back
    respond_once "405 Method Not Allowed"
    pause 300 # there is no other REFER
    send_bye
    expect 200
}
# one_call CALLER CALLEE [LINES-OF-INTERFACE]
one_call() {
    write_configuration '' "${3:-}"
    sed -i -e "s/peer = \"$HOST:$PORT_CALLER\"/peer = \"$HOST:$PORT_CALLEE\"/" -e '/^to = "b"/s/b/a/' "$WORK/gateway.toml"
    start_gateway
    start_callee "$2"
    expect_caller "$1" 4989123
    expect_callee
    expect_log "Internal loop detected; push-back to a"
    expect_log "call 1 a \(calling side\) released: cause 16 "
    expect_log "call 1 a \(called side\) released: cause 16 "
}

one_call caller callee
expect_trace "told to step back, not taken"
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"

one_call moved_caller leaving_callee 'transfer = "refer"'
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
one_call unmoved_caller callee 'transfer = "refer"'
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
