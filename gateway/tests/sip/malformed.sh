# Datagrams and streams that are no SIP, or nearly: an error answer or silence, and a good call still works after them.
. "$(dirname "$0")/../lib.bash"
. "$HERE/turns.bash"

send() { printf '%b' "$1" >"/dev/udp/$HOST/$PORT_A"; }
head_of() {
    printf '%s' "$1 sip:4989123@$HOST SIP/2.0\r\nVia: SIP/2.0/UDP $HOST:$PORT_CALLER;branch=z9hG4bK$RANDOM$RANDOM\r\n"
}
PARTIES="From: <sip:4420@$HOST>;tag=x\r\nTo: <sip:4989123@$HOST>\r\nContact: <sip:4420@$HOST:$PORT_CALLER>\r\n"
long() { printf "%$1s" '' | tr ' ' x; }

good_caller() { call_up; send_bye; expect 200; }
good_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

# answers that are hardly any: no tag, no contact, no body that anybody understands
poor_caller() { send_invite; expect 100; expect_optional 180; expect 200; send_ack; send_bye; expect 200; }
poor_callee() {
    expect_invite
    send_text '' $'SIP/2.0 199 \n[last_Via:]\n[last_From:]\n[last_To:]\n[last_Call-ID:]\n[last_CSeq:]' ''
    send_text retrans $'SIP/2.0 299 \n[last_Via:]\n[last_From:]\n[last_To:]\n[last_Call-ID:]\n[last_CSeq:]\nReason: ;;' '"'
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration '' 'transports = ["udp", "tcp"]'
watch_turns
start_gateway
start_callee poor_callee
expect_caller poor_caller 4989123
expect_callee
send ''
send '\0\0\0\0'
send '\r\n\r\n'
send 'hello\r\n\r\n'
send 'INVITE\r\n\r\n'
send 'INVITE sip:x SIP/9.9\r\n\r\n'
send "$(head_of INVITE)\r\n"
send "$(head_of INVITE)${PARTIES}CSeq: 1 INVITE\r\n\r\n"
send "$(head_of INVITE)${PARTIES}Call-ID: a\r\nCSeq: 1 BYE\r\n\r\n"
send "$(head_of INVITE)${PARTIES}Call-ID: b\r\nCSeq: 99999999999999 INVITE\r\n\r\n"
send "$(head_of INVITE)${PARTIES}Call-ID: c\r\nCSeq: 1 INVITE\r\nContent-Length: -5\r\n\r\n"
send "$(head_of INVITE)${PARTIES}Call-ID: d\r\nCSeq: 1 INVITE\r\nContent-Length: 99999\r\n\r\nv=0"
send "$(head_of INVITE)${PARTIES}Call-ID: e\r\nCSeq: 1 INVITE\r\nMax-Forwards: -1\r\n\r\n"
send "$(head_of INVITE)From: \"<<<>\r\nTo: ;;;\r\nCall-ID: f\r\nCSeq: 1 INVITE\r\n\r\n"
send "INVITE sip:%zz%@[::: SIP/2.0\r\nVia: SIP/2.0/UDP $HOST:$PORT_CALLER;branch=z9hG4bKq\r\n${PARTIES}Call-ID: g\r\nCSeq: 1 INVITE\r\n\r\n"
send "$(head_of INVITE)${PARTIES}Call-ID: h\r\nCSeq: 1 INVITE\r\nX-Long: $(long 60000)\r\n\r\n"
send "$(head_of BYE)${PARTIES}Call-ID: i\r\nCSeq: 1 BYE\r\nReason: \"\"\"\"\";;;=cause\r\n\r\n"
send "$(head_of ACK)${PARTIES}Call-ID: j\r\nCSeq: 1 ACK\r\n\r\n"
send "SIP/2.0 200 OK\r\nVia: SIP/2.0/UDP $HOST:$PORT_A;branch=z9hG4bKnone\r\n${PARTIES}Call-ID: k\r\nCSeq: 1 INVITE\r\n\r\n"
send 'SIP/2.0 99999 \r\n\r\n'
for ((i = 0; i < 50; i++)); do
    head -c $((RANDOM % 1200)) /dev/urandom >"/dev/udp/$HOST/$PORT_A"
done
{
    printf 'INVITE sip:x SIP/2.0\r\nContent-Length: 100\r\n\r\nshort' # a stream that ends inside a message
} >"/dev/tcp/$HOST/$PORT_A"
{ head -c 100000 /dev/urandom >"/dev/tcp/$HOST/$PORT_B"; } 2>/dev/null
sleep 0.3
kill -0 $gateway_pid || fail "the gateway is gone"
start_callee good_callee
expect_caller good_caller 4989123
expect_callee
kill -USR1 $gateway_pid
expect_trace "^counters: "
expect_short_turns
kill -TERM $gateway_pid
status=0
wait $gateway_pid || status=$?
gateway_pid=0
((status == 0)) || fail "gateway: exit status $status"
# some of the above are calls in the end, whose caller is never there to acknowledge or take anything
grep -qE '^gateway: [0-9]+ calls placed, 2 answered, 2 cleared, [0-9]+ failed, 0 left over$' "$WORK/gateway.out" || fail "the last line"
finish
