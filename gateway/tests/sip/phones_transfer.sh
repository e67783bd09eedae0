# A phone holds the one that it talks to, resumes, and is the one that transfers it: that one and the target then hear each
# other, on the ports they had.
. "$(dirname "$0")/../lib.bash"
. "$HERE/target.bash"
. "$HERE/phones.bash"

write_configuration
add_target
cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
first-port = $((PORT + 10))
last-port = $((PORT + 17))
END
start_gateway
start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 18))
start_phone bob "$PORT_CALLEE" "$PORT_B" $((PORT + 22)) answermode=auto
start_phone 77 "$PORT_TARGET" "$PORT_C" $((PORT + 26)) answermode=auto

tell_phone "$PORT_CALLER" dial "sip:bob@$HOST:$PORT_A"
expect_log 'Accept call'
sleep 3
tell_phone "$PORT_CALLEE" hold
sleep 0.5
tell_phone "$PORT_CALLEE" resume
sleep 1
tell_phone "$PORT_CALLEE" transfer "sip:77@$HOST:$PORT_B"
expect_log 'Transfer call'
sleep 3
tell_phone "$PORT_CALLER" hangup
expect_log 'call 2 c \(called side\) released: cause 16 '
expect_trace 'State=HELD'
stop_phones
expect_speech alice bob 50
expect_speech bob alice 50
expect_speech alice 77 50
expect_speech 77 alice 50
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
