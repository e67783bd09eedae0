# Hold and resume, by either side and in each of its three ways; addresses and codecs may change with it. The other
# side's leg sees HELD. RFC 3264, 8.4.
. "$(dirname "$0")/../lib.bash"

hold_and_resume() { # SEQUENCE DIRECTION ADDRESS of the hold
    send_offer INVITE "$1" "$(session caller "$1" "$2" 8 "$3")"
    expect_optional 100
    expect 200 body "a=recvonly"
    send_ack '' "$1"
    send_offer INVITE $(($1 + 1)) "$(session caller $(($1 + 1)) sendrecv 0 192.0.2.7)"
    expect_optional 100
    expect 200 body "AVP 0"
    send_ack '' $(($1 + 1))
}
expect_hold_and_resume() { # PATTERN of the hold
    expect_request INVITE body "$1"
    respond_again "200 OK" "$(session callee 2 recvonly)"
    expect_request ACK
    expect_request INVITE body "c=IN IP4 192.0.2.7.*m=audio 40000 RTP/AVP 0.*a=sendrecv"
    respond_again "200 OK" "$(session callee 3 sendrecv 0)"
    expect_request ACK
}

caller() {
    call_up
    hold_and_resume 2 sendonly "[local_ip]"
    hold_and_resume 4 inactive "[local_ip]"
    hold_and_resume 6 sendrecv 0.0.0.0
    expect_request INVITE body "o=callee.*a=sendonly"
    respond_again "200 OK" "$(session caller 8 recvonly)"
    expect_request ACK
    expect_request INVITE body "o=callee.*a=sendrecv"
    respond_again "200 OK" "$(session caller 9)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_hold_and_resume "a=sendonly"
    expect_hold_and_resume "a=inactive"
    expect_hold_and_resume "c=IN IP4 0.0.0.0"
    request_from_callee INVITE 1 "$(session callee 4 sendonly)"
    expect_optional 100
    expect 200 body "o=caller.*a=recvonly"
    request_from_callee ACK 1 ''
    request_from_callee INVITE 2 "$(session callee 5)"
    expect_optional 100
    expect 200 body "o=caller.*a=sendrecv"
    request_from_callee ACK 2 ''
    pause 100
    request_from_callee BYE 3 ''
    expect 200
}

start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_causes 1 16
expect_trace "told peer State=HELD"
[[ $(grep -c "State=HELD" "$WORK/gateway.out") == 8 ]] || fail "not four holds, told and seen"
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
