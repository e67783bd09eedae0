# kamailio is the provider: the gateway registers, calls out through it (it asks who calls, and stays on the way), and is
# called at its number. By SHA-256, as kamailio computes it.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"
. "$HERE/kamailio.bash"

echo "4420:$PROVIDER:secret" >"$WORK/passwords"
chmod 600 "$WORK/passwords"
write_configuration
sed -i "s,^name = \"b\",&\nuser = \"4420\"\npasswords = \"$WORK/passwords\"\nregister = true\nregister-retry = 1\ndomain = \"$PROVIDER\"," \
    "$WORK/gateway.toml"
start_kamailio SHA-256
start_gateway
expect_log "interface b: registered as sip:4420@$PROVIDER for 600 s"

# out
PORT_CALLEE=$PORT_BEHIND PORT_B=$PORT_CALLEE start_callee callee
expect_caller caller 4989123
expect_callee
expect_causes 1 16
expect_trace '<- 407, once more with credentials'

# in: it asks for the number that was registered; interface a's peer is called
inward_caller() {
    send_text retrans "INVITE sip:4420@$PROVIDER SIP/2.0
Via: SIP/2.0/UDP $HOST:$PORT_BEHIND;branch=[branch]
From: <sip:4989123@$PROVIDER>;tag=[pid]in
To: <sip:4420@$PROVIDER>
Call-ID: [call_id]
CSeq: 1 INVITE
Contact: <sip:4989123@$HOST:$PORT_BEHIND>
Max-Forwards: 70" "$SDP_OF_CALLER"
    expect 100
    expect_optional 100
    expect 486
    send_text '' "ACK sip:4420@$PROVIDER SIP/2.0
Via: SIP/2.0/UDP $HOST:$PORT_BEHIND;branch=[branch-4]
From: <sip:4989123@$PROVIDER>;tag=[pid]in
To: <sip:4420@$PROVIDER>[peer_tag_param]
Call-ID: [call_id]
CSeq: 1 ACK" ''
}
inward_callee() {
    expect_invite To: "sip:4420@" From: "sip:4989123@"
    respond_finally "486 Busy Here"
    expect_request ACK
}
PORT_CALLEE=$PORT_CALLER PORT_B=$PORT_A start_callee inward_callee
PORT_CALLER=$PORT_BEHIND PORT_A=$PORT_CALLEE expect_caller inward_caller 4420
expect_callee
expect_log 'call 2 b \(calling side\) released: cause 17 '

stop_gateway "2 calls placed, 1 answered, 1 cleared, 1 failed"
finish
