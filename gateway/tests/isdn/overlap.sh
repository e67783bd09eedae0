# Numbers that come digit by digit, between SIP (RFC 3578) and a line: each INVITE's digits go on in INFORMATION, each
# digit of INFORMATION in another INVITE. A line that takes whole numbers gets them when no further INVITE comes.
. "$(dirname "$0")/isdn.bash"

# invite_number DIGITS SEQUENCE
invite_number() {
    send_text retrans "$(request_text INVITE "$2" '[branch]' '' | sed "s/\[service\]/$1/")" "$SDP_OF_CALLER"
}
ack_of_number() { # DIGITS SEQUENCE STEPS-SINCE-ITS-INVITE
    send_text '' "$(request_text ACK "$2" "[branch-$3]" '[peer_tag_param]' | sed "s/\[service\]/$1/")" ''
}
caller() {
    invite_number 498 1
    expect 100
    pause 100
    invite_number 4989 2
    expect 484 CSeq: '1 INVITE'
    ack_of_number 498 1 4
    expect 100
    pause 100
    invite_number 4989123 3
    expect 484 CSeq: '2 INVITE'
    ack_of_number 4989 2 5
    expect 100
    expect 180
    expect 200
    send_ack '' 3
    send_text retrans "$(request_text BYE 4 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
callee() {
    expect_invite To: "sip:44@"
    respond "100 Trying"
    expect_request INVITE To: "sip:442@"
    respond "100 Trying"
    expect_and_keep INVITE
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request CANCEL To: "sip:44@"
    respond_in_dialog "200 OK"
    expect_request CANCEL To: "sip:442@"
    respond_in_dialog "200 OK"
    expect_request ACK To: "sip:4420@"
    expect_request BYE
    respond_in_dialog "200 OK"
}
plan() {
    start_exchange <<END_OF_PLAN
[[number]]
number = "4989123"
$(for call in "$@"; do printf '[[call]]\nto = "%s"\nfrom = "4989123"\noverlap = true\nafter = 800\n' "$call"; done)
END_OF_PLAN
}

write_isdn_configuration 'overlap-receiving = "hand-on"' 'overlap = "invite"'
plan 4420
PORT_B=$PORT_A PORT_CALLEE=$PORT_CALLER start_callee callee
start_isdn_gateway
expect_callee
expect_caller caller 498
stop_exchange
expect_report "1 calls received, 1 answered; 1 placed, 1 answered, 1 over; 0 units charged"
expect_wellformed
expect_wire 'q931.message_type == 0x05' q931.called_party_number.digits 498
expect_log 'call 1: 4989123 on b to 4420 on a, '
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"

write_isdn_configuration 'overlap-sending = "off"' $'overlap = "invite"\ndigit-timeout = 1'
plan
start_isdn_gateway
expect_caller caller 498
stop_exchange
expect_wire 'q931.message_type == 0x05' q931.called_party_number.digits 4989123
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
