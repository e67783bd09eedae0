# The complete configurations of the README, with the test's addresses and files in place of theirs: each is one, and a call
# goes through it.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"
. "$HERE/phones.bash"
. "$HERE/kamailio.bash"

EXAMPLES=$HERE/../examples
# use EXAMPLE SED-COMMAND...: with these in place of its addresses; every line but those stays
use() {
    local name=$1 command commands=()
    shift
    for command in "$@" "s,/(etc|run|var/lib|var/log)/callcontrol-gateway/,$WORK/,"; do
        commands+=(-e "$command")
    done
    { sed -E "${commands[@]}" "$EXAMPLES/$name.toml"; } >"$WORK/gateway.toml"
    grep -E '^(listen|peer|address) = ' "$WORK/gateway.toml" | grep -vF "\"$HOST:" && fail "$name: an address is left as it was"
    sed -i "s/^mode = \"relay\"/&\nfirst-port = $((PORT + 32))\nlast-port = $((PORT + 39))/" "$WORK/gateway.toml"
    "$GATEWAY" --config "$WORK/gateway.toml" --check >"$WORK/check.log" 2>&1 || fail "$name: $(cat "$WORK/check.log")"
}
routed() { # FROM NUMBER EXPECTED-REGEXP
    "$GATEWAY" --config "$WORK/gateway.toml" --from "$1" --route "$2" >"$WORK/route.log"
    grep -qE "$3" "$WORK/route.log" || fail "$2 from $1: $(cat "$WORK/route.log")"
}
passwords() {
    printf '%s\n' "$@" >"$WORK/passwords"
    chmod 600 "$WORK/passwords"
}
transports() { echo udp; } # on which all of them listen
interfaces() { # NAME-OF-A NAME-OF-B: what start_gateway waits for is the ports alone
    expect_log "interface $1 listens on $HOST:$PORT_A"
    expect_log "interface $2 listens on $HOST:$PORT_B"
}

# --- the trunk: from the PBX to kamailio, which asks who calls, and on to SIPp -----------------------------------------
passwords "4989123:$PROVIDER:secret"
use trunk "s/192.0.2.10:5060/$HOST:$PORT_CALLEE/" "s/192.0.2.1:5060/$HOST:$PORT_B/" "s/10.0.0.20:5060/$HOST:$PORT_CALLER/" \
    "s/10.0.0.1:5060/$HOST:$PORT_A/"
routed pbx 004420 '^\+4420 from pbx: prefix "\+" to provider, 30 calls at most$'
routed pbx 112 'to provider, an emergency number'
routed provider +498912310 'to pbx as 498912310'
start_kamailio SHA-256
start_gateway
interfaces pbx provider
expect_log "interface provider: registered as sip:4989123@$PROVIDER for "
called_abroad() {
    expect_invite msg 'INVITE sip:.4420@' body 'm=audio'
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
calling_out() { send_invite; expect 100; expect_optional 180; expect 200; send_ack; pause 100; send_bye; expect 200; }
PORT_CALLEE=$PORT_BEHIND PORT_B=$PORT_CALLEE start_callee called_abroad
expect_caller calling_out 004420
expect_callee
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
stop_kamailio

# --- the phones: one calls the other by its name -----------------------------------------------------------------------
passwords alice:office:secret bob:office:secret
use phones "s/192.0.2.10:5060/$HOST:$((PORT + 6))/" "s/192.0.2.1:5060/$HOST:$PORT_A/" "s/192.0.2.1:5070/$HOST:$PORT_B/"
routed phones 089 'to provider'
routed phones bob 'to phones'
routed provider +498912310 'to phones as alice'
start_gateway
REGINT=600
start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16)) "auth_user=alice;auth_pass=secret"
start_phone bob "$PORT_CALLEE" "$PORT_A" $((PORT + 20)) "answermode=auto;auth_user=bob;auth_pass=secret"
for ((i = 0; i < 200; i++)); do
    kill -USR1 $gateway_pid
    sleep 0.05
    grep -q "^interface phones: 2 contacts" "$WORK/gateway.out" && break
done
tell_phone "$PORT_CALLER" dial "sip:bob@$HOST:$PORT_A"
for ((i = 0; i < 200; i++)); do [[ $(stat -c %s "$(heard_by alice)" 2>/dev/null || echo 0) -gt 20000 ]] && break; sleep 0.05; done
tell_phone "$PORT_CALLER" hangup
expect_log 'call 1: alice on phones to bob on phones, answered '
stop_phones
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
expect_speech bob alice 20

# --- the border: the first carrier refuses, the second one takes the call, with what may cross --------------------------
use border "s/192.0.2.10:5060/$HOST:$PORT_CALLEE/" "s/192.0.2.11:5060/$HOST:$((PORT + 7))/" "s/192.0.2.1:5060/$HOST:$PORT_B/" \
    "s/10.0.0.20:5060/$HOST:$PORT_CALLER/" "s/10.0.0.1:5060/$HOST:$PORT_A/"
full_carrier() { expect_invite; respond_finally "503 Service Unavailable"; expect_request ACK; }
carrier() {
    expect_invite msg 'INVITE sip:.4420@' X-Customer: '^ *77' From: 'sip:.498@'
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
shown() { send_invite 'X-Customer: 77'; expect 100; expect_optional 180; expect 200; send_ack; pause 100; send_bye; expect 200; }
start_gateway
PORT_CALLEE=$((PORT + 7)) PORT=$((PORT + 14)) start_callee carrier
taking=$callee_pid
background+=($taking)
start_callee full_carrier
ALICE='<sip:+498@[local_ip]:[local_port]>' expect_caller shown +4420
expect_callee
wait $taking || fail "the second carrier: exit status $?"
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
