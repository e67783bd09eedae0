# A call that was redirected before: Diversion and History-Info reach the called side, whichever of the two came in.
. "$(dirname "$0")/../lib.bash"

ending_callee() {
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
hanging_up_caller() { call_up "$@"; send_bye; expect 200; }

diverted_caller() {
    hanging_up_caller 'Diversion: "Second" <sip:+4992@[local_ip]>;reason=no-answer;privacy=full;screen=yes' \
        'Diversion: "First" <tel:+4991>;reason=user-busy;counter=2'
}
callee_of_diverted() {
    expect_invite \
        Diversion: '"Second" .sip:\+4992@.*;reason=no-answer;counter=1;privacy=full;screen=yes, *"First" .sip:\+4991@.*;reason=user-busy;counter=2;' \
        History-Info: '"First" .sip:\+4991@.*Privacy=history.*index=1, *"Second" .sip:\+4992@.*cause=486.*index=1.1, *.sip:\+4989123@.*cause=408.;index=1.1.1$' \
        From: 'sip:4420@'
    ending_callee
}
caller_with_history() {
    hanging_up_caller 'History-Info: <sip:+4991@[local_ip]?Reason=SIP%3Bcause%3D302>;index=1' \
        'History-Info: <sip:+4989123@[remote_ip]>;index=1.1'
}
callee_of_history() {
    expect_invite Diversion: 'sip:\+4991@.*;reason=unconditional;counter=1;privacy=off;screen=no$' \
        History-Info: 'sip:\+4991@.*;index=1, *.sip:\+4989123@.*;cause=302.;index=1.1$'
    ending_callee
}

start_gateway
start_callee callee_of_diverted
expect_caller diverted_caller +4989123
expect_callee
start_callee callee_of_history
expect_caller caller_with_history +4989123
expect_callee
expect_trace "told peer Redirecting-E164-Number=\+4992$"
expect_trace "told peer Redirecting-Name=Second"
expect_trace "told peer Redirecting-Reason=Call forwarding no reply"
expect_trace "told peer Redirecting-First-E164-Number=\+4991$"
expect_trace "told peer Redirecting-First-Name=First"
expect_trace "told peer Redirecting-First-Reason=Call forwarding busy"
expect_trace "told peer Redirecting-Counter=0x00000003"
expect_trace "told peer Diversion-Presentation-Indicator=Presentation restricted"
expect_trace "told peer Diversion-Screening-Indicator=User-provided, verified and passed"
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
