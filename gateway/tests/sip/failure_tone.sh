# A caller hears why his call fails, in the tones of the country, if his interface asks for that: busy here, 400 Hz in
# Great Britain, before the 486; and nothing of a call that ends in order.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"

busy() {
    expect_invite
    respond_finally "486 Busy Here"
    expect_request ACK
}
impatient() { # hangs up while he hears it
    send_invite
    expect 100
    expect 183 body "m=audio"
    pause 100
    send_cancel
    expect 200
    expect 487
    send_ack_of_failure
}
unanswered() {
    expect_invite
    respond_finally "480 No Answer" 'Reason: Q.850;cause=19'
    expect_request ACK
}
told_at_once() {
    send_invite
    expect 100
    expect 480 Reason: "cause=19"
    send_ack_of_failure
}

write_configuration '' 'failure-tone = 2'
cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
country = "gb"
first-port = $((PORT + 24))
last-port = $((PORT + 31))
END
start_gateway
start_callee busy
start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16))
tell_phone "$PORT_CALLER" dial "sip:4989123@$HOST:$PORT_A"
expect_callee
expect_causes 1 17
stop_phones
grep -q '486 Busy Here' "$WORK/alice.log" || fail "the phone was not told why: $(cat "$WORK/alice.log")"
python3 "$HERE/speech.py" tone "$(heard_by alice)" 400 25 70 || fail "the tone"

start_callee busy
expect_caller impatient 4989123
expect_callee
start_callee unanswered
expect_caller told_at_once 4989123
expect_callee
stop_gateway "3 calls placed, 0 answered, 0 cleared, 3 failed"
finish
