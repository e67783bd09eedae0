# Messages that cross: the 200 is repeated, it meets our CANCEL, both sides hang up at once, a CANCEL comes too late; and
# a session description that comes late.
. "$(dirname "$0")/../lib.bash"

# the callee repeats its 200 and gets an ACK for each
repeating_caller() { call_up; pause 400; send_bye; expect 200; }
repeating_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" '' "200 OK"
    expect_request ACK
    answer_again ''
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# the answer crosses the CANCEL: it is acknowledged, and ended by a BYE that says why
crossing_caller() {
    send_invite
    expect 100
    expect 180
    send_cancel "Reason: Q.850;cause=16"
    expect 200
    expect 487
    send_ack_of_failure
}
crossing_callee() {
    expect_invite
    respond "180 Ringing"
    expect_request CANCEL
    respond_in_dialog "200 OK"
    answer_again ';tag=[pid]callee[call_number]'
    expect_request ACK
    expect_request BYE Reason: "Q.850;cause=16"
    respond_in_dialog "200 OK"
}
# both hang up: each BYE is answered
hasty_caller() {
    call_up
    pause 300
    send_bye
    expect 200
}
hasty_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_and_keep BYE # not answered until our own has gone out
    bye_from_here
    expect 200
    answer_kept BYE
}
# the CANCEL comes after the answer: it changes nothing (the stack no longer knows a request that it could cancel)
tardy_caller() {
    send_invite
    expect 100
    echo '<recv response="200"><action><ereg regexp="tag=.*" search_in="hdr" header="To:" assign_to="tag"/></action></recv>'
    references=",tag" step=$((step + 1))
    send_cancel
    expect 481 # with a tag of its own, which is not the dialog's
    send_text '' "$(request_text ACK 1 '[branch]' ';[$tag]')" ''
    pause 200
    send_text retrans "$(request_text BYE 3 '[branch]' ';[$tag]')" ''
    expect 200
}
tardy_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# an INVITE without a session description: the offer comes with the 200, the answer with the ACK
late_caller() {
    send_invite_with ''
    expect 100
    expect 200 body "o=callee"
    send_ack "$SDP_OF_CALLER"
    pause 200
    send_bye
    expect 200
}
late_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK body "o=caller"
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration '' $'t1 = 100\nt1x64 = 2000'
start_gateway
call=0
for pair in repeating crossing hasty tardy late; do
    start_callee "${pair}_callee" -nr # else SIPp takes the second ACK for a repetition, and repeats its 200 for ever
    expect_caller "${pair}_caller" 4989123
    expect_callee
    expect_causes $((++call)) 16
done
stop_gateway "5 calls placed, 4 answered, 4 cleared, 1 failed"
finish
