# Session timers, each side by itself: we refresh with UPDATE or with a re-INVITE, or the peer does; one that does not, or
# that has vanished, ends the call. 422 both ways; a limit of the length of calls. RFC 4028.
. "$(dirname "$0")/../lib.bash"

send_bye_of() {
    send_text retrans "$(request_text BYE "$1" '[branch]' '[peer_tag_param]')" ''
    expect 200
}
# the caller refreshes itself; we refresh towards a callee that knows UPDATE
caller() {
    send_invite "Supported: timer" "Session-Expires: 1" "Min-SE: 1"
    expect_optional 100
    expect 422 Min-SE: "^ *2 *$"
    send_ack_of_failure
    invite_step=$step
    send_text retrans "$(request_text INVITE 2 '[branch]' '' "Supported: timer" "Session-Expires: 2;refresher=uac")" "$SDP_OF_CALLER"
    expect 100
    expect 200 Session-Expires: "^ *2;refresher=uac" Require: "timer"
    send_ack '' 2
    pause 800
    send_offer UPDATE 3 '' "Supported: timer" "Session-Expires: 2;refresher=uac"
    expect 200 Session-Expires: "^ *2;refresher=uac"
    pause 800
    send_offer UPDATE 4 '' "Supported: timer" "Session-Expires: 2;refresher=uac"
    expect 200
    pause 800
    send_offer INVITE 5 "$(session caller 2)" "Supported: timer" "Session-Expires: 2;refresher=uac"
    expect_optional 100
    expect 200 body "o=callee 1 2" Session-Expires: "^ *2;refresher=uac"
    send_ack '' 5
    send_bye_of 6
}
callee() {
    expect_invite Session-Expires: "^ *2" Supported: "timer"
    respond_with '' '' "422 Session Interval Too Small" "Min-SE: 4"
    expect_request ACK
    expect_invite Session-Expires: "^ *4 *$"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK" "Session-Expires: 4;refresher=uac" "Require: timer" "Allow: INVITE, ACK, BYE, UPDATE"
    expect_request ACK
    expect_request UPDATE Session-Expires: "^ *4;refresher=uac" nowhere "application/sdp"
    send_text '' "$(response_text "200 OK" "Session-Expires: 4;refresher=uac")" ''
    expect_request INVITE body "o=caller 1 2"
    respond_again "200 OK" "$(session callee 2)" "Session-Expires: 4;refresher=uac"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# neither knows timers: we refresh both, with re-INVITEs that change nothing; then the callee has vanished
plain_caller() {
    call_up
    expect_request INVITE body "o=callee 1 1"
    respond_again "200 OK" "$(session caller 1)"
    expect_request ACK
    expect_request BYE Reason: "cause=102"
    respond_in_dialog "200 OK"
}
vanishing_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK" "Session-Expires: 3;refresher=uac"
    expect_request ACK
    expect_request INVITE body "o=caller 1 1"
    respond_again "481 Call/Transaction Does Not Exist"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "481 Call/Transaction Does Not Exist"
}
# the peer is to refresh, and does not
idle_caller() {
    send_invite "Supported: timer" "Session-Expires: 2;refresher=uac"
    expect 100
    expect 200 Session-Expires: "^ *2;refresher=uac"
    send_ack
    expect_request BYE Reason: "cause=102"
    respond_in_dialog "200 OK"
}
refreshed_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK" "Session-Expires: 600;refresher=uac"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
long_caller() {
    send_invite "Supported: timer" "Session-Expires: 600;refresher=uac"
    expect 100
    expect 200
    send_ack
    expect_request BYE Reason: "cause=31"
    respond_in_dialog "200 OK"
}

write_configuration '' $'session-expires = 2\nmin-se = 2\nmax-call-duration = 4'
start_gateway
call=0
try() { # CALLER CALLEE CAUSE
    start_callee "$2"
    expect_caller "$1" 4989123
    expect_callee
    expect_log "call [0-9]+ a \(calling side\) released: cause $3 " "${4:-1}"
}
try caller callee 16
try plain_caller vanishing_callee 102
try idle_caller refreshed_callee 102 2
write_configuration '' $'session-expires = 600\nmax-call-duration = 1'
stop_gateway "4 calls placed, 3 answered, 3 cleared, 1 failed"
start_gateway
try long_caller refreshed_callee 31
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
