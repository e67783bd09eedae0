# Media are to be relayed and no pair of ports is left: the call is refused with cause 47, and the next one gets the ports
# that the last one gave back.
. "$(dirname "$0")/../lib.bash"

refused() {
    send_invite
    expect 100
    expect 503 Reason: "cause=47"
    send_ack_of_failure
}
caller() {
    send_invite
    expect 100
    expect_optional 180
    expect 200 body "o=gateway .*m=audio $((PORT + 28)) |m=audio $((PORT + 30)) "
    send_ack
    pause 200
    send_bye
    expect 200
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration
cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
first-port = $((PORT + 28))
last-port = $((PORT + 29))
END
start_gateway
expect_caller refused 4989123
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
sed -i "s/^last-port.*/last-port = $((PORT + 31))/" "$WORK/gateway.toml"
start_gateway
for _ in 1 2; do
    start_callee callee
    expect_caller caller 4989123
    expect_callee
done
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
