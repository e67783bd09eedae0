# While the callee is alerted and lets nothing be heard, the caller hears the ringing tone of the country, 425 Hz for one
# second of five, from the gateway, if its interface asks for that; once the callee is heard, it does not any more.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"

callee() {
    expect_invite
    respond "180 Ringing"
    pause 2500
    respond_with "$(session callee 1 sendrecv 0)" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
impatient() { # without the key nobody is told anything but that it rings
    send_invite_with "$(session caller 1 sendrecv 0)"
    expect 100
    expect 180 nowhere "m=audio"
    expect 200 body "m=audio"
    send_ack
    send_bye
    expect 200
}

write_configuration '' 'ringback = true'
cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
first-port = $((PORT + 24))
last-port = $((PORT + 31))
END
start_gateway
start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16))
start_callee callee
tell_phone "$PORT_CALLER" dial "sip:4989123@$HOST:$PORT_A"
expect_log 'Accept call'
sleep 4.5
tell_phone "$PORT_CALLER" hangup
expect_callee
expect_causes 1 16
stop_phones
grep -q '183 Session Progress' "$WORK/alice.log" || fail "the phone was not told of a session"
python3 "$HERE/speech.py" tone "$(heard_by alice)" 425 40 60 || fail "the tone"
expect_trace 'told peer Call-Progress Tone=ringing tone'
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"

sed -i 's/^ringback.*//' "$WORK/gateway.toml"
start_gateway
start_callee callee
expect_caller impatient 4989123
expect_callee
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
