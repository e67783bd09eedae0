# A peer that vanishes in whatever state of a call, as one whose process was killed: the other peer is told, the call ends,
# and nothing is left of it.
. "$(dirname "$0")/../lib.bash"

# --- the callee vanishes, after... ------------------------------------------------------------------------------------
callee_invited() { expect_invite; }
callee_trying() {
    expect_invite
    respond "100 Trying"
}
callee_ringing() {
    expect_invite
    respond "180 Ringing"
}
callee_answered() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
}
callee_holding() {
    callee_answered
    request_from_callee INVITE 1 "$(session callee 2 sendonly)"
    expect_optional 100
    expect 200
    request_from_callee ACK 1 ''
}
callee_offering() { # the caller's answer reaches nobody
    callee_answered
    send_text '' "INVITE sip:gateway@[remote_ip]:[remote_port] SIP/2.0
Via: SIP/2.0/[transport] [local_ip]:[local_port];branch=[branch]
From: <sip:callee@[local_ip]:[local_port]>;tag=[pid]callee[call_number]
To:[\$caller]
[last_Call-ID:]
CSeq: 1 INVITE
Contact: <sip:callee@[local_ip]:[local_port]>
Max-Forwards: 70" "$(session callee 2 sendonly)"
}
callee_offered() { # what the caller wants to change reaches somebody who does not answer any more
    callee_answered
    expect_request INVITE
}
callee_asked_to_end() {
    callee_answered
    expect_request BYE
}
# the caller sees the end of a call that was not up
caller_refused() {
    send_invite
    expect 100
    expect_optional 180
    expect "$FINAL"
    send_ack_of_failure
}
caller_cleared() {
    call_up
    expect_request BYE
    respond_in_dialog "200 OK"
}
caller_put_on_hold() {
    call_up
    expect_request INVITE body "a=sendonly"
    respond_again "200 OK" "$(session caller 2 recvonly)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
caller_offering() {
    call_up
    send_offer INVITE 2 "$(session caller 2 sendonly)"
    expect_optional 100
    expect "$FINAL"
    send_ack_of_failure 2
    expect_request BYE
    respond_in_dialog "200 OK"
}
caller_ending() {
    call_up
    pause 200
    send_bye
    expect 200
}

# --- the caller vanishes, after... ------------------------------------------------------------------------------------
caller_calling() {
    send_invite
    expect 100
}
caller_hearing_it_ring() {
    caller_calling
    expect 180
}
caller_unacknowledged() { # it was answered, and did not say that it knows
    send_invite
    expect 100
    expect 200
}
caller_connected() { call_up; }
caller_holding() {
    call_up
    send_offer INVITE 2 "$(session caller 2 sendonly)"
    expect_optional 100
    expect 200
    send_ack '' 2
}
callee_cancelled() {
    expect_invite
    respond "180 Ringing"
    expect_request CANCEL
    respond_in_dialog "200 OK"
    respond_487
    expect_request ACK
}
callee_slow() { # rings until somebody gives up
    expect_invite
    respond "180 Ringing"
    pause 1000
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
callee_cleared() {
    callee_answered
    expect_request BYE
    respond_in_dialog "200 OK"
}
callee_put_on_hold() {
    callee_answered
    expect_request INVITE body "a=sendonly"
    respond_again "200 OK" "$(session callee 2 recvonly)"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

# vanishes CALLER CALLEE IS-ANSWERED [FINAL]: both do their part, and within seconds the call is over
vanishes() {
    FINAL=${4:-200}
    start_callee "$2"
    expect_caller "$1" 4989123
    expect_callee
    expect_no_calls 6
    calls=$((calls + 1)) answered=$((answered + $3))
}
# begin INTERFACE: on which a session is to be refreshed, so that it is seen when the peer has gone
begin() {
    write_configuration '' $'t1 = 25\nanswer-timeout = 2\nsession-expires = 0'
    sed -i "/^name = \"$1\"/,/^session-expires/s/^session-expires.*/session-expires = 2\nmin-se = 1/" "$WORK/gateway.toml"
    start_gateway
    calls=0 answered=0
}
end() { stop_gateway "$calls calls placed, $answered answered, $answered cleared, $((calls - answered)) failed"; }

begin b
vanishes caller_refused callee_invited 0 503
vanishes caller_refused callee_trying 0 408
vanishes caller_refused callee_ringing 0 480
vanishes caller_cleared callee_answered 1
vanishes caller_put_on_hold callee_holding 1
vanishes caller_put_on_hold callee_offering 1
vanishes caller_offering callee_offered 1 500
vanishes caller_ending callee_asked_to_end 1
end

begin a
vanishes caller_calling callee_slow 1
vanishes caller_hearing_it_ring callee_slow 1
vanishes caller_unacknowledged callee_cleared 1
vanishes caller_connected callee_cleared 1
vanishes caller_holding callee_put_on_hold 1
end
finish
