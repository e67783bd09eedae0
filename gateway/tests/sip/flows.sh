# Phones that have registered over TCP and over TLS are called over the connections that they have opened, where `nat` says
# that they may be out of reach otherwise: nobody listens at the ports that these come from. RFC 5923; RFC 5626, 3.2.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"
. "$HERE/certificates.bash"

make_certificate ca ca
make_certificate gateway ca "IP:$HOST"
printf 'tina:office:secret\nsecura:office:secret\n' >"$WORK/passwords"
chmod 600 "$WORK/passwords"
write_configuration
sed -i -e "s,^name = \"a\",&\nnat = true\nauthenticate = true\nregistrar = true\nrealm = \"office\"\nalgorithms = [\"MD5\"]\npasswords = \"$WORK/passwords\"\nallow = [\"$HOST\"]\ntransports = [\"udp\"\, \"tcp\"\, \"tls\"]\ntls-port = $((PORT + 6))\ntls-certificate = \"$TLS/gateway.pem\"\ntls-key = \"$TLS/gateway.key\"\ntls-verify = \"off\"," \
    -e 's/^name = "b"/&\ntransports = ["udp", "tcp"]/' -e "/^peer = \"$HOST:$PORT_CALLER\"/d" "$WORK/gateway.toml"
call() { # USER TRANSPORT
    calls=$((calls + 1))
    PORT_A=$PORT_B PORT_CALLER=$PORT_CALLEE RELAYED=. expect_caller caller "$1"
    expect_log "call $calls b \(calling side\) released: cause 16 "
    expect_log "call $calls a \(called side\) released: cause 16 "
    expect_trace "-> INVITE sip:$1[^ ]*;transport=$2"
    expect_trace "<- 200 to the BYE"
}
caller() { call_up; pause 300; send_bye; expect 200; }
missing() { send_invite; expect 100; expect 503 Reason: 'Q.850;cause=27'; send_ack_of_failure; }
# expect_contacts NUMBER
expect_contacts() {
    local i
    for ((i = 0; i < 100; i++)); do
        kill -USR1 $gateway_pid
        sleep 0.1
        grep -q "^interface a: $1 contacts, " "$WORK/gateway.out" && return 0
    done
    fail "not $1 contacts"
}

calls=0
TRACED=2 start_gateway
CODECS=PCMA REGINT=600 start_phone tina $((PORT + 7)) "$PORT_A;transport=tcp" $((PORT + 16)) "answermode=auto;auth_user=tina;auth_pass=secret"
expect_contacts 1
CODECS=PCMA REGINT=600 start_phone secura $((PORT + 9)) "$((PORT + 6));transport=tls" $((PORT + 24)) "answermode=auto;auth_user=secura;auth_pass=secret"
expect_contacts 2
call tina tcp
call secura tls

# one that is gone with its connection is missed at once
kill -KILL "${background[0]}"
{ wait "${background[0]}"; } 2>/dev/null
PORT_A=$PORT_B PORT_CALLER=$PORT_CALLEE expect_caller missing tina
stop_gateway "3 calls placed, 2 answered, 2 cleared, 1 failed"
finish
