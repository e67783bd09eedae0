# Requests that belong to no call: OPTIONS 200, REGISTER 405, an unknown method 501, BYE and CANCEL without a dialog
# 481; INVITEs that cannot be served: 483, 400, 420, 415. Then a good call.
. "$(dirname "$0")/../lib.bash"

options() { send_request OPTIONS; expect 200 Allow: "INVITE"; }
register() { send_request REGISTER; expect 405 Allow: "INVITE"; }
unknown() { send_request JUMP; expect 501 Allow: "INVITE"; }
bye() {
    send_text retrans "$(request_text BYE 1 '[branch]' ';tag=nobody')" ''
    expect 481
}
cancel() { send_request CANCEL; expect 481; }
invite_of_nobody() {
    send_text retrans "$(request_text INVITE 1 '[branch]' ';tag=nobody')" "$SDP_OF_CALLER"
    expect 481
    send_ack_of_failure
}
too_many_hops() { send_invite "Max-Forwards: 0"; expect 483; send_ack_of_failure; }
without_contact() {
    send_text retrans "$(request_text INVITE 1 '[branch]' '' | grep -v '^Contact')" "$SDP_OF_CALLER"
    expect 400
    send_ack_of_failure
}
extension() { send_invite "Require: precondition"; expect 420 Unsupported: "precondition"; send_ack_of_failure; }
other_body() { send_invite_with "hello" "Content-Type: text/plain"; expect 415 Accept: "application/sdp"; send_ack_of_failure; }
good_caller() { call_up; send_bye; expect 200; }
good_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

start_gateway
for scenario in options register unknown bye cancel invite_of_nobody too_many_hops without_contact extension other_body; do
    expect_caller "$scenario" 4989123
done
start_callee good_callee
expect_caller good_caller 4989123
expect_callee
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
