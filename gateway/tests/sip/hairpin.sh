# A call that leaves on the interface on which it came: call control sees that both legs are of one network and asks for
# a push-back, which a SIP side does not take; the call goes on.
. "$(dirname "$0")/../lib.bash"

caller() { call_up; pause 200; send_bye; expect 200; }
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration
sed -i -e "s/peer = \"$HOST:$PORT_CALLER\"/peer = \"$HOST:$PORT_CALLEE\"/" -e '/^to = "b"/s/b/a/' "$WORK/gateway.toml"
start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_log "Internal loop detected; push-back to a"
expect_log "call 1 a \(calling side\) released: cause 16 "
expect_log "call 1 a \(called side\) released: cause 16 "
expect_trace "told a service, not taken"
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
