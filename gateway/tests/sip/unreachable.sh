# Nobody listens where the call is to go, the caller never acknowledges the answer, the callee never ends the INVITE
# that was cancelled: no call is left.
. "$(dirname "$0")/../lib.bash"

caller() { send_invite; expect 100; expect 503 Reason: "Q.850;cause=27"; send_ack_of_failure; }
# takes the 200 and every repetition of it
dumb_caller() {
    send_invite
    expect 100
    expect 200
    expect_request BYE Reason: "Q.850;cause=102"
    respond_in_dialog "200 OK"
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE Reason: "Q.850;cause=102"
    respond_in_dialog "200 OK"
}
impatient_caller() {
    send_invite
    expect 100
    expect 180
    send_cancel
    expect 200
    expect 487
    send_ack_of_failure
}
stubborn_callee() {
    expect_invite
    respond "180 Ringing"
    expect_request CANCEL
    respond_in_dialog "200 OK"
}
unsendable_caller() { send_invite; expect 100; expect 503 Reason: "Q.850;cause="; send_ack_of_failure; }

write_configuration '' $'t1 = 50\nt1x64 = 1000'
start_gateway
expect_caller caller 4989123
expect_causes 1 27
start_callee callee
expect_caller dumb_caller 4989123 -default_behaviors all,-abortunexp
expect_callee
expect_causes 2 102
start_callee stubborn_callee
expect_caller impatient_caller 4989123
expect_callee
expect_causes 3 16
stop_gateway "3 calls placed, 1 answered, 1 cleared, 2 failed"

# no way leads from the interface's address to the peer's
write_configuration '' $'t1 = 50\nt1x64 = 1000'
sed -i "s/peer = \"$HOST:$PORT_CALLEE\"/peer = \"192.0.2.1:$PORT_CALLEE\"/" "$WORK/gateway.toml"
start_gateway
expect_caller unsendable_caller 4989123
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
finish
