# A phone that talks to one party calls another one meanwhile, and joins both: they then hear each other.
. "$(dirname "$0")/../lib.bash"
. "$HERE/target.bash"
. "$HERE/phones.bash"
. "$HERE/linphone.bash"

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
start_phone 77 "$PORT_TARGET" "$PORT_C" $((PORT + 26)) answermode=auto
start_linphone bob "$PORT_CALLEE" $((PORT + 22))

tell_phone "$PORT_CALLER" dial "sip:bob@$HOST:$PORT_A"
expect_linphone bob "Receiving new incoming call"
tell_linphone answer
expect_log 'Accept call'
sleep 1
tell_linphone pause
expect_linphone bob "is now paused"
tell_linphone "call sip:77@$HOST:$PORT_B"
expect_log 'Accept call' 2
sleep 1
tell_linphone "transfer 1 --to-call 2"
expect_log 'Transfer call'
sleep 3
tell_phone "$PORT_CALLER" hangup
expect_log 'call [0-9]* c \(called side\) released: cause 16 '
expect_trace 'State=HELD'
tell_linphone quit
exec 8>&-
stop_phones
expect_speech alice 77 50
expect_speech 77 alice 50
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
