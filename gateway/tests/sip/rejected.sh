# The callee rejects: its status reaches the caller, with the cause of its Reason header or that of the status.
. "$(dirname "$0")/../lib.bash"

busy_caller() { send_invite; expect 100; expect 486 Reason: "Q.850;cause=17"; send_ack_of_failure; }
busy_callee() { expect_invite; respond_finally "486 Busy Here"; expect_request ACK; }
declining_caller() { send_invite; expect 100; expect_optional 180; expect 603 Reason: "Q.850;cause=20"; send_ack_of_failure; }
declining_callee() {
    expect_invite
    respond "180 Ringing"
    respond_finally "603 Decline" "Reason: SIP;cause=486, q.850 ; cause=20 ; text=\"gone, \\\"really\\\"\""
    expect_request ACK
}
challenged_caller() { send_invite; expect 100; expect 403 Reason: "Q.850;cause=21"; send_ack_of_failure; }
challenging_callee() {
    expect_invite
    respond_finally "407 Proxy Authentication Required" "Proxy-Authenticate: Digest realm=\"r\", nonce=\"n\""
    expect_request ACK
}
unknown_caller() { send_invite; expect 100; expect 404 Reason: "Q.850;cause=1;"; send_ack_of_failure; }
unknowing_callee() { expect_invite; respond_finally "404 Not Found"; expect_request ACK; }
moved_caller() { send_invite; expect 100; expect 410 Reason: "Q.850;cause=23;"; send_ack_of_failure; }
moving_callee() { expect_invite; respond_finally "302 Moved Temporarily"; expect_request ACK; }

start_gateway
call=0
for pair in busy_caller:busy_callee:17 declining_caller:declining_callee:20 challenged_caller:challenging_callee:21 \
    unknown_caller:unknowing_callee:1 moved_caller:moving_callee:23; do
    IFS=: read -r caller callee cause <<<"$pair"
    start_callee "$callee"
    expect_caller "$caller" 4989123
    expect_callee
    expect_causes $((++call)) "$cause"
done
expect_log 'call 2 . .* cause 20 \(subscriber-absent\), SIP 603, "gone, "really""' 2
stop_gateway "5 calls placed, 0 answered, 0 cleared, 5 failed"
finish
