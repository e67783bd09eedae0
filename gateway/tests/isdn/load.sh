# All channels of lines are busy without a pause: no call fails but for want of a channel, and nothing is left over, although
# the D channels lose a frame in a hundred. By hand for longer, and with more lines, half of which call:
#
#     bash load.sh GATEWAY PORT EXCHANGE [SECONDS [LINES]]
#
# tells also what the gateway took of processor and memory.
. "$(dirname "$0")/isdn.bash"

seconds=${4:-10}
pairs=$((${5:-2} / 2))
write_isdn_configuration
sed -i '/^\[\[isdn/,$d; s/^call-control-log-level = .*/call-control-log-level = 1/; s/^mode = .*/&\nthreads = 2/; s/^\[gateway\]/&\nmax-calls-per-second = 0/' "$WORK/gateway.toml"
for ((i = 1; i <= pairs; i++)); do
    printf '[[isdn]]\nname = "%s"\nline = "%s"\n[isdn.timers]\nreopening = 50\nt200 = 200\n' "b$i" "$LINE" "c$i" "$LINE.c"
    printf '[[route]]\nfrom = "b%d"\nto = "c%d"\n' $i $i
done >>"$WORK/gateway.toml"
# each line has its plan: 30 at once. Who calls has a channel free again before the other line has; such a call gets cause
# 34, so there are more calls than channels have seconds.
start_exchange <<END
lost = 1
at-once = 30
[[call]]
to = "4989123"
count = $((seconds * 40))
interval = 0
after = $((500 + 100 * pairs))
length = 900
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
    grep -q listens "$WORK/exchange_c.out" && break
    sleep 0.05
done
# a line with its calls takes 61 descriptors; the soft limit is for programs that cannot do with more, which the gateway can
(ulimit -S -n 100 && exec "$GATEWAY" --config "$WORK/gateway.toml" --log-level info >"$WORK/gateway.out" 2>"$WORK/gateway.err") &
gateway_pid=$!
expect_log 'interface .*: the link is up' $((2 * pairs))
calls=$((seconds * 40 * pairs))
for ((i = 0; i < 5 * (3 * seconds + 30); i++)); do
    ((i % 5 == 0)) && kill -USR1 $gateway_pid
    (($(grep -c ' over after ' "$WORK/gateway.err") >= calls)) && break
    sleep 0.2
done
sleep 1
read -r _ _ _ _ _ _ _ _ _ _ _ _ _ user system _ <"/proc/$gateway_pid/stat"
memory=$(sed -n 's/^VmHWM: *//p' "/proc/$gateway_pid/status")
stop_exchange
kill -TERM $exchange_c
wait $exchange_c
grep -qE "$calls placed, .* $calls over" "$WORK/exchange.out" || fail "not all calls are over: $(cat "$WORK/exchange.out")"
! grep cause "$WORK/exchange.out" | grep -qvE 'cause (16|34): ' || fail "calls failed: $(cat "$WORK/exchange.out")"
answered=$(sed -n 's/.* placed, \([0-9]*\) answered.*/\1/p' "$WORK/exchange.out")
((answered > seconds * 15 * pairs)) || fail "too few calls were answered: $(cat "$WORK/exchange.out")"
others=$(grep ' over after ' "$WORK/gateway.err" | grep -vE 'cause (16|34|44) ')
[[ -z $others ]] || fail "calls failed: ${others:0:2000}"
most=$(sed -n 's/^pool: .* at most \([0-9]*\) at once.*/\1/p' "$WORK/gateway.out" | tail -n 1)
echo "$calls calls, at most $most at once, $answered answered; gateway: $(((user + system) * 10)) ms of processor, $memory"
((most >= 27 * pairs)) || fail "the channels were not busy"
kill -TERM $gateway_pid
status=0
wait $gateway_pid || status=$?
gateway_pid=0
tail -n 1 "$WORK/gateway.out"
((status == 0)) || fail "gateway: exit status $status"
finish
