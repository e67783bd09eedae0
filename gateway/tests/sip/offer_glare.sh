# Offers that meet: 491, and ours again after its time; both sides of the call at once; a second offer while the first
# is not answered, 500. RFC 3261, 14.1 and 14.2; RFC 3311, 5.2.
. "$(dirname "$0")/../lib.bash"

# ours meets theirs: the gateway tries again, and so may they
caller() {
    call_up
    send_offer INVITE 2 "$(session caller 2)"
    expect_optional 100
    expect 200 body "o=callee 1 2"
    send_ack '' 2
    pause 100
    send_offer INVITE 3 "$(session caller 3)"
    expect_optional 100
    expect 200 body "o=callee 1 3"
    send_ack '' 3
    send_bye_of 4
}
send_bye_of() {
    send_text retrans "$(request_text BYE "$1" '[branch]' '[peer_tag_param]')" ''
    expect 200
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request INVITE body "o=caller 1 2"
    respond_again "491 Request Pending"
    expect_request ACK
    expect_request INVITE body "o=caller 1 2" # 2.1 to 4 s later: the Call-ID is the gateway's
    respond_again "200 OK" "$(session callee 2)"
    expect_request ACK
    expect_request INVITE body "o=caller 1 3"
    respond_again "200 OK" "$(session callee 3)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# theirs meets ours
meeting_caller() {
    call_up
    send_offer INVITE 2 "$(session caller 2)"
    expect_optional 100
    expect 200 body "o=callee 1 3"
    send_ack '' 2
    send_bye_of 3
}
meeting_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_and_keep INVITE
    request_from_callee INVITE 1 "$(session callee 2)"
    expect 491
    request_from_callee ACK-OF-FAILURE 1 ''
    request_from_callee UPDATE 2 "$(session callee 2)"
    expect 491
    answer_kept INVITE "$(session callee 3)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# impatient: a second offer before the first is answered; with an UPDATE, for a re-INVITE waits for the first one's end
impatient_caller() {
    call_up
    send_offer INVITE 2 "$(session caller 2)"
    expect 100
    pause 50
    send_offer UPDATE 3 "$(session caller 3)"
    expect 500 Retry-After: "^ *([0-9]|10) *$"
    expect 200 body "o=callee 1 2"
    send_ack '' 2
    send_bye_of 4
}
impatient_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request INVITE body "o=caller 1 2"
    pause 300
    respond_again "200 OK" "$(session callee 2)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

start_gateway
call=0
for pair in '' meeting_ impatient_; do
    start_callee "${pair}callee"
    expect_caller "${pair}caller" 4989123
    expect_callee
    expect_causes $((++call)) 16
done
stop_gateway "3 calls placed, 3 answered, 3 cleared, 0 failed"
finish
