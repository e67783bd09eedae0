# Headers about parties that make no sense: each is passed over, with a line in the log, and the call goes on.
. "$(dirname "$0")/../lib.bash"

LONG=$(printf '%20000s' '' | tr ' ' ,)
caller() {
    call_up 'P-Asserted-Identity: "open <sip:1@x>' 'P-Asserted-Identity: <<<>>>' 'P-Asserted-Identity:' \
        'P-Asserted-Identity: <http://example.com/>, <sip:+4420@[local_ip]>' 'Diversion: ;;;===' \
        'Diversion: <sip:+4990@[local_ip]>;reason;counter=x, <<<' 'History-Info: <sip:%zz@x>;index=1' \
        "History-Info: $LONG" 'History-Info: <sip:1@x?Reason=%>;index=,' 'Privacy: @@;;' 'Privacy: ;'
    send_bye
    expect 200
}
callee() {
    expect_invite P-Asserted-Identity: 'sip:\+4420@' Privacy: id Diversion: 'sip:\+4990@.*;reason=unknown;counter=1'
    respond_with "$SDP_OF_CALLEE" retrans "200 OK" 'P-Asserted-Identity: ;' 'P-Asserted-Identity: <sip:@>'
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

start_gateway
start_callee callee
expect_caller caller +4989123
expect_callee
expect_log 'Privacy is malformed and counts as "id"'
expect_log "Diversion is passed over where it is malformed" 2
expect_log "History-Info is passed over where it is malformed" 3
expect_causes 1 16
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
