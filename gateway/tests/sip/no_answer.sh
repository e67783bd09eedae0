# A peer that says nothing at all: 408 and cause 18 after the transaction's time. One that rings for ever: CANCEL with
# cause 19, and 480 for the caller.
. "$(dirname "$0")/../lib.bash"

silent_caller() { send_invite; expect 100; expect 408 Reason: "Q.850;cause=18"; send_ack_of_failure; }
patient_caller() { send_invite; expect 100; expect 180; expect 480 Reason: "Q.850;cause=19"; send_ack_of_failure; }
ringing_callee() {
    expect_invite
    respond "180 Ringing"
    expect_request CANCEL Reason: "Q.850;cause=19"
    respond_in_dialog "200 OK"
    respond_487
    expect_request ACK
}
# takes the INVITE and every repetition of it, and keeps silent
silent_callee() { expect_invite; pause 4000; }

write_configuration '' $'t1 = 50\nt1x64 = 1500\nanswer-timeout = 2'
start_gateway
start_callee silent_callee
expect_caller silent_caller 4989123
kill $callee_pid
wait $callee_pid
callee_pid=0
expect_causes 1 18
start_callee ringing_callee
expect_caller patient_caller 4989123
expect_callee
expect_causes 2 19
expect_log 'call 2 . .* cause 19 \(no-answer-from-user\), SIP 480' 2
stop_gateway "2 calls placed, 0 answered, 0 cleared, 2 failed"
finish
