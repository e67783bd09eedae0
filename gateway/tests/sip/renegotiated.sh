# The session of a call that is up: the offer comes late, is refused and leaves all as it was, comes by UPDATE. RFC 3261,
# 14; RFC 3311.
. "$(dirname "$0")/../lib.bash"

caller() {
    call_up "Allow: INVITE, ACK, BYE, UPDATE"
    # late: ours, then theirs
    send_offer INVITE 2 ''
    expect_optional 100
    expect 200 body "o=callee 1 2"
    send_ack "$(session caller 2)" 2
    expect_request INVITE nowhere "application/sdp"
    respond_again "200 OK" "$(session caller 3)"
    expect_request ACK body "o=callee 1 3"
    # refused
    send_offer INVITE 3 "$(session caller 4 sendonly)"
    expect_optional 100
    expect 488
    send_ack_of_failure 3
    expect_request INVITE body "o=callee 1 4"
    respond_again "606 Not Acceptable"
    expect_request ACK
    # UPDATE: across to a peer that allows none, and to one that does
    send_offer UPDATE 4 "$(session caller 5 sendonly)"
    expect_optional 100
    expect 200 body "o=callee 1 5"
    send_offer UPDATE 5 ''
    expect 200 nowhere "application/sdp"
    expect_request UPDATE body "o=callee 1 6"
    respond_once "200 OK" "$(session caller 6)"
    # a body that is none
    send_offer INVITE 6 'hello' 'Content-Type: text/plain'
    expect_optional 100
    expect 415
    send_ack_of_failure 6
    send_text retrans "$(request_text BYE 7 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request INVITE nowhere "application/sdp"
    respond_again "200 OK" "$(session callee 2)"
    expect_request ACK body "o=caller 1 2"
    request_from_callee INVITE 1 ''
    expect_optional 100
    expect 200 body "o=caller 1 3"
    request_from_callee ACK 1 "$(session callee 3)"
    expect_request INVITE body "o=caller 1 4"
    respond_again "488 Not Acceptable Here"
    expect_request ACK
    request_from_callee INVITE 2 "$(session callee 4)"
    expect_optional 100
    expect 606
    request_from_callee ACK-OF-FAILURE 2 ''
    expect_request INVITE body "o=caller 1 5"
    respond_again "200 OK" "$(session callee 5)"
    expect_request ACK
    pause 100
    request_from_callee UPDATE 3 "$(session callee 6)"
    expect_optional 100
    expect 200 body "o=caller 1 6"
    expect_request BYE
    respond_in_dialog "200 OK"
}

start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_causes 1 16
grep -q "State=HELD" "$WORK/gateway.out" && [[ $(grep -c "did.*State=HELD" "$WORK/gateway.out") != 1 ]] && fail "held by an offer that was refused"
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
