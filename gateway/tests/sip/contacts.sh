# A user with several contacts is called at the one he likes best, then at the next one if that refuses or is not there; who
# declines does so for all of them. Without a user of that name the call goes to the peer. RFC 3261, 16.5.
. "$(dirname "$0")/../lib.bash"

registering() {
    local text="REGISTER sip:$HOST SIP/2.0
Via: SIP/2.0/[transport] [local_ip]:[local_port];branch=[branch]
From: <sip:bob@$HOST>;tag=[pid]r[call_number]
To: <sip:bob@$HOST>
Call-ID: [call_id]
Contact: <sip:desk@$HOST:$PORT_CALLEE>, <sip:mobile@$HOST:$PORT_CALLEE>;q=0.4, <sip:nobody@$HOST:$((PORT + 7))>;q=0.5
Max-Forwards: 70"
    send_text retrans "$text
CSeq: 1 REGISTER" ''
    echo '<recv response="401" auth="true"/>'
    step=$((step + 1))
    send_text retrans "$text
CSeq: 2 REGISTER
[authentication username=bob password=secret]" ''
    expect 200
}
caller() { call_up; pause 100; send_bye; expect 200; }
callee() {
    expect_invite msg "INVITE sip:desk@" To: "sip:bob@$HOST:$PORT_B"
    respond_finally "486 Busy Here"
    expect_request ACK
    expect_invite msg "INVITE sip:mobile@" To: "sip:bob@$HOST:$PORT_B" body "o=caller"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
declined_caller() {
    send_invite
    expect 100
    expect 603
    send_ack_of_failure
}
declining_callee() {
    expect_invite msg "INVITE sip:desk@"
    respond_finally "603 Decline"
    expect_request ACK
}
peers_callee() {
    expect_invite msg "INVITE sip:4989123@$HOST:$PORT_CALLEE"
    respond_finally "603 Decline"
    expect_request ACK
}

echo "bob:office:secret" >"$WORK/passwords"
chmod 600 "$WORK/passwords"
write_configuration
sed -i "s,^name = \"b\",&\nauthenticate = true\nregistrar = true\nrealm = \"office\"\npasswords = \"$WORK/passwords\"\nalgorithms = [\"MD5\"]," "$WORK/gateway.toml"
start_gateway
PORT_A=$PORT_B expect_caller registering x
start_callee callee
expect_caller caller bob
expect_callee
expect_causes 1 16
expect_trace '-> INVITE sip:nobody@'
start_callee declining_callee
expect_caller declined_caller bob
expect_callee
start_callee peers_callee
expect_caller declined_caller 4989123
expect_callee
stop_gateway "3 calls placed, 1 answered, 1 cleared, 2 failed"
finish
