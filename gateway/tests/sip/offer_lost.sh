# An offer that meets a peer without the dialog (481), or without an answer at all, ends the call on both sides; so does
# an answer to a re-INVITE without its ACK. One that is taken back with CANCEL leaves the call as it was. RFC 3261,
# 12.2.1.2, 13.3.1.4, 14.2.
. "$(dirname "$0")/../lib.bash"

caller() {
    call_up
    send_offer INVITE 2 "$(session caller 2)"
    expect_optional 100
    expect $REFUSAL
    send_ack_of_failure 2
    expect_request BYE
    respond_in_dialog "200 OK"
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request INVITE
    respond_again "481 Call/Transaction Does Not Exist"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "481 Call/Transaction Does Not Exist"
}
silent_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request INVITE
    local i
    for ((i = 0; i < 8; i++)); do
        echo '<recv request="INVITE" optional="true"/>' # repeated
        step=$((step + 1))
    done
    expect_request BYE
    respond_in_dialog "200 OK"
}
deaf_caller() { # gives no ACK
    call_up
    send_offer INVITE 2 "$(session caller 2)"
    expect_optional 100
    expect 200
    expect_request BYE
    respond_in_dialog "200 OK"
}
answering_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request INVITE
    respond_again "200 OK" "$(session callee 2)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
hasty_caller() {
    call_up
    send_offer INVITE 2 "$(session caller 2)"
    expect 100
    pause 50
    send_text retrans "$(request_text CANCEL 2 "[branch-$((step - invite_step))]" '[peer_tag_param]')" ''
    expect 200
    expect 487
    send_ack_of_failure 2
    # the other side has agreed to what is taken back: the two settle anew
    expect_request INVITE nowhere "application/sdp"
    respond_again "200 OK" "$(session caller 3)"
    expect_request ACK body "o=callee 1 3"
    pause 100
    send_text retrans "$(request_text BYE 3 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
slow_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request INVITE
    respond_once "100 Trying"
    pause 300
    respond_again "200 OK" "$(session callee 2)"
    expect_request ACK
    expect_request INVITE body "o=caller 1 3"
    respond_again "200 OK" "$(session callee 3)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration '' $'t1 = 50\nt1x64 = 1000'
start_gateway
call=0
try() { # CALLER CALLEE CAUSE
    start_callee "$2" -nr
    expect_caller "$1" 4989123 -nr
    expect_callee
    expect_causes $((++call)) "$3"
}
REFUSAL=487 try caller callee 21
REFUSAL=487 try caller silent_callee 102
try deaf_caller answering_callee 102
try hasty_caller slow_callee 16
stop_gateway "4 calls placed, 4 answered, 4 cleared, 0 failed"
finish
