# Two peers of one interface. The second gets a call when the first is not there, says nothing, or takes no calls; not when
# the first has rung, and the first does not ring any more when it comes back too late. With OPTIONS a peer that is not
# there gets no call at all: SIPp and kamailio answer these. RFC 3263, 4.3; RFC 3261, 11.
. "$(dirname "$0")/../lib.bash"
PORT_SECOND=$((PORT + 6))

caller() { call_up; send_bye; expect 200; }
refused_caller() { send_invite; expect 100; expect_optional 180; expect "$1"; send_ack_of_failure; }
refused_503() { refused_caller 503; }
refused_486() { refused_caller 486; }
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" '' "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
late_callee() { # its first word comes when the call is with the other one
    expect_invite
    pause 700
    respond "180 Ringing"
    expect_request CANCEL
    respond_in_dialog "200 OK"
    respond_487
    expect_request ACK
}
full_callee() { expect_invite; respond_finally "503 Service Unavailable"; expect_request ACK; }
ringing_callee() { expect_invite; respond "180 Ringing"; pause 100; respond_finally "503 Service Unavailable"; expect_request ACK; }
probed() { expect_request OPTIONS; respond_in_dialog "200 OK"; }

start_second() { # SCENARIO
    write_scenario "$WORK/second.xml" "$1"
    sipp "$HOST:$PORT_B" -sf "$WORK/second.xml" -i "$HOST" -bind_local -p "$PORT_SECOND" -cp $((PORT + 7)) -mp $((PORT + 26)) \
        -nostdin -m 1 -timeout 20s -timeout_error -trace_err -error_file "$WORK/second.log" >"$WORK/second.out" 2>&1 &
    background=($!)
    wait_for_port $! "$PORT_SECOND" udp || fail "the second peer does not start"
}
expect_second() {
    wait "${background[0]}" || fail "the second peer: exit status $?"
    background=()
}
configure() { # LINES-OF-INTERFACE
    write_configuration
    sed -i "s/^peer = \"$HOST:$PORT_CALLEE\"/$1/" "$WORK/gateway.toml"
    sed -i '0,/^\[\[route/s//\[\[sip.peers]]\naddress = "'"$HOST:$PORT_SECOND"'"\npriority = 2\n\n\[\[sip.peers]]\naddress = "'"$HOST:$PORT_CALLEE"'"\npriority = 1\n\n&/' \
        "$WORK/gateway.toml"
}

configure 'failover-after = 300'
start_gateway
start_callee late_callee
start_second callee
expect_caller caller 4989123
expect_second
expect_callee # nobody is there from here on
start_second callee
expect_caller caller 4989123
expect_second
start_callee full_callee
start_second callee
expect_caller caller 4989123
expect_second
expect_callee
start_callee ringing_callee
expect_caller refused_503 4989123
expect_callee
kill -USR1 $gateway_pid
expect_trace "^interface b: peer $HOST:$PORT_CALLEE is up, 4 calls, 4 not taken\$"
expect_trace "^interface b: peer $HOST:$PORT_SECOND is up, 3 calls, 0 not taken\$"
stop_gateway "4 calls placed, 3 answered, 3 cleared, 1 failed"

# who is there
cat >"$WORK/kamailio.cfg" <<END
#!KAMAILIO
debug=0
log_stderror=yes
children=1
disable_tcp=yes
auto_aliases=no
listen=udp:$HOST:$PORT_SECOND
mpath="$(dirname "$(find /usr/lib -path '*/kamailio/modules/sl.so' | head -n 1)")/"
loadmodule "sl.so"
loadmodule "pv.so"
request_route {
    if (\$rm == "OPTIONS")
        sl_send_reply("200", "OK");
    else if (\$rm == "INVITE")
        sl_send_reply("486", "Busy Here");
}
END
kamailio -DD -E -f "$WORK/kamailio.cfg" -Y "$WORK" -m 16 -M 4 >"$WORK/kamailio.log" 2>&1 &
kamailio_pid=$!
trap 'kill -TERM $kamailio_pid 2>/dev/null; wait $kamailio_pid; cleanup' EXIT # its processes end with it
configure 'probe = 1\nprobe-down = 1'
start_gateway
expect_log "interface b: the peer $HOST:$PORT_CALLEE is down"
expect_caller refused_486 4989123
kill -USR1 $gateway_pid
expect_trace "^interface b: peer $HOST:$PORT_CALLEE is down, 0 calls, 0 not taken\$"
start_callee probed
expect_log "interface b: the peer $HOST:$PORT_CALLEE is up"
expect_callee
kill -TERM $kamailio_pid
wait $kamailio_pid
expect_log "interface b: the peer $HOST:$PORT_SECOND is down"
expect_log "interface b: the peer $HOST:$PORT_CALLEE is down" 2
expect_caller refused_503 4989123 # nobody is there
stop_gateway "2 calls placed, 0 answered, 0 cleared, 2 failed"
finish
