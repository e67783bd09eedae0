# Peers whose names say how they are reached, which dnsmasq knows: by TCP or UDP as NAPTR has it, else as SRV, else by UDP at
# port 5060. What the name server says that is of no use, or leads nowhere, costs a call no more than the next peer. RFC 3263,
# 4.1 and 4.2.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"
PORT_NAMES=$((PORT + 6))
PORT_GONE=$((PORT + 8))
ALONE=127.0.1.$((PORT / 40 % 250 + 1)) # an address with the port of those whose name says nothing more
record() { printf -- '--naptr-record=%s,%s ' "$1.test" "$2"; }
service() { printf -- '--srv-host=_sip._%s.%s.test,here.test,%s,%s ' "$1" "$2" "$3" "${4:-1}"; }

configure() { # NAME-OR-ADDRESS...
    write_configuration '' 't1 = 100'
    sed -i -e "s/^peer = \"$HOST:$PORT_CALLEE\"/allow = [\"$HOST\", \"$ALONE\"]\nresolver = \"$HOST:$PORT_NAMES\"\nfailover-after = 1000\ntransport = \"named\"/" \
        "$WORK/gateway.toml"
    local name priority=0 tables=""
    for name in "$@"; do
        priority=$((priority + 1))
        tables+="[[sip.peers]]\naddress = \"$name\"\npriority = $priority\n\n"
    done
    sed -i "0,/^\[\[route/s//${tables//[[/\\[\\[}&/" "$WORK/gateway.toml"
}
start_other() { # tcp|udp
    local host=$HOST port=$PORT_CALLEE
    [[ ${IS_ALONE:-} ]] && host=$ALONE port=5060
    write_scenario "$WORK/callee.xml" callee
    sipp "$HOST:$PORT_B" -t "${1:0:1}1" -sf "$WORK/callee.xml" -i "$host" -bind_local -p "$port" -cp $((PORT + 4)) \
        -mp $((PORT + 10)) -nostdin -m 1 -timeout 20s -timeout_error -trace_err -error_file "$WORK/callee.log" >"$WORK/callee.out" 2>&1 &
    callee_pid=$!
    wait_for_port $callee_pid "$port" "$1" || fail "the callee does not start"
}
# expect_called TRANSPORT NAME...: a call to the last one of them
expect_called() {
    local name names=()
    for name in "${@:2}"; do [[ $name == *:* ]] || name+=.test; names+=("$name"); done
    configure "${names[@]}"
    start_gateway
    start_other "$1"
    expect_caller caller 4989123
    expect_callee
    for name in "${names[@]}"; do expect_trace "-> INVITE sip:4989123@$name with"; done
    stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
}

dnsmasq --keep-in-foreground --conf-file=/dev/null --no-resolv --no-hosts --bind-interfaces --pid-file \
    --listen-address="$HOST" --port="$PORT_NAMES" --local=/test/ --user="$(id -un)" \
    --host-record="here.test,$HOST" --host-record="plain.test,$ALONE" \
    $(record stream 10,10,S,SIP+D2T,,_sip._tcp.stream.test) $(record stream 20,10,S,SIP+D2U,,_sip._udp.stream.test) \
    $(service tcp stream $PORT_CALLEE) $(service udp stream $PORT_GONE) \
    $(record datagram 10,10,s,SIPS+D2T,,_sips._tcp.datagram.test) $(record datagram 20,10,s,SIP+D2S,,_sip._sctp.datagram.test) \
    $(record datagram 30,10,s,SIP+D2U,,_sip._udp.elsewhere.test) $(record datagram 40,10,s,SIP+D2T,,_sip._tcp.stream.test) \
    $(service udp elsewhere $PORT_CALLEE) \
    $(service tcp served $PORT_CALLEE) \
    $(record round 10,10,s,SIP+D2U,,round.test) \
    $(record nowhere 10,10,s,SIP+D2U,,_sip._udp.nowhere.test) \
    $(record pattern '10,10,u,SIP+D2U,!^.*$!sip:x@here.test!') \
    $(record strange 10,10,s,E2U+mailto,,here.test) >"$WORK/names.log" 2>&1 &
names_pid=$!
background+=($names_pid)
wait_for_port $names_pid "$PORT_NAMES" udp || fail "dnsmasq does not start"

expect_called tcp stream   # as the order of its records says
expect_called udp datagram # by the first way that is ours, whatever name that leads to
expect_called tcp served   # without NAPTR
IS_ALONE=yes expect_called udp plain
expect_called tcp round nowhere pattern strange stream # one after the other, and each leads nowhere

# a name server that says nothing
kill $names_pid
wait $names_pid 2>/dev/null
python3 -c "
import socket, time
s = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
s.bind(('$HOST', $PORT_NAMES))
time.sleep(60)" &
background=($!)
wait_for_port $! "$PORT_NAMES" udp || fail "the silent name server does not start"
expect_called udp stream "$HOST:$PORT_CALLEE"
finish
