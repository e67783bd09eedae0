# Who is not the peer gets no answer, over UDP and TCP, and is counted; who is in the list is served. A flood of calls that
# nobody acknowledges gets one answer each. A loop ends for want of hops.
. "$(dirname "$0")/../lib.bash"
. "$(dirname "$0")/../datagrams.bash"

STRANGER=127.0.0.77
asking() { send_request OPTIONS; expect 200; }
# ask_as_stranger: SIPp's exit status
ask_as_stranger() {
    write_scenario "$WORK/asking.xml" asking
    sipp "$HOST:$PORT_A" -sf "$WORK/asking.xml" -s x -i "$STRANGER" -bind_local -p "$PORT_CALLER" -cp $((PORT + 5)) \
        -mp $((PORT + 20)) -nostdin -m 1 -timeout "$1" -timeout_error "${@:2}" >"$WORK/stranger.out" 2>&1
}
expect_state() {
    kill -USR1 $gateway_pid
    expect_trace "$1"
}

write_configuration '' 'transports = ["udp", "tcp"]'
start_gateway
ask_as_stranger 1s && fail "a stranger was served"
expect_state '^interface a: [1-9][0-9]* messages of strangers, 0 too large, 0 too many, 0 connections refused$'
ask_as_stranger 1s -t t1 && fail "a stranger was served over TCP"
expect_state '^interface a: [1-9][0-9]* messages of strangers, 0 too large, 0 too many, [1-9][0-9]* connections refused$'
expect_answer 200 -- request OPTIONS "sip:x@$HOST"
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"

write_configuration 'max-calls-per-second = 1' $'transports = ["udp", "tcp"]\nallow = ["192.0.2.0/24", "127.0.0.64/26", "127.0.0.1"]'
start_gateway
ask_as_stranger 5s || fail "who is in the list was not served"
ask_as_stranger 5s -t t1 || fail "who is in the list was not served over TCP"
# of two at once one at most is taken, a call to nobody; of the others each gets one answer within three times T1
for ((i = 0; i < 3; i++)); do
    request INVITE "sip:4989123@$HOST" >"$WORK/datagram"
    cat "$WORK/datagram" >"/dev/udp/$HOST/$PORT_A"
    expect_answer 503 '^Retry-After: [0-9]' -- request INVITE "sip:4989123@$HOST"
done
answers=$(ask 1.6 request INVITE "sip:4989123@$HOST")
[[ $answers == "503 " || $answers == "100 "* ]] || fail "a refusal that is not acknowledged is repeated: $answers"
kill -KILL $gateway_pid
wait $gateway_pid 2>/dev/null

# interface b's peer is interface a
write_configuration
sed -i "s/peer = \"$HOST:$PORT_CALLEE\"/peer = \"$HOST:$PORT_A\"/" "$WORK/gateway.toml"
start_gateway
expect_answer 400 -- request INVITE "sip:4989123@$HOST" 'Max-Forwards: 100000'
answers=$(ask 2 request INVITE "sip:4989123@$HOST" 'Max-Forwards: 255')
[[ $answers == "100 483 "* ]] || fail "a loop: $answers"
# of the transactions that are left one, the first, is nobody's to acknowledge
stop_gateway "71 calls placed, 0 answered, 0 cleared, 71 failed"
finish
