# Two hundred calls a second, and among them messages that are broken in one octet or more, over both transports: every
# call succeeds.
. "$(dirname "$0")/../lib.bash"
. "$(dirname "$0")/../datagrams.bash"
. "$HERE/turns.bash"

RATE=200
CALLS=600
SEED=${SEED:-$RANDOM}
RANDOM=$SEED
caller() { call_up; pause 100; send_bye; expect 200; }
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# mutated: a request with one to four octets, or pieces of it, that are others
mutated() {
    local methods=(INVITE ACK BYE CANCEL OPTIONS) octets text i at piece
    request "${methods[RANDOM % 5]}" "sip:none@$HOST" 'Max-Forwards: 70' "Content-Type: application/sdp" >"$WORK/good"
    text=$(<"$WORK/good")$'\n'
    for ((i = 0; i <= RANDOM % 4; i++)); do
        at=$((RANDOM % ${#text}))
        octets=('' $'\r\n' ';' '"' '<' '\0' '\377' '%' ':' '9999999999' "${text:at:40}")
        piece=${octets[RANDOM % ${#octets[@]}]}
        text=${text:0:at}$piece${text:at + 1}
    done
    printf '%b' "${text//%/%%}"
}

write_configuration 'max-calls-per-second = 0' 'transports = ["udp", "tcp"]' 4989
watch_turns
start_gateway
start_callee callee -m $CALLS
run_caller caller 4989123 -m $CALLS -r $RATE &
load=$!
background+=($load)
sent=0
while kill -0 $load 2>/dev/null; do
    mutated >"$WORK/mutated"
    for port in $PORT_A $PORT_B; do
        cat "$WORK/mutated" >"/dev/udp/$HOST/$port"
        { cat "$WORK/mutated" >"/dev/tcp/$HOST/$port"; } 2>/dev/null
    done
    sent=$((sent + 4))
    sleep 0.1
done
wait $load || fail "caller: exit status $?, seed $SEED"
((sent * 100 >= CALLS)) || fail "only $sent broken messages among $CALLS calls"
expect_callee
expect_short_turns
kill -TERM $gateway_pid
status=0
wait $gateway_pid || status=$?
gateway_pid=0
((status == 0)) || fail "gateway: exit status $status, seed $SEED"
grep -qE "^gateway: [0-9]+ calls placed, $CALLS answered, $CALLS cleared, [0-9]+ failed, 0 left over$" "$WORK/gateway.out" ||
    fail "the last line: $(tail -n 1 "$WORK/gateway.out"), seed $SEED"
finish
