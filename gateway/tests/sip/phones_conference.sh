# Three phones call the number of a conference: the tone of one reaches the other two and not itself, and it goes on when one
# of them leaves. A party asks by REFER for another one, who is called in. RFC 4579.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"

write_configuration '' '' 4
sed -i '0,/^peer = .*/s//&\nconference = "800"/' "$WORK/gateway.toml"
cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
first-port = $((PORT + 8))
last-port = $((PORT + 15))
END
TRACED=9 start_gateway
PORT_CAROL=$((PORT + 6))
SAID='hum 440 20' start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16))
SAID='hum 0 20' start_phone bob "$PORT_CALLEE" "$PORT_A" $((PORT + 20)) answermode=auto
SAID='hum 0 20' start_phone carol "$PORT_CAROL" "$PORT_A" $((PORT + 24))

established() { # NAME
    local i
    for ((i = 0; i < 60; i++)); do
        grep -qa 'Call established' "$WORK/$1.log" && return 0
        sleep 0.05
    done
    fail "phone $1 does not come in"
}
for port in "$PORT_CALLER" "$PORT_CALLEE" "$PORT_CAROL"; do
    tell_phone "$port" dial "sip:800@$HOST:$PORT_A"
done
for phone in alice bob carol; do
    established $phone
done
sleep 3
tell_phone "$PORT_CALLEE" hangup
expect_log 'released: cause 16 '
sleep 1
tell_phone "$PORT_CALLER" hangup
tell_phone "$PORT_CAROL" hangup
expect_log 'released: cause 16 ' 3
stop_phones
python3 "$HERE/speech.py" tone "$(heard_by alice)" 440 0 0 || fail "who hums hears herself"
python3 "$HERE/speech.py" tone "$(heard_by bob)" 440 130 250 || fail "what bob heard"
python3 "$HERE/speech.py" tone "$(heard_by carol)" 440 180 300 || fail "what carol heard"
rm -r "$WORK/alice" "$WORK/bob" "$WORK/carol"

# one more, whom a party calls in, and one to whom there is no way
referring() {
    send_invite_with "$(session caller 1 sendrecv 0)"
    expect 100
    expect 200 Contact: "isfocus"
    send_ack
    refer "sip:4989123@$HOST" 2 200
    refer "sip:9999@$HOST" 3 404
    pause 2000
    send_text retrans "$(request_text BYE 4 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
refer() { # URI SEQUENCE STATUS
    send_text retrans "$(request_text REFER "$2" '[branch]' '[peer_tag_param]' "Refer-To: <$1>")" ''
    expect 202
    expect_request NOTIFY body "SIP/2.0 100"
    respond_once "200 OK"
    expect_request NOTIFY body "SIP/2.0 $3"
    respond_once "200 OK"
}
invited() {
    expect_invite body "m=audio"
    respond_with "$(session callee 1 sendrecv 0)" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
start_callee invited
expect_caller referring 800
kill -TERM $gateway_pid # nobody is left but who was called in
sleep 0.3
kill -TERM $gateway_pid
expect_callee
expect_end "4 calls placed, 4 answered, 4 cleared, 0 failed"
finish
