# Digits go through the gateway in the form that each side takes, once: as telephone events where both take them, also if
# speech is transcoded; from INFO to events and back; and what one side lets sound becomes events where the gateway is to
# listen for it. RFC 4733, RFC 6086.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"

write_configuration '' 'detect-digits = false'
cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
first-port = $((PORT + 8))
last-port = $((PORT + 15))
END
TRACED=9 start_gateway

calls=0
call_up_phones() {
    calls=$((calls + 1))
    tell_phone "$PORT_CALLER" dial "sip:bob@$HOST:$PORT_A"
    expect_log 'Accept call' $calls
    sleep 1
}
end_phones() {
    tell_phone "$PORT_CALLER" hangup
    expect_causes $calls 16
    stop_phones
}

keyed() { # CODECS of alice, of bob; DIGITS
    CODECS=$1 start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16))
    CODECS=$2 start_phone bob "$PORT_CALLEE" "$PORT_B" $((PORT + 20)) answermode=auto
    call_up_phones
    tell_phone "$PORT_CALLER" sndcode "$3"
    expect_digits bob "$3"
    end_phones
    expect_trace "heard digit ${3:0:1}"
}
keyed PCMU PCMU '1*'
keyed PCMA PCMU 27

# INFO comes in, events go out; the end of the last one stays in the phone's jitter buffer, since no speech follows it
informing() {
    send_invite_with "$(session caller 1 sendrecv 0)"
    expect 100
    expect_optional 180
    expect 200
    send_ack
    pause 300
    send_offer INFO 2 $'Signal=5\nDuration=160' "Content-Type: application/dtmf-relay"
    expect 200
    pause 400
    send_offer INFO 3 '#90' "Content-Type: application/dtmf"
    expect 200
    pause 800
    send_text retrans "$(request_text BYE 4 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
start_phone bob "$PORT_CALLEE" "$PORT_B" $((PORT + 24)) answermode=auto
calls=$((calls + 1))
expect_caller informing bob
expect_causes $calls 16
expect_digits bob '5#9'
stop_phones

# events come in, INFO goes out to who takes it but no events
expect_digit() {
    expect_request INFO body "Signal=$1" Content-Type: "application/dtmf-relay"
    respond_once "200 OK"
}
informed() {
    expect_invite
    respond_with "$(session callee 1 sendrecv 0)" retrans "200 OK" "Allow: INVITE, ACK, BYE, CANCEL, INFO"
    expect_request ACK
    expect_digit 8
    expect_digit 0
    expect_request BYE
    respond_in_dialog "200 OK"
}
start_callee informed
start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16))
call_up_phones
tell_phone "$PORT_CALLER" sndcode 80
sleep 1
tell_phone "$PORT_CALLER" hangup
expect_callee
expect_causes $calls 16
stop_phones
stop_gateway "$calls calls placed, $calls answered, $calls cleared, 0 failed"

# digits that sound
sed -i 's/^detect-digits.*/detect-digits = true/' "$WORK/gateway.toml"
TRACED=9 start_gateway
calls=0
SAID='key 37#D' start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16))
start_phone bob "$PORT_CALLEE" "$PORT_B" $((PORT + 20)) answermode=auto
call_up_phones
sleep 2
expect_digits bob '37#D'
end_phones
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
