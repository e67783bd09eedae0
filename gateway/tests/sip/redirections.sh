# A callee who sends the call elsewhere (302) is obeyed by the routes of his interface, told on to the caller, or not taken
# at his word; a loop of such answers ends the call. The new callee hears who redirected it, and why.
. "$(dirname "$0")/../lib.bash"

moved() { # HEADER...
    send_text retrans "SIP/2.0 302 Moved Temporarily
[last_Via:]
[last_From:]
[last_To:];tag=[pid]callee[call_number]
[last_Call-ID:]
[last_CSeq:]
$(printf '%s\n' "$@")" ''
}
moving_callee() { expect_invite msg 'INVITE sip:4989123@'; moved 'Contact: <sip:4711@elsewhere;cause=486>'; expect_request ACK; }
rung_callee() {
    expect_invite msg 'INVITE sip:4989123@'
    respond "180 Ringing"
    pause 100
    moved 'Contact: <sip:nobody@h>;q=0.1, <sip:4711@elsewhere>' 'Privacy: id'
    expect_request ACK
}
new_callee() {
    expect_invite msg 'INVITE sip:4711@' body 'callee|caller|audio' \
        Diversion: 'sip:4989123@.*;reason=user-busy;counter=1;privacy=off;screen=no$' \
        History-Info: 'sip:4989123@.*;index=1, *.sip:4711@.*;cause=486.;index=1.1$'
    respond "180 Ringing"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
new_callee_of_rung() {
    expect_invite msg 'INVITE sip:4711@' Diversion: 'sip:4989123@.*;reason=deflection;counter=1;privacy=full'
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
caller() { call_up; pause 100; send_bye; expect 200; }
looped() { send_invite; expect 100; expect 483 Reason: 'Q.850;cause=25'; send_ack_of_failure; }
refused() { send_invite; expect 100; expect 410 Reason: 'Q.850;cause=23'; send_ack_of_failure; }
told() {
    send_invite
    expect 100
    expect 302 Contact: "^ *.sip:4711@$HOST:$PORT_A;cause=486.$" Diversion: 'sip:4989123@.*;reason=user-busy' \
        History-Info: 'sip:4711@.*cause=486' nowhere elsewhere
    send_ack_of_failure
}
to_a_loop() { expect_invite; moved 'Contact: <sip:4989124@h>'; expect_request ACK; }
and_back() { expect_invite msg 'INVITE sip:4989124@'; moved 'Contact: <sip:4989123@h>'; expect_request ACK; }

configure() { # REDIRECTIONS
    write_configuration '' '' 49
    sed -i "/^name = \"b\"/a redirections = \"$1\"" "$WORK/gateway.toml"
    cat >>"$WORK/gateway.toml" <<END
[[sip]]
name = "c"
listen = "$HOST:$((PORT + 6))"
peer = "$HOST:$((PORT + 7))"

[[route]]
from = "b"
prefix = "47"
to = "c"

[[route]]
from = "b"
number = "4989124"
to = "c"

[[route]]
from = "c"
number = "4989123"
to = "b"
END
}
on_c() { PORT_CALLEE=$((PORT + 7)) PORT_B=$((PORT + 6)) PORT=$((PORT + 14)) "$@"; }

configure follow
sed -i '/^name = "c"/a redirections = "follow"' "$WORK/gateway.toml"
relay_media
start_gateway
on_c start_callee new_callee
new=$callee_pid
background+=($new)
start_callee moving_callee
expect_caller caller 4989123
expect_callee
wait $new || fail "the new callee: exit status $?"
on_c start_callee new_callee_of_rung
new=$callee_pid
background+=($new)
start_callee rung_callee
expect_caller caller 4989123
expect_callee
wait $new || fail "the new callee of who had rung: exit status $?"
on_c start_callee and_back
new=$callee_pid
background+=($new)
start_callee to_a_loop
expect_caller looped 4989123
expect_callee
wait $new || fail "the other end of the loop: exit status $?"
expect_log 'call 3 a is redirected in a loop'
stop_gateway "3 calls placed, 2 answered, 2 cleared, 1 failed"

configure hand-on
start_gateway
start_callee moving_callee
expect_caller told 4989123
expect_callee
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"

configure refuse
start_gateway
start_callee moving_callee
expect_caller refused 4989123
expect_callee
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
finish
