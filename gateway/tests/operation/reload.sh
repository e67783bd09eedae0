# A changed configuration is followed while a call is up: routes and limits; a fault, or what needs a restart, changes
# nothing.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"
CTL=$3
export CALLCONTROL_GATEWAY_SOCKET=$WORK/control

caller() { call_up; pause 1500; send_bye; expect 200; }
lonely() { send_invite; expect 404; send_ack_of_failure; }
refused() { send_invite; expect 503; send_ack_of_failure; }
# change SED-EXPRESSION...; refuse REASON: a reload says it
change() { sed -i "$@" "$WORK/gateway.toml"; }
refuse() {
    local status=0
    "$CTL" reload >"$WORK/ctl.log" 2>&1 || status=$?
    ((status == 1)) && grep -qE -- "$1" "$WORK/ctl.log" || fail "reload: exit status $status, $(cat "$WORK/ctl.log"), not: $1"
    expect_log "error the configuration stays as it was: .*$1"
}

write_configuration "max-calls = 0"
printf '[control]\nsocket = "%s"\n' "$WORK/control" >>"$WORK/gateway.toml"
start_gateway
start_callee callee
SIPP_TIMEOUT=20s run_caller caller 4989123 &
background+=($!)
for ((i = 0; i < 100; i++)); do "$CTL" calls | grep -q 'b/1 CONNECTED' && break; sleep 0.05; done

# another client, since the port of the first has a call
PORT_CALLER=$((PORT + 6))
change 's/^prefix = .*/prefix = "77"/'
"$CTL" reload || fail "routes are not read again"
expect_caller lonely 4989123 -cp $((PORT + 7)) -mp $((PORT + 24))
change 's/^max-calls = .*/max-calls = 1/'
kill -HUP $gateway_pid
expect_log "the configuration is read again: 2 routes" 2
expect_caller refused 7789123 -cp $((PORT + 7)) -mp $((PORT + 24))

cp "$WORK/gateway.toml" "$WORK/good.toml"
change 's/^max-calls = .*/max-calls = "many"/'
refuse 'gateway.max-calls: expected a whole number'
cp "$WORK/good.toml" "$WORK/gateway.toml"
change "s/^listen = \"$HOST:$PORT_B\"/listen = \"$HOST:9\"/"
refuse 'sip\[1\].listen: a change of it needs a restart'
rm "$WORK/gateway.toml"
refuse 'file: cannot be read'
expect_caller refused 7789123 -cp $((PORT + 7)) -mp $((PORT + 24))

wait "${background[0]}" || fail "the call did not go on"
expect_callee
stop_gateway "2 calls placed, 1 answered, 1 cleared, 1 failed"
finish
