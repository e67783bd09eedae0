# The callee hangs up: its Reason reaches the caller.
. "$(dirname "$0")/../lib.bash"

caller() {
    call_up
    expect_request BYE Reason: "Q.850;cause=47;" msg "SIP;cause=503;text=.Overload"
    respond_in_dialog "200 OK"
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    pause 100
    bye_from_here "Reason: SIP;cause=503;text=\"Overload\"" "Reason: Q.850;cause=47"
    expect 200
}

start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_causes 1 47
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
