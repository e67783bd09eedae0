# Nobody reads what the gateway says: calls go on, and as soon as somebody reads he is told how much he has missed. A dump
# of many calls does not hold them up either.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"

CALLS=40

# both streams lead into pipes that are full after a few calls
mkfifo "$WORK/err" "$WORK/out"
exec 8<>"$WORK/err" 9<>"$WORK/out"
served=$GATEWAY
GATEWAY=$WORK/unread
printf '#!/bin/bash\nexec "%s" "$@" 2>"%s" >"%s"\n' "$served" "$WORK/err" "$WORK/out" >"$GATEWAY"
chmod +x "$GATEWAY"
write_configuration "max-calls-per-second = 0"
sed -i 's/^call-control-log-level.*/call-control-log-level = 5/' "$WORK/gateway.toml"
TRACED=1000
start_gateway
start_callee callee -m $((3 * CALLS))
for ((round = 0; round < 3; round++)); do
    expect_caller caller 4989123 -m $CALLS -r 100
    kill -USR1 $gateway_pid
done
expect_callee
cat <&8 >"$WORK/read.err" &
background+=($!)
cat <&9 >"$WORK/read.out" &
background+=($!)
kill -TERM $gateway_pid
wait $gateway_pid || fail "exit status $?"
gateway_pid=0
for ((i = 0; i < 40; i++)); do # what is in the pipes is on its way
    grep -qx "gateway: $((3 * CALLS)) calls placed, $((3 * CALLS)) answered, $((3 * CALLS)) cleared, 0 failed, 0 left over" \
        "$WORK/read.out" && break
    sleep 0.05
done
((i < 40)) || fail "the last line"
(($(wc -c <"$WORK/read.err") > 65536)) || fail "the log did not fill its pipe"
finish
