# Headers about parties that make no sense: each is passed over, with a line in the log for each header, and the call
# goes on.
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


# escaped line breaks in numbers are none in any header, in the trace or in the log
broken_caller() {
    local FROM='"Al" <sip:44%0d%0aX-Own%3a%201@[local_ip]>'
    call_up 'P-Asserted-Identity: "A\"B" <sip:+44%0d%0aX-Own%3a%201@[local_ip]>' \
        'Diversion: "C" <sip:%0d%0aX-Own%3a%201@[local_ip]>;reason=user-busy' 'Privacy: none'
    send_bye
    expect 200
}
broken_callee() {
    expect_invite From: '"A..B" .sip:44%250D%250AX-Own' P-Asserted-Identity: '"A..B" .sip:\+44%250D%250AX-Own' \
        Diversion: '"C" .sip:%250D%250AX-Own' nowhere '[[:cntrl:]]X-Own'
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

TRACED=2
start_gateway
start_callee callee
expect_caller caller +4989123
expect_callee
start_callee broken_callee
expect_caller broken_caller '4989%0d%0aX-Own'
expect_callee
expect_trace 'told peer E164-Number=\+44%0D%0AX-Own: 1$'
grep -qE '^ *X-Own' "$WORK/gateway.out" "$WORK/gateway.err" && fail "a number begins a line"
expect_log 'Privacy is malformed and counts as "id"'
expect_log "Diversion is passed over where it is malformed"
expect_log "History-Info is passed over where it is malformed"
expect_causes 1 16
expect_log 4420 0 # what is withheld does not get into the log either
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
