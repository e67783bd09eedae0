# A proxy of the called side asks several parties. Each is a dialog of its own for the caller, with its own tag and
# session; the first 200 wins, any other gets its ACK and a BYE. RFC 3261, 12.1, 13.2.2.4.
. "$(dirname "$0")/../lib.bash"

caller() {
    send_invite
    expect 100
    expect 183 body "o=first"
    expect 180 body "o=first"
    expect 183 body "o=second"
    expect 200 body "o=second"
    send_ack
    pause 300
    send_bye
    expect 200
}
# respond_as TAG STATUS-AND-PHRASE BODY: the INVITE may lie some messages back
respond_as() {
    send_text '' "SIP/2.0 $2
Via:[\$path]
From:[\$caller]
To: <sip:4989123@[local_ip]:[local_port]>;tag=$1
[last_Call-ID:]
CSeq: [\$sequence] INVITE
Contact: <sip:$1@[local_ip]:[local_port]>" "$3"
}
parties() {
    expect_invite
    respond_as one "183 Session Progress" "$(session first 1)"
    pause 50
    respond_as one "180 Ringing" ''
    pause 50
    respond_as two "183 Session Progress" "$(session second 1)"
    pause 50
    respond_as two "200 OK" "$(session second 1)"
    expect_request ACK To: "tag=two"
    respond_as one "200 OK" "$(session first 1)"
    expect_request ACK To: "tag=one"
    expect_request BYE To: "tag=one"
    respond_in_dialog "200 OK"
    respond_as two "200 OK" "$(session second 1)"
    expect_request ACK To: "tag=two"
    expect_request BYE To: "tag=two"
    respond_in_dialog "200 OK"
}

start_gateway
start_callee parties -nr
expect_caller caller 4989123 -trace_msg -message_file "$WORK/caller.msg"
expect_callee
expect_causes 1 16
# tags STATUS: those with which the caller was answered so
tags() {
    awk -v status="$1" '/^SIP\/2.0/ { now = $2 } /^To:/ && now == status { sub(/.*tag=/, ""); print $1 }' "$WORK/caller.msg" | sort -u
}
[[ $(tags 183 | wc -l) == 2 ]] || fail "two parties, and not two dialogs: $(tags 183)"
[[ $(tags 183 | grep -cFx "$(tags 180)") == 1 && $(tags 180) != "$(head -1 <<<"$(awk '/^SIP\/2.0 200/ { now = 1 } /^To:/ && now { sub(/.*tag=/, ""); print $1; exit }' "$WORK/caller.msg")")" ]] ||
    fail "who rings is who answers"
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
