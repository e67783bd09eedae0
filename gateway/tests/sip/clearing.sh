# SIGTERM, and a call that goes on for longer than it may: both sides get a BYE with the cause. One that rings is
# answered finally and cancelled. A second SIGTERM does not wait.
. "$(dirname "$0")/../lib.bash"

endless_caller() {
    call_up
    expect_request BYE Reason: "Q.850;cause=41"
    respond_in_dialog "200 OK"
}
endless_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE Reason: "Q.850;cause=41"
    respond_in_dialog "200 OK"
}
ringing_caller() { send_invite; expect 100; expect 180; expect 503 Reason: "Q.850;cause=41"; send_ack_of_failure; }
ringing_callee() {
    expect_invite
    respond "180 Ringing"
    expect_request CANCEL Reason: "Q.850;cause=41"
    respond_in_dialog "200 OK"
    respond_487
    expect_request ACK
}

# end_while CALLER CALLEE COUNTERS [SIGNALS]
end_while() {
    start_gateway
    start_callee "$2"
    (
        for ((i = 0; i < 100; i++)); do
            grep -q "Accept call" "$WORK/gateway.err" && break
            sleep 0.05
        done
        sleep 0.3
        for ((i = 0; i < ${4:-1}; i++)); do
            kill -TERM $gateway_pid
            sleep 0.1
        done
    ) &
    expect_caller "$1" 4989123
    expect_callee
    expect_causes 1 41
    expect_end "$3"
}

write_configuration "clear-after = 1"
end_while endless_caller endless_callee "1 calls placed, 1 answered, 1 cleared, 0 failed"
end_while ringing_caller ringing_callee "1 calls placed, 0 answered, 0 cleared, 1 failed"
# a second request does not wait
write_configuration "clear-after = 600"
end_while endless_caller endless_callee "1 calls placed, 1 answered, 1 cleared, 0 failed" 2
finish
