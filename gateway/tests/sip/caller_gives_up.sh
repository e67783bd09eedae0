# The caller gives up while the callee rings: 487 for the caller, CANCEL with its Reason for the callee.
. "$(dirname "$0")/../lib.bash"

caller() {
    send_invite
    expect 100
    expect 180
    send_cancel "Reason: SIP;cause=200;text=\"Call completed elsewhere\""
    expect 200
    expect 487
    send_ack_of_failure
}
callee() {
    expect_invite
    respond "180 Ringing"
    expect_request CANCEL Reason: "Q.850;cause=26;" msg "SIP;cause=200;text=.Call completed elsewhere"
    respond_in_dialog "200 OK"
    respond_487
    expect_request ACK
}

start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_causes 1 26
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
finish
