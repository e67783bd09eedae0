# Who calls: From, P-Asserted-Identity and Privacy cross as number, presentation, screening and name; so does the "+" of
# an international number.
. "$(dirname "$0")/../lib.bash"

ending_callee() {
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
hanging_up_caller() { call_up "$@"; send_bye; expect 200; }

restricted_caller() {
    local FROM='"Anonymous" <sip:anonymous@anonymous.invalid>'
    hanging_up_caller 'P-Asserted-Identity: "Alice, at home" <sip:+4420@[local_ip]>, <tel:+4420>' 'Privacy: id'
}
callee_of_restricted() {
    expect_invite From: '"Anonymous" .sip:anonymous@anonymous.invalid' Privacy: '^ *id *$' \
        P-Asserted-Identity: '"Alice, at home" .sip:\+4420@' To: 'sip:\+4989123@'
    ending_callee
}
plain_caller() { hanging_up_caller; }
callee_of_plain() {
    expect_invite From: '"Alice ..A..." .sip:4420@' nowhere 'P-Asserted-Identity|Privacy|Diversion|History-Info'
    ending_callee
}
caller_with_two_numbers() {
    local FROM='"Desk" <sip:+44-20-55@[local_ip]>'
    hanging_up_caller 'P-Asserted-Identity: <tel:+4420>'
}
callee_of_two_numbers() {
    expect_invite From: '"Desk" .sip:\+442055@' P-Asserted-Identity: '"Desk" .sip:\+4420@' nowhere Privacy
    ending_callee
}
caller_hidden_by_itself() {
    local FROM='<sip:anonymous@anonymous.invalid>'
    hanging_up_caller
}
callee_of_hidden() {
    expect_invite From: 'sip:anonymous@anonymous.invalid' Privacy: 'id' nowhere 'P-Asserted-Identity'
    ending_callee
}
private_caller() { hanging_up_caller 'Privacy: user;critical'; }
callee_of_private() {
    expect_invite From: 'sip:anonymous@anonymous.invalid' Privacy: 'id' nowhere 'Alice|4420[@>]'
    ending_callee
}

start_gateway
for pair in restricted_caller:callee_of_restricted plain_caller:callee_of_plain \
    caller_with_two_numbers:callee_of_two_numbers caller_hidden_by_itself:callee_of_hidden \
    private_caller:callee_of_private; do
    start_callee "${pair#*:}"
    expect_caller "${pair%:*}" +4989123
    expect_callee
done
expect_trace "told peer E164-Number=4420$"
expect_trace "told peer Type-Of-Number=International number"
expect_trace "told peer Numbering-Plan=ISDN/telephony"
expect_trace "told peer Presentation-Indicator=Presentation restricted"
expect_trace "told peer Screening-Indicator=Network provided"
expect_trace "told peer Name=Alice, at home"
expect_trace "told offer \+4989123, E164-Number=4989123, Type-Of-Number=International"
stop_gateway "5 calls placed, 5 answered, 5 cleared, 0 failed"
finish
