# What an operator sees of calls on a terminal, and how the terminal is left.
. "$(dirname "$0")/../lib.bash"
. "$(dirname "$0")/../plain_call.bash"
export CALLCONTROL_GATEWAY_SOCKET=$WORK/control
caller() { call_up; expect_request BYE; respond_in_dialog "200 OK"; }

write_configuration
printf '[control]\nsocket = "%s"\n' "$WORK/control" >>"$WORK/gateway.toml"
start_gateway
start_callee callee
run_caller caller 4989123 &
background+=($!)
for ((i = 0; i < 200; i++)); do "$3" calls | grep -q 'b/1 CONNECTED' && break; sleep 0.05; done
python3 "$HERE/operation/terminal.py" "$3" $gateway_pid >"$WORK/terminal.log" 2>&1 || fail "what is shown on a terminal"
wait "${background[0]}" || fail "the caller: exit status $?"
expect_end "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
