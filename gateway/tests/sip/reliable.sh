# Reliable provisional responses, on each side by itself: a caller that understands them, insists on them, or does not; a
# callee that sends them, in order and repeated, or not. A session settled so may be changed with UPDATE before the call
# is up. RFC 3262, RFC 3311.
. "$(dirname "$0")/../lib.bash"

send_prack() { # SEQUENCE: of what was received last
    send_text retrans "$(request_text PRACK "$1" '[branch]' '[peer_tag_param]' "RAck: [\$rseq] 1 INVITE")" "${2:-}"
    expect "${3:-200}"
}
expect_reliable() { # STATUS [PART REGEXP]...
    echo "<recv response=\"$1\"><action><ereg regexp=\"[0-9]+\" search_in=\"hdr\" header=\"RSeq:\" check_it=\"true\" assign_to=\"rseq\"/></action></recv>"
    references+=",rseq"
    step=$((step + 1))
}
end_of_caller() {
    send_ack
    pause 100
    send_text retrans "$(request_text BYE 9 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
end_of_callee() {
    respond_with "$1" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
answer_invite() { # STATUS-AND-PHRASE BODY [HEADER]...: whatever was received last
    send_text '' "SIP/2.0 $1
Via:[\$path]
From:[\$caller]
To: <sip:4989123@[local_ip]:[local_port]>;tag=[pid]callee[call_number]
[last_Call-ID:]
CSeq: [\$sequence] INVITE
Contact: <sip:callee@[local_ip]:[local_port]>$(printf '\n%s' "${@:3}")" "$2"
}
reliably() { # RSEQ STATUS-AND-PHRASE BODY
    answer_invite "$2" "$3" "Require: 100rel" "RSeq: $1" "Allow: INVITE, ACK, BYE, PRACK, UPDATE"
}

# both do
caller() {
    send_invite "Supported: 100rel" "Allow: INVITE, ACK, BYE, PRACK, UPDATE"
    expect 100
    expect_reliable 183
    send_prack 2
    expect 180 nowhere "Require: *100rel"
    send_offer UPDATE 3 "$(session caller 2 sendonly)"
    expect 200 body "o=callee 1 2"
    expect_request UPDATE body "o=callee 1 3"
    respond_once "200 OK" "$(session caller 3)"
    expect 200 nowhere "application/sdp"
    end_of_caller
}
callee() {
    expect_invite Supported: "100rel" Allow: "PRACK"
    reliably 7 "183 Session Progress" "$(session callee 1)"
    expect_request PRACK RAck: "^ *7 [0-9]+ INVITE"
    respond_in_dialog "200 OK"
    reliably 9 "180 Ringing" '' # too early: passed over
    pause 30
    reliably 7 "183 Session Progress" "$(session callee 1)" # repeated
    pause 30
    reliably 8 "180 Ringing" ''
    expect_request PRACK RAck: "^ *8 [0-9]+ INVITE"
    respond_in_dialog "200 OK"
    expect_request UPDATE body "o=caller 1 2.*a=sendonly"
    respond_once "200 OK" "$(session callee 2)"
    pause 50
    request_from_callee UPDATE 1 "$(session callee 3)"
    expect 200 body "o=caller 1 3"
    answer_invite "200 OK" "$SDP_OF_CALLEE"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# only the caller does, and it insists; what is no binding answer is left out
insisting_caller() {
    send_invite "Require: 100rel"
    expect 100
    expect_reliable 180
    send_prack 2
    expect 200 body "o=callee"
    end_of_caller
}
plain_callee() {
    expect_invite
    respond "180 Ringing"
    pause 100
    end_of_callee "$SDP_OF_CALLEE"
}
# only the callee does
plain_caller() {
    send_invite
    expect 100
    expect 183 body "o=callee" nowhere "Require: *100rel"
    expect 200 body "o=callee"
    end_of_caller
}
reliable_callee() {
    expect_invite
    reliably 1 "183 Session Progress" "$SDP_OF_CALLEE"
    expect_request PRACK RAck: "^ *1 [0-9]+ INVITE"
    respond_in_dialog "200 OK"
    pause 50
    answer_invite "200 OK" ''
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# a response without its PRACK ends the call
silent_caller() {
    send_invite "Require: 100rel"
    expect 100
    expect_reliable 180
    expect 504
    send_ack_of_failure
}
ringing_callee() {
    expect_invite
    respond "180 Ringing"
    expect_request CANCEL
    respond_in_dialog "200 OK"
    respond_487
    expect_request ACK
}

write_configuration '' $'t1 = 20\nt1x64 = 600'
start_gateway
call=0
try() { # CALLER CALLEE CAUSE
    start_callee "$2"
    expect_caller "$1" 4989123
    expect_callee
    expect_causes $((++call)) "$3"
}
try caller callee 16
try insisting_caller plain_callee 16
try plain_caller reliable_callee 16
try silent_caller ringing_callee 102
stop_gateway "4 calls placed, 3 answered, 3 cleared, 1 failed"
finish
