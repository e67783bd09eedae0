# All channels of lines are busy without a pause: no call fails but for want of a channel, and nothing is left over, although
# the D channels lose a frame in a hundred. By hand for longer, with more lines, half of which call, and with more frames that
# are lost, per cent, of those that the lines that call carry. Where one in ten is lost Q.921 gives links up now and then, with all
# that is on its way: such calls fail, but each one ends, on both sides, and no channel is lost.
#
#     bash load.sh GATEWAY PORT EXCHANGE [SECONDS [LINES [LOST]]]
#
# tells also what the gateway took of processor and memory.
. "$(dirname "$0")/isdn.bash"

seconds=${4:-10}
pairs=$((${5:-2} / 2))
lost=${6:-1}
write_isdn_configuration
sed -i '/^\[\[isdn/,$d; s/^call-control-log-level = .*/call-control-log-level = 1/; s/^mode = .*/&\nthreads = 2/; s/^\[gateway\]/&\nmax-calls-per-second = 0/' "$WORK/gateway.toml"
for ((i = 1; i <= pairs; i++)); do
    printf '[[isdn]]\nname = "%s"\nline = "%s"\n[isdn.timers]\nreopening = 50\nt200 = 200\n' "b$i" "$LINE" "c$i" "$LINE.c"
    printf '[[route]]\nfrom = "b%d"\nto = "c%d"\n' $i $i
done >>"$WORK/gateway.toml"
# each line has its plan: 30 at once. Who calls has a channel free again before the other line has; such a call gets cause
# 34, so there are more calls than channels have seconds.
start_exchange <<END
lost = $lost
t200 = $((lost > 1 ? 200 : 1000))
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
over() { # calls: cleared or failed
    sed -nE 's/^counters: .* answered, ([0-9]+) cleared, ([0-9]+) failed.*/\1 \2/p' "$WORK/gateway.out" | awk '{sum = $1 + $2} END {print sum + 0}'
}
idle() { # lines that are up, with all channels free
    grep -E '^interface [bc][0-9]+: link' "$WORK/gateway.out" | tail -n $((2 * pairs)) | grep -c 'link up, 30 channels free'
}
quiet=0 # looks in a row at idle lines: of a call whose SETUP was given up the gateway has not heard
for ((i = 0; i < 3 * seconds + (lost > 1 ? 90 : 30) && quiet < 12; i++)); do
    kill -USR1 $gateway_pid
    sleep 1
    quiet=$(($(idle) == 2 * pairs && i > seconds ? quiet + 1 : 0))
    (($(over) >= calls && quiet > 0)) && break
done
sleep 1
read -r _ _ _ _ _ _ _ _ _ _ _ _ _ user system _ <"/proc/$gateway_pid/stat"
memory=$(sed -n 's/^VmHWM: *//p' "/proc/$gateway_pid/status")
stop_exchange
kill -TERM $exchange_c
wait $exchange_c
grep -qE "$calls placed, .* $calls over" "$WORK/exchange.out" || fail "not all calls are over: $(cat "$WORK/exchange.out")"
otherwise=$(sed -nE 's/^exchange: cause ([0-9]+): ([0-9]+)$/\1 \2/p' "$WORK/exchange.out" | awk '$1 != 16 && $1 != 34 {sum += $2} END {print sum + 0}')
((otherwise == 0 || lost > 1)) || fail "calls failed: $(cat "$WORK/exchange.out")"
answered=$(sed -n 's/.* placed, \([0-9]*\) answered.*/\1/p' "$WORK/exchange.out")
((answered > seconds * (lost > 1 ? 4 : 15) * pairs)) || fail "too few calls were answered: $(cat "$WORK/exchange.out")"
others=$(grep ' over after ' "$WORK/gateway.err" | grep -vE 'cause (16|34|44) ')
[[ -z $others ]] || ((lost > 1)) || fail "calls failed: ${others:0:2000}"
most=$(sed -n 's/^pool: .* at most \([0-9]*\) at once.*/\1/p' "$WORK/gateway.out" | tail -n 1)
echo "$calls calls, at most $most at once, $answered answered, $otherwise failed but for want of a channel, $lost frames in a hundred lost; gateway: $(((user + system) * 10)) ms of processor, $memory"
((most >= 27 * pairs || lost > 1)) || fail "the channels were not busy"
(($(idle) == 2 * pairs)) || fail "channels are left over: $(grep 'channels free' "$WORK/gateway.out" | tail -n $((2 * pairs)))"
kill -TERM $gateway_pid
status=0
wait $gateway_pid || status=$?
gateway_pid=0
tail -n 1 "$WORK/gateway.out"
((status == 0)) || fail "gateway: exit status $status"
finish
