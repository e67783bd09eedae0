# Media are relayed, and neither side says anything for as long as is allowed: the call ends with cause 41 and a line that
# says why.
. "$(dirname "$0")/../lib.bash"

caller() {
    send_invite
    expect 100
    expect_optional 180
    expect 200
    send_ack
    expect_request BYE Reason: "cause=41"
    respond_in_dialog "200 OK"
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE Reason: "cause=41"
    respond_in_dialog "200 OK"
}

write_configuration
cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
silence = 1
first-port = $((PORT + 28))
last-port = $((PORT + 31))
END
start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_log 'nothing was heard for 1 s'
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
