# An INVITE that says for how long it stands: 487 after that time, and the called side is cancelled; not once it was
# answered. A peer that asks to be left alone gets no calls for as long.
. "$(dirname "$0")/../lib.bash"

impatient_caller() { send_invite "Expires: 1"; expect 100; expect 180; expect 487 Reason: "Q.850;cause=19"; send_ack_of_failure; }
ringing_callee() {
    expect_invite
    respond "180 Ringing"
    expect_request CANCEL Reason: "Q.850;cause=19"
    respond_in_dialog "200 OK"
    respond_487
    expect_request ACK
}
served_caller() { call_up "Expires: 1"; pause 1300; send_bye; expect 200; }
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
refused_caller() { send_invite; expect 100; expect 503 nowhere "Retry-After"; send_ack_of_failure; }
busy_callee() { expect_invite; respond_finally "503 Service Unavailable" "Retry-After: 1"; expect_request ACK; }
lasting_caller() { pause 1100; call_up; send_bye; expect 200; }

start_gateway
start_callee ringing_callee
expect_caller impatient_caller 4989123
expect_callee
start_callee callee
expect_caller served_caller 4989123
expect_callee
start_callee busy_callee
expect_caller refused_caller 4989123
expect_callee
expect_caller refused_caller 4989123 # without a word to the peer, which is not there any more
start_callee callee
expect_caller lasting_caller 4989123
expect_callee
stop_gateway "5 calls placed, 2 answered, 2 cleared, 3 failed"
finish
