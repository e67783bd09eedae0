# Peers by name, which dnsmasq knows: by the records of their service (SRV) and address. A name that nobody knows is passed
# over, and so is a machine of the service that is not there; a name server that says nothing holds up no call, and one
# that comes back is asked again. RFC 3263.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"
PORT_NAMES=$((PORT + 6))
PORT_OTHER=$((PORT + 7))
PORT_GONE=$((PORT + 8))

configure() { # PEER...
    write_configuration '' 't1 = 100'
    sed -i "s/^peer = \"$HOST:$PORT_CALLEE\"/allow = [\"$HOST\"]\nresolver = \"$HOST:$PORT_NAMES\"\nfailover-after = 400/" \
        "$WORK/gateway.toml"
    local peer priority=0 tables=""
    for peer in "$@"; do
        priority=$((priority + 1))
        tables+="[[sip.peers]]\naddress = \"$peer\"\npriority = $priority\n\n"
    done
    sed -i "0,/^\[\[route/s//${tables//[[/\\[\\[}&/" "$WORK/gateway.toml"
}
start_names() {
    dnsmasq --keep-in-foreground --conf-file=/dev/null --no-resolv --no-hosts --bind-interfaces --pid-file \
        --listen-address="$HOST" --port="$PORT_NAMES" --local=/test/ --user="$(id -un)" \
        --host-record="here.test,$HOST" --srv-host="_sip._udp.office.test,here.test,$PORT_GONE,1,1" \
        --srv-host="_sip._udp.office.test,here.test,$PORT_CALLEE,2,1" >"$WORK/names.log" 2>&1 &
    names_pid=$!
    background+=($names_pid)
    wait_for_port $names_pid "$PORT_NAMES" udp || fail "dnsmasq does not start"
}
start_other() { PORT_CALLEE=$PORT_OTHER start_callee callee; }

start_names
configure nobody.test office.test
start_gateway
expect_call
expect_trace '-> INVITE sip:4989123@nobody.test;'
expect_trace '-> INVITE sip:4989123@office.test;'
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
kill $names_pid
wait $names_pid 2>/dev/null

# a name server that says nothing
python3 -c "
import socket, time
s = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
s.bind(('$HOST', $PORT_NAMES))
time.sleep(60)" &
silent_pid=$!
background=($silent_pid)
wait_for_port $silent_pid "$PORT_NAMES" udp || fail "the silent name server does not start"
configure "here.test:$PORT_CALLEE" "$HOST:$PORT_OTHER"
start_gateway
start_other
expect_caller caller 4989123
expect_callee
kill $silent_pid
wait $silent_pid 2>/dev/null
start_names
expect_call
kill -USR1 $gateway_pid
expect_trace "^interface b: peer here.test:$PORT_CALLEE is up, 2 calls, 1 not taken\$"
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
