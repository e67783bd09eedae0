# What a capture server is shown: each SIP message of a call, as the server and a second reader of the protocol have it,
# and RTCP reports with the call that they are of. Without the server calls go on.
RELAYED='m=audio'
. "$(dirname "$0")/../lib.bash"
. "$(dirname "$0")/../plain_call.bash"
PORT_SERVER=$((PORT + 30))

# start_server: kamailio, which writes a line for each packet
start_server() {
    mkdir "$WORK/database"
    cat >"$WORK/kamailio.cfg" <<END
#!KAMAILIO
debug=0
log_stderror=yes
children=1
auto_aliases=no
listen=udp:$HOST:$PORT_SERVER
disable_tcp=yes
mpath="$(dirname "$(find /usr/lib -path '*/kamailio/modules/sipcapture.so' | head -n 1)")/"
loadmodule "pv.so"
loadmodule "textops.so"
loadmodule "xlog.so"
loadmodule "db_text.so"
loadmodule "sipcapture.so"
modparam("sipcapture", "db_url", "text://$WORK/database")
modparam("sipcapture", "hep_capture_on", 1)
modparam("sipcapture", "nonsip_hook", 1)
event_route[sipcapture:request] {
    xlog("L_ERR", "capture: version \$hep(version) protocol \$hep(0x00b) from \$hep(0x003):\$hep(0x007) to \$hep(0x004):\$hep(0x008) agent \$hep(0x00c) call \$hep(0x011) shows \$(hep(0x00f){re.subst,/[\r\n]+/ /g})\n");
    drop;
}
request_route { exit; }
END
    kamailio -DD -E -f "$WORK/kamailio.cfg" -Y "$WORK" -m 16 -M 4 >"$WORK/server.log" 2>&1 &
    server_pid=$!
    trap 'kill $server_pid 2>/dev/null; wait $server_pid 2>/dev/null; cleanup' EXIT
    wait_for_port $server_pid $PORT_SERVER udp || fail "the capture server does not start"
}

# shown N REGEXP: the server has got so many packets like that
shown() {
    local i
    for ((i = 0; i < 100; i++)); do
        (($(grep -cE "capture: version 3 protocol $2" "$WORK/server.log") == $1)) && return 0
        sleep 0.05
    done
    fail "the capture server has not got $1 of $2"
}
long_caller() { call_up; pause 8000; send_bye; expect 200; }

start_server
write_configuration
printf '[capture]\nserver = "%s:%d"\nid = 2001\n[metrics]\nlisten = "%s:%d"\n' \
    "$HOST" $PORT_SERVER "$HOST" $((PORT + 29)) >>"$WORK/gateway.toml"
relay_media
start_gateway
start_callee callee
expect_caller long_caller 4989123
expect_callee
a=$HOST:$PORT_A caller=$HOST:$PORT_CALLER b=$HOST:$PORT_B callee=$HOST:$PORT_CALLEE
for message in "$caller to $a INVITE" "$a to $caller SIP/2.0 100" "$b to $callee INVITE" "$callee to $b SIP/2.0 200 .*CSeq: [0-9]+ INVITE" \
    "$b to $callee ACK" "$a to $caller SIP/2.0 200 .*CSeq: 1 INVITE" "$caller to $a ACK" "$caller to $a BYE" "$b to $callee BYE" \
    "$a to $caller SIP/2.0 200 .*CSeq: [0-9]+ BYE"; do
    read -r from _ to text <<<"$message"
    shown 1 "1 from $from to $to agent 2001 call  shows $text "
done
for port in 40001 50001; do # every 2.5 to 7.5 s
    grep -qE "protocol 5 from $HOST:[0-9]+ to $HOST:$port agent 2001 call [^ ]+ shows \{\"ssrc\":[0-9]+,\"type\":201," "$WORK/server.log" ||
        fail "no report to port $port"
done
grep -qE "to $HOST:40001 agent 2001 call [0-9]+-[0-9]+@$HOST shows" "$WORK/server.log" || fail "a report is not of its call"
kill $server_pid
wait $server_pid

# a second reader has the messages as the wire has them: it writes them down, and tshark finds them well-formed
sngrep -N -q -L "udp:$HOST:$PORT_SERVER" -O "$WORK/shown.pcap" >"$WORK/reader.log" 2>&1 </dev/null &
reader=$!
background+=($reader)
wait_for_port $reader $PORT_SERVER udp || fail "the reader does not start"
expect_call
sleep 0.2 # it writes what it has got
kill $reader
wait $reader
tshark -r "$WORK/shown.pcap" -d "udp.port==$PORT_A,sip" -d "udp.port==$PORT_B,sip" -T fields -E separator=/s -e udp.srcport -e udp.dstport \
    -e sip.CSeq.method -e sip.Status-Code -e _ws.malformed >"$WORK/read.log" 2>"$WORK/tshark.log"
for message in "$PORT_CALLER $PORT_A INVITE" "$PORT_A $PORT_CALLER INVITE 100" "$PORT_B $PORT_CALLEE INVITE" "$PORT_CALLEE $PORT_B INVITE 200" \
    "$PORT_CALLER $PORT_A ACK" "$PORT_CALLER $PORT_A BYE" "$PORT_A $PORT_CALLER BYE 200"; do
    (($(grep -cE "^$message *\$" "$WORK/read.log") == 1)) || fail "not read: $message"
done

# nobody is there any more
expect_call
python3 -c 'import sys, urllib.request as r; sys.stdout.write(r.urlopen(sys.argv[1], timeout=20).read().decode())' \
    "http://$HOST:$((PORT + 29))/metrics" >"$WORK/metrics.log"
grep -qE '^callcontrol_gateway_capture_packets_lost_total [1-9]' "$WORK/metrics.log" || fail "nothing was lost"
stop_gateway "3 calls placed, 3 answered, 3 cleared, 0 failed"
finish
