# Numbers that come digit by digit: INVITEs of one Call-ID and From, each with more digits, are one call (RFC 3578). The
# called side gets them likewise, is asked again after its 484, and gets the number whole where its interface says so.
. "$(dirname "$0")/../lib.bash"

# invite_number DIGITS SEQUENCE
invite_number() {
    send_text retrans "$(request_text INVITE "$2" '[branch]' '' | sed "s/\[service\]/$1/")" "${SDP:-$SDP_OF_CALLER}"
}
ack_of_number() { # DIGITS SEQUENCE STEPS-SINCE-ITS-INVITE
    send_text '' "$(request_text ACK "$2" "[branch-$3]" '[peer_tag_param]' | sed "s/\[service\]/$1/")" ''
}
hang_up() {
    send_text '' "$(request_text ACK "$1" '[branch]' '[peer_tag_param]')" ''
    send_text retrans "$(request_text BYE $(($1 + 1)) '[branch]' '[peer_tag_param]')" ''
    expect 200
}
# the third digit gets an answer while the first INVITE is still pending, the second was refused
dialling_caller() {
    invite_number 4 1
    expect 484 Reason: 'cause=28'
    ack_of_number 4 1 2
    invite_number 49 2
    expect 100
    pause 100
    invite_number 498 3
    expect 484 CSeq: '2 INVITE'
    ack_of_number 49 2 4
    expect 100
    invite_number 49 4
    expect 484
    ack_of_number 49 4 2
    pause 100
    invite_number 49891 5
    expect 484 CSeq: '3 INVITE'
    ack_of_number 498 3 8
    expect 100
    expect 180
    invite_number 498912 6
    expect 484 CSeq: '6 INVITE'
    ack_of_number 498912 6 2
    expect 200 CSeq: '5 INVITE'
    hang_up 5
}
callee_of_digits() {
    expect_invite To: "sip:49@"
    respond "100 Trying"
    expect_request INVITE To: "sip:498@"
    respond_with '' retrans "484 Address Incomplete"
    expect_request ACK
    expect_and_keep INVITE
    respond "180 Ringing"
    expect_request CANCEL To: "sip:49@"
    respond_in_dialog "200 OK"
    pause 300
    answer_kept INVITE "$SDP_OF_CALLEE"
    expect_request ACK To: "sip:49891@|callee"
    expect_request BYE
    respond_in_dialog "200 OK"
}
# the called side finds the first number complete after all
two_digits() {
    invite_number 49 1
    expect 100
    pause "${1:-100}"
    invite_number 498 2
    expect 484 CSeq: '1 INVITE'
    ack_of_number 49 1 4
    expect 100
}
caller_of_shorter() {
    two_digits
    expect 200 CSeq: '2 INVITE'
    hang_up 2
}
callee_of_shorter() {
    expect_invite To: "sip:49@"
    respond "100 Trying"
    expect_request INVITE To: "sip:498@"
    respond "100 Trying"
    answer_again ";tag=shorter"
    expect_request CANCEL To: "sip:498@"
    respond_in_dialog "200 OK"
    expect_request ACK To: "sip:49@.*tag=shorter"
    expect_request BYE
    respond_in_dialog "200 OK"
}
# no more digits come
caller_who_stops() {
    invite_number 49 1
    expect 100
    expect 484 Reason: 'cause=28'
    ack_of_number 49 1 3
}
caller_who_gives_up() {
    invite_number 49 1
    expect 100
    pause 200
    send_text retrans "$(request_text CANCEL 1 '[branch-3]' '' | sed "s/\[service\]/49/")" ''
    expect 200
    expect 487
    ack_of_number 49 1 6
}
callee_who_wants_more() {
    expect_invite To: "sip:49@"
    respond_with '' retrans "484 Address Incomplete"
    expect_request ACK
}
# an interface whose peer gets whole numbers; one that is without its end after its time is whole
caller_of_whole() {
    two_digits
    expect 200
    hang_up 2
}
callee_of_whole() {
    expect_invite To: "sip:498@"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# pair CALLEE CALLER NUMBER
pair() {
    start_callee "$1" -trace_msg -message_file "$WORK/$1.messages"
    expect_caller "$2" "$3"
    expect_callee
}

write_configuration '' 'overlap = "invite"
digit-timeout = 1' 49
start_gateway
pair callee_of_digits dialling_caller 4
tags=$(grep -A4 ^INVITE "$WORK/callee_of_digits.messages" | grep -oE '^From:.*' | sort -u | wc -l)
((tags == 1)) || fail "INVITEs of one call from $tags parties"
pair callee_of_shorter caller_of_shorter 49
pair callee_who_wants_more caller_who_stops 49
expect_causes 4 28
pair callee_who_wants_more caller_who_gives_up 49
stop_gateway "5 calls placed, 2 answered, 2 cleared, 3 failed"

sed -i '/name = "b"/,$ s/^overlap = .*/overlap = "off"/' "$WORK/gateway.toml"
start_gateway
pair callee_of_whole caller_of_whole 49
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
