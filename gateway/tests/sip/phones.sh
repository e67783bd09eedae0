# Two phones call each other through the gateway, which relays what they say: each hears the other to the bit, also after
# one of them has held and resumed; and so it is kept. What was measured is in the quality record.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"

mkdir "$WORK/kept"
write_configuration
cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
recordings = "$WORK/kept"
first-port = $((PORT + 8))
last-port = $((PORT + 15))
END
start_gateway
start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16))
start_phone bob "$PORT_CALLEE" "$PORT_B" $((PORT + 20)) answermode=auto

tell_phone "$PORT_CALLER" dial "sip:bob@$HOST:$PORT_A"
expect_log 'Accept call'
sleep 6
tell_phone "$PORT_CALLER" hold
sleep 0.5
tell_phone "$PORT_CALLER" resume
sleep 1
tell_phone "$PORT_CALLER" hangup
expect_causes 1 16
stop_phones
expect_speech alice bob 250
expect_speech bob alice 250
for number in 0 1; do
    python3 "$HERE/speech.py" channel "$WORK"/kept/*.wav $number "$WORK/kept.$number.wav"
done
echo -n 'alice, as she was kept: ' && python3 "$HERE/speech.py" compare "$WORK/alice/said.wav" "$WORK/kept.0.wav" 250 || fail "what was kept of alice"
echo -n 'bob, as he was kept: ' && python3 "$HERE/speech.py" compare "$WORK/bob/said.wav" "$WORK/kept.1.wav" 250 || fail "what was kept of bob"
expect_trace 'State=HELD'
expect_trace 'Quality-Of-Service=.*PCMU'
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
