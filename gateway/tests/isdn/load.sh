# All 30 channels of a line are busy all the time for some seconds: no call fails but for want of a channel, and nothing is
# left over, although the D channel loses a frame in a hundred.
. "$(dirname "$0")/isdn.bash"

write_isdn_configuration 'side = "user"'
cat >>"$WORK/gateway.toml" <<END

[[isdn]]
name = "c"
line = "$LINE.c"
[isdn.timers]
reopening = 50
t200 = 200
END
sed -i 's/^to = "a"$/to = "c"/' "$WORK/gateway.toml"
start_exchange <<END
lost = 1
[[call]]
to = "4989123"
count = 200
interval = 30
after = 500
length = 900
END
cat >"$WORK/plan_c.toml" <<END
line = "$LINE.c"
[[number]]
number = "4989123"
END
"$EXCHANGE" "$WORK/plan_c.toml" >"$WORK/exchange_c.out" 2>&1 &
exchange_c=$!
background+=($exchange_c)
start_isdn_gateway
for ((i = 0; i < 300; i++)); do
    (($(grep -c 'b (calling side' "$WORK/gateway.err") == 200)) && break
    sleep 0.1
done
sleep 1
stop_exchange
kill -TERM $exchange_c
wait $exchange_c
grep -qE '200 placed, .* 200 over' "$WORK/exchange.out" || fail "not all calls are over: $(cat "$WORK/exchange.out")"
grep -qE 'cause 16: 1[0-9][0-9]$' "$WORK/exchange.out" || fail "too few calls were answered: $(cat "$WORK/exchange.out")"
! grep cause "$WORK/exchange.out" | grep -qvE 'cause (16|34): ' || fail "calls failed: $(cat "$WORK/exchange.out")"
others=$(grep 'b (calling side' "$WORK/gateway.err" | grep -vcE 'cause (16|34|44) ')
((others == 0)) || fail "$others calls failed: $(grep 'b (calling side' "$WORK/gateway.err" | grep -vE 'cause (16|34|44) ' | head)"
kill -TERM $gateway_pid
status=0
wait $gateway_pid || status=$?
gateway_pid=0
tail -n 1 "$WORK/gateway.out"
((status == 0)) || fail "gateway: exit status $status"
finish
