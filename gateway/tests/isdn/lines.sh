# All channels of several lines are up at the same time, in one process, with speech both ways: half of the lines call, the
# other half is called. At the end the far sides hear that each call is over. Told are processor time, memory, descriptors and how late the loop was. By hand with more of them:
#
#     bash lines.sh GATEWAY PORT EXCHANGE [LINES [SECONDS]]
. "$(dirname "$0")/isdn.bash"

pairs=$((${4:-4} / 2))
seconds=${5:-2}
calls=$((30 * pairs))
write_isdn_configuration
sed -i '/^\[\[isdn/,$d; s/^mode = .*/&\nthreads = 2/; s/^\[gateway\]/&\nmax-calls-per-second = 0\nclear-after = 0/' "$WORK/gateway.toml"
printf '[metrics]\nlisten = "%s"\n' "$HOST:$((PORT + 30))" >>"$WORK/gateway.toml"
for ((i = 1; i <= pairs; i++)); do
    printf '[[isdn]]\nname = "%s"\nline = "%s"\n[isdn.timers]\nreopening = 50\n' "b$i" "$LINE" "c$i" "$LINE.c"
    printf '[[route]]\nfrom = "b%d"\nto = "c%d"\n' $i $i
done >>"$WORK/gateway.toml"
start_exchange <<END
[[call]]
to = "4989123"
count = 30
interval = 20
after = $((500 + 100 * pairs))
length = 600000
END
cat >"$WORK/plan_c.toml" <<END
line = "$LINE.c"
[[number]]
number = "4989123"
answers = 50
END
"$EXCHANGE" "$WORK/plan_c.toml" >"$WORK/exchange_c.out" 2>&1 &
exchange_c=$!
background+=($exchange_c)
for ((i = 0; i < 100; i++)); do
    grep -qs listens "$WORK/exchange_c.out" && break
    sleep 0.05
done
(ulimit -S -n 100 && exec "$GATEWAY" --config "$WORK/gateway.toml" --log-level info >"$WORK/gateway.out" 2>"$WORK/gateway.err") &
gateway_pid=$!

metrics() { curl -s "http://$HOST:$((PORT + 30))/metrics"; }
free_channels() { metrics | awk '/isdn_free_channels[{]/ {sum += $2} END {print sum + 0}'; }
processor() { awk '{print ($14 + $15) * 10}' "/proc/$gateway_pid/stat"; } # milliseconds
lag() { metrics | awk '/loop_lag_seconds_bucket/ {match($1, /le="[^"]*"/); print substr($1, RSTART + 4, RLENGTH - 5), $2}'; }

expect_log 'interface .*: the link is up' $((2 * pairs))
for ((i = 0; i < 300; i++)); do
    (($(free_channels) == 0)) && break
    sleep 0.2
done
(($(free_channels) == 0)) || fail "$(free_channels) channels are free"
sleep 0.5 # the last ones are answered
begin=$(processor)
lag >"$WORK/lag.before"
sleep "$seconds"
took=$(($(processor) - begin))
lag >"$WORK/lag.after"
(($(free_channels) == 0)) || fail "calls have ended"
memory=$(sed -n 's/^VmRSS:[[:space:]]*//p' "/proc/$gateway_pid/status")
descriptors=$(ls "/proc/$gateway_pid/fd" | wc -l)
late=$(paste "$WORK/lag.before" "$WORK/lag.after" | awk '{at[NR] = $4 - $2; bound[NR] = $1; looks = at[NR]}
    function within(share, i) {for (i = 1; at[i] < share * looks; i++); return bound[i]}
    END {print looks " looks, 95 % within " within(0.95) " s, all within " within(1) " s"}')
echo "$((60 * pairs)) channels up on $((2 * pairs)) lines for $seconds s; gateway: $((took / seconds)) ms of processor a second, $memory, $descriptors descriptors; loop: $late"
kill -TERM $gateway_pid
status=0
wait $gateway_pid || status=$?
gateway_pid=0
stop_exchange
kill -TERM $exchange_c
wait $exchange_c
grep -qE "$calls placed, $calls answered, $calls over" "$WORK/exchange.out" || fail "not all calls were up, and are over: $(cat "$WORK/exchange.out")"
for side in exchange exchange_c; do # 50 blocks a second in each call, if the exchanges get that much of the processors
    blocks=$(sed -n 's/^exchange: \([0-9]*\) blocks heard/\1/p' "$WORK/$side.out")
    ((blocks > calls * seconds * 10)) || fail "only $blocks blocks were heard: $(cat "$WORK/$side.out")"
    echo "$blocks blocks of speech heard at one side"
done
tail -n 1 "$WORK/gateway.out"
grep -q " 0 left over" "$WORK/gateway.out" || fail "calls are left over"
((status == 0)) || fail "gateway: exit status $status"
finish
