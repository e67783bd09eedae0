# A call is answered and the caller hangs up: both session descriptions cross, numbers and name too, and so does the
# cause of the BYE.
. "$(dirname "$0")/../lib.bash"

caller() {
    send_invite
    expect 100
    expect 180 Contact: "sip:gateway"
    expect 200 body "o=callee" Content-Type: "application/sdp"
    send_ack
    pause 200
    send_bye "Reason: Q.850;cause=31;text=\"Normal, \\\"unspecified\\\"\""
    expect 200
}
callee() {
    expect_invite body "o=caller" From: "Alice .*4420@" To: "4989123" Max-Forwards: "69"
    respond "180 Ringing"
    pause 100 # the caller's module is told once per turn: both in one would be a 200 alone
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE Reason: "Q.850;cause=31;"
    respond_in_dialog "200 OK"
}

start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_causes 1 31
expect_log 'cause 31 \(normal-unspecified\), SIP 0, "Normal, "unspecified""' 2
expect_trace "told peer State=ALERTING"
expect_trace "told peer Provides Data=true"
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
