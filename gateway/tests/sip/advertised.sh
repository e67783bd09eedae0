# An interface that listens on every address and tells its peers one, with another port: Contact and From have both,
# Via has the address, since answers come to where requests leave.
. "$(dirname "$0")/../lib.bash"

TOLD=127.0.0.9
TOLD_A=$((PORT + 30))
TOLD_B=$((PORT + 31))
caller() {
    send_invite
    expect 100
    expect 200 Contact: "sip:gateway@$TOLD:$TOLD_A" nowhere "0\\.0\\.0\\.0"
    send_ack
    send_bye
    expect 200
}
callee() {
    expect_invite Contact: "sip:gateway@$TOLD:$TOLD_B" Via: "$TOLD:$PORT_B" From: "@$TOLD:$TOLD_B" nowhere "0\\.0\\.0\\.0"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration '' 'transports = ["udp", "tcp"]'
sed -i -E "s/^listen = \"$HOST:([0-9]+)\"/listen = \"0.0.0.0:\\1\"\nadvertise = \"$TOLD:\\1\"/" "$WORK/gateway.toml"
sed -i "s/$TOLD:$PORT_A/$TOLD:$TOLD_A/; s/$TOLD:$PORT_B/$TOLD:$TOLD_B/" "$WORK/gateway.toml"
start_gateway
for transport in u1 t1; do
    start_callee callee
    expect_caller caller 4989123 -t $transport
    expect_callee
done
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
