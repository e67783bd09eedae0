# A tenth of the datagrams is lost, a tenth comes twice and a tenth too late, on both sides: every call succeeds but
# those that SIPp itself gives up, and of none anything is left. What a peer has forgotten ends with the session's timer.
. "$(dirname "$0")/../lib.bash"

CALLS=120
SIPP_TIMEOUT=60s
SEED=${SEED:-$RANDOM}
NEAR_A=$((PORT + 6)) FAR_A=$((PORT + 7)) NEAR_B=$((PORT + 8)) FAR_B=$((PORT + 9))
caller() { call_up; pause 300; send_bye; expect 200; }
callee() {
    expect_invite
    respond "180 Ringing"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration '' $'t1 = 100\nsession-expires = 2\nmin-se = 1'
sed -i "s/^peer = \"$HOST:$PORT_CALLER\"/peer = \"$HOST:$FAR_A\"/; s/^peer = \"$HOST:$PORT_CALLEE\"/peer = \"$HOST:$FAR_B\"/" "$WORK/gateway.toml"
start_gateway
python3 "$HERE/lossy.py" "$SEED" "$PORT_CALLER:$NEAR_A:$FAR_A:$PORT_A" "$PORT_CALLEE:$NEAR_B:$FAR_B:$PORT_B" >"$WORK/wire.log" &
wire=$!
background+=($wire)
wait_for_port $wire "$FAR_B" udp || fail "the wire does not start"
served=($PORT_A $PORT_B)
PORT_A=$NEAR_A PORT_B=$NEAR_B
start_callee callee -m $((10 * CALLS)) -timeout 60s
run_caller caller 4989123 -m $CALLS -r 40 # some calls are none to it, since messages came in another order
PORT_A=${served[0]} PORT_B=${served[1]}

expect_no_calls 15
kill -TERM $wire
{ wait $wire; } 2>/dev/null
read -r seen _ lost _ <<<"$(tr -d , <"$WORK/wire.log")"
((lost * 20 > seen)) || fail "the wire lost $lost of $seen"
kill -TERM $gateway_pid
wait $gateway_pid || fail "gateway: exit status $?, seed $SEED"
gateway_pid=0
grep -qE "^gateway: $CALLS calls placed, .* 0 left over$" "$WORK/gateway.out" || fail "$(tail -n 1 "$WORK/gateway.out"), seed $SEED"
answered=$(tail -n 1 "$WORK/gateway.out" | sed -E 's/.*placed, ([0-9]+) answered.*/\1/')
# SIPp gives up a call when a doubled INVITE or BYE comes after a later message: some 8 of a hundred, up to 13 were seen
((answered * 10 >= 8 * CALLS)) || fail "only $answered of $CALLS answered, seed $SEED"
cat "$WORK/wire.log" # what it was tried with
finish
