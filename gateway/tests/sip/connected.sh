# Who answers: P-Asserted-Identity of a provisional and of the final answer reaches the caller, with Privacy and the name
# of To; an answer that asserts nothing brings nothing.
. "$(dirname "$0")/../lib.bash"

caller() {
    send_invite
    expect 100
    expect 180 P-Asserted-Identity: '"Switchboard" .sip:\+4990@' nowhere Privacy
    expect 200 P-Asserted-Identity: '"Bob" .sip:\+4991@' Privacy: '^ *id *$'
    send_ack
    send_bye
    expect 200
}
callee() {
    expect_invite
    respond "180 Ringing" 'P-Asserted-Identity: "Switchboard" <sip:+4990@[local_ip]>'
    pause 100
    respond_with "$SDP_OF_CALLEE" retrans "200 OK" 'P-Asserted-Identity: "Bob" <tel:+4991>' 'Privacy: id'
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
caller_of_nobody() {
    send_invite
    expect 100
    expect 180 nowhere 'P-Asserted-Identity|Desk'
    expect 200 nowhere 'P-Asserted-Identity|Privacy'
    send_ack
    send_bye
    expect 200
}
nobody() {
    expect_invite
    send_text '' $'SIP/2.0 180 Ringing\n[last_Via:]\n[last_From:]\nTo: "Desk 4" <sip:4989123@[local_ip]>;tag=x\n[last_Call-ID:]\n[last_CSeq:]' ''
    pause 100
    respond_with "$SDP_OF_CALLEE" retrans "200 OK" 'P-Asserted-Identity: "open <<<'
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

private_nobody() {
    expect_invite
    send_text '' $'SIP/2.0 180 Ringing\n[last_Via:]\n[last_From:]\nTo: "Hidden" <sip:4989123@[local_ip]>;tag=x\n[last_Call-ID:]\n[last_CSeq:]\nPrivacy: user' ''
    pause 100
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

TRACED=3
start_gateway
start_callee callee
expect_caller caller +4989123
expect_callee
expect_trace "told peer E164-Number=4990$"
expect_trace "told peer Name=Bob"
expect_trace "told peer Presentation-Indicator=Presentation restricted"
start_callee nobody
expect_caller caller_of_nobody 4989123
expect_callee
expect_trace "told peer Name=Desk 4"
expect_log "P-Asserted-Identity is passed over where it is malformed"
start_callee private_nobody
expect_caller caller_of_nobody 4989123
expect_callee
stop_gateway "3 calls placed, 3 answered, 3 cleared, 0 failed"
grep -q Hidden "$WORK/gateway.out" && fail "a name that is withheld becomes a property"
finish
