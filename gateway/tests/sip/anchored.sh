# Media are relayed, so each side's session is the gateway's own: what is offered and answered goes by the codecs of the
# interfaces and of the other side, and a change on one side is nothing to the other. RFC 3264.
. "$(dirname "$0")/../lib.bash"

voice() { # OWNER PAYLOAD-TYPES [LINES]
    echo "v=0
o=$1 1 1 IN IP4 [local_ip]
s=-
c=IN IP4 [local_ip]
t=0 0
m=audio 40000 RTP/AVP $2${3:+$'\n'}${3:-}"
}
EVENTS='a=rtpmap:96 telephone-event/8000'
up_to_bye() {
    send_bye
    expect 200
}
ends() {
    expect_request BYE
    respond_in_dialog "200 OK"
}

# what can be relayed stands first in the offer, and wins in the answer; telephone events have each side's number
relayed_caller() {
    send_invite_with "$(voice caller "0 9 96" "$EVENTS")"
    expect 100
    expect 200 body "m=audio [0-9]+ RTP/AVP 9 96.*G722/8000.*96 telephone-event/8000.*a=sendrecv"
    send_ack
    up_to_bye
}
relayed_callee() {
    expect_invite body "m=audio [0-9]+ RTP/AVP 0 9 8 96 101 102.*rtpmap:96 opus/48000/2.*rtpmap:101 telephone-event/8000"
    respond_with "$(voice callee "9 100" "a=rtpmap:100 telephone-event/8000")" retrans "200 OK"
    expect_request ACK
    ends
}

# nothing in common: both are answered with what they have
transcoded_caller() {
    send_invite_with "$(voice caller 8)"
    expect 100
    expect 200 body "m=audio [0-9]+ RTP/AVP 8.*a=rtpmap:8 PCMA/8000"
    send_ack
    up_to_bye
}
transcoded_callee() {
    expect_invite body "m=audio [0-9]+ RTP/AVP 8 0 9 96 "
    respond_with "$(voice callee 0)" retrans "200 OK"
    expect_request ACK
    ends
}

# hold, resume, another codec and an unacceptable one: the other side hears of none of them
held_caller() {
    send_invite_with "$(voice caller 8)"
    expect 100
    expect 200
    send_ack
    send_offer INVITE 2 "$(session caller 2 sendonly)"
    expect_optional 100
    expect 200 body "o=gateway [0-9]+ 2 .*RTP/AVP 8.*a=recvonly"
    send_ack '' 2
    send_offer INVITE 3 "$(session caller 3 inactive)"
    expect_optional 100
    expect 200 body "o=gateway [0-9]+ 3 .*a=inactive"
    send_ack '' 3
    send_offer UPDATE 4 "$(session caller 4 sendrecv 0)"
    expect 200 body "o=gateway [0-9]+ 4 .*RTP/AVP 0.*a=sendrecv"
    send_offer INVITE 5 "$(session caller 5 sendrecv 4)"
    expect_optional 100
    expect 488
    send_ack_of_failure 5
    send_offer INVITE 6 ""
    expect_optional 100
    expect 200 body "RTP/AVP 8 0 9"
    send_ack "$(session caller 6 sendrecv 8)" 6
    send_text retrans "$(request_text BYE 7 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
held_callee() {
    expect_invite
    respond_with "$(voice callee 8)" retrans "200 OK"
    expect_request ACK
    ends
}

# an INVITE without an offer: we offer, by what the called side has agreed to
offering_caller() {
    send_invite_with ''
    expect 100
    expect 200 body "m=audio [0-9]+ RTP/AVP 0 8 9 "
    send_ack "$(voice caller 8)"
    pause 100
    up_to_bye
}
offering_callee() {
    expect_invite body "m=audio [0-9]+ RTP/AVP 8 0 9 "
    respond_with "$(voice callee 0)" retrans "200 OK"
    expect_request ACK
    ends
}

# early media: the description comes with the 183, and the 200 says the same
early_caller() {
    send_invite_with "$(voice caller "8 0")"
    expect 100
    expect 183 body "o=gateway [0-9]+ 1 .*RTP/AVP 0"
    expect 200 body "o=gateway [0-9]+ 1 .*RTP/AVP 0"
    send_ack
    up_to_bye
}
early_callee() {
    expect_invite
    respond_with "$(voice callee 0)" '' "183 Session Progress"
    pause 200
    respond_with "$(voice callee 0)" retrans "200 OK"
    expect_request ACK
    ends
}

# nothing that the interface allows, or that could be understood across
unknown_caller() {
    send_invite_with "$(voice caller 4)"
    expect 488 Reason: "cause=88"
    send_ack_of_failure
}
mute_caller() {
    send_invite_with "$(voice caller 8)"
    expect 100
    expect 488 Reason: "cause=88"
    send_ack_of_failure
}
mute_callee() {
    expect_invite
    respond_with "$(voice callee 4)" retrans "200 OK"
    expect_request ACK
    expect_request BYE Reason: "cause=88"
    respond_in_dialog "200 OK"
}
lonely_caller() { # of G.729 nothing can be made that the called side's interface has
    send_invite_with "$(voice caller 18)"
    expect 100
    expect 488 Reason: "cause=88"
    send_ack_of_failure
}

write_configuration '' 'codecs = ["PCMA", "PCMU", "G722", "opus", "G729"]'
cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
first-port = $((PORT + 24))
last-port = $((PORT + 31))
END
TRACED=20 start_gateway
for case in relayed transcoded held offering early mute; do
    start_callee ${case}_callee
    expect_caller ${case}_caller 4989123
    expect_callee
done
expect_caller unknown_caller 4989123
[[ $(grep -c "told peer State=HELD" "$WORK/gateway.out") == 1 ]] || fail "not one hold that the other side saw"
stop_gateway "7 calls placed, 5 answered, 5 cleared, 2 failed"

sed -i '0,/^codecs/!s/, "G729"\]/]/' "$WORK/gateway.toml"
start_gateway
expect_caller lonely_caller 4989123
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
finish
