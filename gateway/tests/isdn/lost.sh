# The exchange is killed during a call: it ends with cause 27 after T309, a call that comes meanwhile gets 38; and the
# exchange that comes back has calls again.
. "$(dirname "$0")/isdn.bash"

PLAN='[[number]]
number = "4989123"'
surviving() {
    call_up
    expect_request BYE Reason: "Q.850;cause=27"
    respond_in_dialog "200 OK"
}
refused() {
    send_invite
    expect 100
    expect 503 Reason: "Q.850;cause=38"
    send_ack
}
usual() {
    call_up
    send_bye
    expect 200
}

write_isdn_configuration
sed -i 's/^t200 = .*/t200 = 50\nt203 = 100\nt309 = 1000/' "$WORK/gateway.toml"
start_exchange <<<"$PLAN"
start_isdn_gateway
RELAYED=m=audio expect_caller surviving 4989123 &
caller=$!
for ((i = 0; i < 200; i++)); do # until it is up
    kill -USR1 $gateway_pid
    sleep 0.05
    grep -q 'leg b.* is CONNECTED' "$WORK/gateway.out" && break
done
kill -KILL $exchange_pid
wait $exchange_pid 2>/dev/null
exchange_pid=0
expect_log 'interface b: the link is down'
PORT=$((PORT + 16)) PORT_CALLER=$((PORT_CALLER + 16)) expect_caller refused 4989123
wait $caller || exit 1
start_exchange <<<"$PLAN"
expect_log 'interface b: the link is up' 2
RELAYED=m=audio expect_caller usual 4989123
expect_log 'call 1 a .calling side. released: cause 27 '
expect_log 'call 2 a .calling side. released: cause 38 '
expect_log 'call 3 a .calling side. released: cause 16 '
stop_exchange
stop_gateway "3 calls placed, 2 answered, 2 cleared, 1 failed"
finish
