# Interfaces come and go while a call is up: one that is configured no more takes no new call, and goes with its last one. What
# cannot be followed changes nothing.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"
CTL=$3
export CALLCONTROL_GATEWAY_SOCKET=$WORK/control
PORT_OLD=$PORT_B

held_caller() { call_up; expect_request BYE; respond_in_dialog "200 OK"; }
refused() { send_invite; expect 503; send_ack_of_failure; }
ringing() { expect_invite; respond "180 Ringing"; expect_request CANCEL; respond_in_dialog "200 OK"; respond_487; expect_request ACK; }
lonely() { send_invite; expect 100; expect 180; expect 480; send_ack_of_failure; }
# configure NAME [LINES-OF-INTERFACE]: where the calls of a go, on PORT_B and PORT_CALLEE
configure() {
    local PORT_CALLER=$((PORT + 1)) # that of a stays
    write_configuration "" "${2:-}"
    sed -i "s/\"b\"/\"$1\"/" "$WORK/gateway.toml"
    printf '[control]\nsocket = "%s"\n' "$WORK/control" >>"$WORK/gateway.toml"
}
reload() { "$CTL" reload || fail "the configuration is not followed"; }
# refuse REASON: a reload says it
refuse() {
    local status=0
    "$CTL" reload >"$WORK/ctl.log" 2>&1 || status=$?
    ((status == 1)) && grep -qE -- "$1" "$WORK/ctl.log" || fail "reload: exit status $status, $(cat "$WORK/ctl.log"), not: $1"
}

configure b
start_gateway
SIPP_TIMEOUT=50s start_callee callee
held_callee=$callee_pid callee_pid=0
SIPP_TIMEOUT=50s run_caller held_caller 4989123 &
background+=($! "$held_callee")
for ((i = 0; i < 200; i++)); do "$CTL" calls | grep -q 'b/1 CONNECTED' && break; sleep 0.05; done

# c instead of b, and other ports than those of the call that is up
PORT_CALLER=$((PORT + 6)) PORT_B=$((PORT + 34)) PORT_CALLEE=$((PORT + 35))
elsewhere=(-cp $((PORT + 7)) -mp $((PORT + 24)))
configure c
reload
expect_log 'info interface b is removed, and goes with its last call'
start_callee callee -cp $((PORT + 8)) -mp $((PORT + 28))
expect_caller caller 4989123 "${elsewhere[@]}"
expect_callee
PORT_A=$PORT_OLD expect_caller refused 4420 "${elsewhere[@]}"
"$CTL" calls | grep -q 'b/1 CONNECTED' || fail "the call did not stay"
"$CTL" interfaces | grep -qE '^c ' || fail "no interface c: $("$CTL" interfaces)"
"$CTL" interfaces | grep -qE '^b ' && fail "an interface b: $("$CTL" interfaces)"
cp "$WORK/gateway.toml" "$WORK/with_c.toml"
PORT_B=$PORT_OLD configure b
refuse "interfaces: 'b' was removed and has calls that are not over"
expect_log 'interface b is gone' 0
"$CTL" drop 1 16 || fail "the call cannot be dropped"
wait "${background[@]}" || fail "the call did not end as it should"
background=()
expect_log 'info interface b is gone'
owns_port $gateway_pid "$PORT_OLD" udp && fail "the port of b is still there"

# there again, while c has no call and goes at once
PORT_B=$PORT_OLD
configure b
reload
expect_log 'info interface c is gone'
start_callee callee -cp $((PORT + 8)) -mp $((PORT + 28))
expect_caller caller 4989123 "${elsewhere[@]}"
expect_callee

# a port that is taken: what could be opened before is closed again
printf '[[sip]]\nname = "good"\nlisten = "%s:%s"\npeer = "%s:9"\n[[sip]]\nname = "taken"\nlisten = "%s:%s"\npeer = "%s:9"\n' \
    $HOST $((PORT + 36)) $HOST $HOST "$PORT_A" $HOST >>"$WORK/gateway.toml"
refuse "sip\[3\].listen: cannot listen on $HOST:$PORT_A"
owns_port $gateway_pid $((PORT + 36)) udp && fail "a part of the change was followed"
configure b 't1 = 400'
refuse 'sip\[0\].t1: a change of it needs a restart'

# what an interface follows as it is
configure b 'answer-timeout = 1'
reload
start_callee ringing -cp $((PORT + 8)) -mp $((PORT + 28))
expect_caller lonely 4989123 "${elsewhere[@]}"
expect_callee
stop_gateway "4 calls placed, 3 answered, 3 cleared, 1 failed"
finish
