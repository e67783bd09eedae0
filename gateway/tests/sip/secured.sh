# TLS with kamailio, both ways, each end with a certificate that the other one verifies; a call by a sips URI stays on TLS
# or does not leave. Who has none, or a wrong one, or speaks TLS 1.1, is refused, counted, and told of once; so is a peer
# whose certificate is wrong. A renewed certificate is taken without a restart.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"
. "$HERE/certificates.bash"
PORT_BEHIND=$((PORT + 6)) # SIPp behind kamailio
PORT_PROXY=$((PORT + 7))  # kamailio there
PORT_C=$((PORT + 8))      # interface c, on which nobody is asked for a certificate
PORT_WRONG=$((PORT + 9))  # its peer

make_certificate ca ca
make_certificate gateway ca "IP:$HOST"
make_certificate peer ca "DNS:peer.example,IP:$HOST"
make_certificate other ca DNS:other.example
make_certificate expired ca "IP:$HOST" -1
make_certificate self self "IP:$HOST"

start_kamailio() {
    cat >"$WORK/kamailio.cfg" <<END
#!KAMAILIO
debug=0
log_stderror=yes
children=1
tcp_children=1
auto_aliases=no
enable_tls=yes
listen=udp:$HOST:$PORT_PROXY
listen=tls:$HOST:$PORT_CALLEE
mpath="$(dirname "$(find /usr/lib -path '*/kamailio/modules/tls.so' | head -n 1)")/"
loadmodule "sl.so"
loadmodule "tm.so"
loadmodule "rr.so"
loadmodule "pv.so"
loadmodule "textops.so"
loadmodule "siputils.so"
loadmodule "tls.so"
modparam("tls", "tls_method", "TLSv1.2+")
modparam("tls", "certificate", "$TLS/peer.pem")
modparam("tls", "private_key", "$TLS/peer.key")
modparam("tls", "ca_list", "$TLS/ca.pem")
modparam("tls", "verify_certificate", 1)
modparam("tls", "require_certificate", 1)
request_route {
    if (is_method("ACK|CANCEL") || (has_totag() && loose_route())) {
        loose_route();
        t_relay();
        exit;
    }
    record_route();
    if (src_port == $PORT_BEHIND)
        \$du = "sip:$HOST:$PORT_B;transport=tls";
    else
        \$du = "sip:$HOST:$PORT_BEHIND";
    t_relay();
}
END
    kamailio -DD -E -f "$WORK/kamailio.cfg" -Y "$WORK" -m 64 -M 4 >"$WORK/kamailio.log" 2>&1 &
    kamailio_pid=$!
    trap 'kill -TERM $kamailio_pid; wait $kamailio_pid; cleanup' EXIT # its processes end with it, unless it is killed
    local i
    for ((i = 0; i < 200; i++)); do
        grep -q "$(printf ':%04X 00000000:0000 0A' "$PORT_CALLEE")" /proc/net/tcp && return 0
        kill -0 $kamailio_pid 2>/dev/null || fail "kamailio does not start"
        sleep 0.05
    done
    fail "kamailio does not listen"
}

secured() { # CERTIFICATE KEY
    echo "transport = \"tls\"\ntls-certificate = \"$TLS/$1.pem\"\ntls-key = \"$TLS/$1.key\"\ntls-authorities = \"$TLS/ca.pem\"\n"
}
write_configuration
sed -i "s,^name = \"b\",&\n$(secured gateway)," "$WORK/gateway.toml"
cat >>"$WORK/gateway.toml" <<END

[[sip]]
name = "c"
listen = "$HOST:$PORT_C"
peer = "$HOST:$PORT_WRONG"
tls-verify-clients = "off"
tcp-idle = 1
$(echo -e "$(secured gateway)")

[[route]]
from = "a"
prefix = "77"
to = "c"

[[route]]
from = "c"
to = "a"
END
sed -i '0,/^prefix = ""/s//prefix = "4"/' "$WORK/gateway.toml"
start_kamailio
"$GATEWAY" --config "$WORK/gateway.toml" --trace-calls 2 --log-level debug >"$WORK/gateway.out" 2>"$WORK/gateway.err" &
gateway_pid=$!
wait_for_port $gateway_pid "$PORT_C" tcp || fail "the gateway does not listen"

refused_caller() {
    send_invite
    expect 100
    expect 503
    send_ack_of_failure
}

# out and in
callee_behind() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" '' "200 OK" '[last_Record-Route:]'
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
PORT_CALLEE=$PORT_BEHIND PORT_B=$PORT_PROXY start_callee callee_behind
expect_caller caller 4989123
expect_callee
expect_causes 1 16
inward_caller() { # by a sips URI, which the way to interface a is too little for
    send_text retrans "$(request_text INVITE 1 '[branch]' '' | sed '1s/sip:/sips:/')" "$SDP_OF_CALLER"
    expect 100
    expect 480
    send_ack_of_failure
}
PORT_CALLER=$PORT_BEHIND PORT_A=$PORT_PROXY expect_caller inward_caller 4420
expect_log 'call 2 a \(called side\) released: cause 58 '

# knock PORT STATUS [ARGUMENT]...: a client of its own; 0: it is taken, and the end comes from here
knock() {
    local status=0
    echo Q | timeout 10 openssl s_client -connect "$HOST:$1" -CAfile "$TLS/ca.pem" "${@:3}" >"$WORK/knock" 2>&1 || status=$?
    [[ $status == "$2" ]] || fail "openssl s_client ${*:3}: $status"
}
with() { echo "-cert $TLS/$1.pem -key $TLS/$1.key"; }
knock "$PORT_B" 0 -tls1_2 $(with peer)
knock "$PORT_B" 0 -tls1_3 $(with peer)
knock "$PORT_B" 1 -tls1_1 -cipher DEFAULT@SECLEVEL=0 $(with peer)
grep -q 'alert protocol version' "$WORK/knock" || fail "TLS 1.1 was not refused for its version"
knock "$PORT_B" 1 -tls1_2
for wrong in other expired self; do
    knock "$PORT_B" 1 -tls1_2 $(with $wrong)
done
knock "$PORT_C" 0 -tls1_3
expect_refused() { # INTERFACE TIMES
    kill -USR1 $gateway_pid
    expect_trace "^interface $1: [0-9]+ connections of TLS, $2 refused$"
}
expect_refused b 5
expect_log 'interface b: no TLS with 127.0.0.1: ' 1

# whom the gateway is to call shows a wrong certificate
for wrong in other expired self; do
    openssl s_server -accept "$HOST:$PORT_WRONG" -cert "$TLS/$wrong.pem" -key "$TLS/$wrong.key" -quiet >"$WORK/server" 2>&1 &
    background=($!)
    wait_for_port $! "$PORT_WRONG" tcp || fail "the wrong peer does not listen"
    expect_caller refused_caller 7712
    kill $! && wait $! 2>/dev/null
    background=()
done
expect_log 'call [345] c \(called side\) released: cause [0-9]+ .*SIP 503' 3
expect_refused c 3
expect_log 'interface c: no TLS with 127.0.0.1: its certificate: IP address mismatch' 1

# who connects and says nothing
exec 9<>"/dev/tcp/$HOST/$PORT_C"
IFS= read -r -t 10 -n 1 <&9
(($? == 1)) || fail "a connection without a word stays"
exec 9>&-

# the certificate is renewed; then it is spoilt
make_certificate renewed ca "IP:$HOST"
cp "$TLS/renewed.pem" "$TLS/gateway.pem" && cp "$TLS/renewed.key" "$TLS/gateway.key"
kill -HUP $gateway_pid
expect_log 'interface [bc]: the certificate of .*gateway.pem is read again' 2
knock "$PORT_C" 0
grep -q 'subject=CN = renewed' "$WORK/knock" || fail "the old certificate is shown"
cp "$TLS/peer.key" "$TLS/gateway.key"
kill -HUP $gateway_pid
expect_log 'interface [bc]: the certificate stays as it was: tls-key: .*: has no key for the certificate' 2
knock "$PORT_C" 0
grep -q 'subject=CN = renewed' "$WORK/knock" || fail "the certificate is not what it was"
stop_gateway "5 calls placed, 1 answered, 1 cleared, 4 failed"
finish
