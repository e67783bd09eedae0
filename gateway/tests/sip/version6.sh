# Everything over version 6 of the internet protocol: calls, over UDP and TCP, the list of who is served, and the limits.
. "$(dirname "$0")/../lib.bash"

caller() {
    send_invite
    expect 100
    expect 200 Contact: "sip:gateway@\[::1\]:$PORT_A"
    send_ack
    send_bye
    expect 200
}
callee() {
    expect_invite Contact: "sip:gateway@\[::1\]:$PORT_B"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

grep -q '^0*1 ' /proc/net/if_inet6 2>/dev/null || { echo "passed, without version 6 on this host"; exit 0; }
write_configuration '' $'transports = ["udp", "tcp"]\nallow = ["::1/128"]\nmax-connections-per-source = 3'
sed -i "s/\"$HOST:/\"[::1]:/" "$WORK/gateway.toml"
start_gateway
HOST=::1
for transport in u1 t1; do
    write_scenario "$WORK/callee.xml" callee
    sipp "[::1]:$PORT_B" -sf "$WORK/callee.xml" -i ::1 -p "$PORT_CALLEE" -cp $((PORT + 4)) -mp $((PORT + 10)) -nostdin \
        -m 1 -timeout 20s -timeout_error -trace_err -error_file "$WORK/callee.log" >"$WORK/callee.out" 2>&1 &
    callee_pid=$!
    wait_for_port $callee_pid "$PORT_CALLEE" udp || fail "the callee does not start"
    write_scenario "$WORK/caller.xml" caller
    sipp "[::1]:$PORT_A" -sf "$WORK/caller.xml" -s 4989123 -i ::1 -p "$PORT_CALLER" -cp $((PORT + 5)) -mp $((PORT + 20)) \
        -t $transport -nostdin -m 1 -timeout 20s -timeout_error -trace_err -error_file "$WORK/caller.log" \
        >"$WORK/caller.out" 2>&1 || fail "caller: exit status $?"
    expect_callee
done
for fd in 11 12 13 14 15; do
    eval "exec $fd<>/dev/tcp/::1/$PORT_A" || fail "no connection"
done
kill -USR1 $gateway_pid
expect_trace "^interface a: 0 messages of strangers, 0 too large, 0 too many, [1-9][0-9]* connections refused$"
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
