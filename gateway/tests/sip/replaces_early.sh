# Call pick-up: an INVITE takes the place of a dialog that is not up yet (RFC 3891). Where media are relayed who rings gets CANCEL, and the
# newcomer talks to the caller; where they are not it gets 488, and the call goes on. A dialog of a caller gets 481, one that is over 603.
. "$(dirname "$0")/../lib.bash"
. "$HERE/target.bash"

callee_begins() {
    expect_invite
    # the newcomer is told of the dialog by files
    echo "<nop><action><ereg regexp=\".*\" search_in=\"var\" variable=\"caller\" assign_to=\"from\"/>"
    echo "<exec command=\"echo '[call_id]' > $WORK/call-id; echo '[\$caller]' > $WORK/from\"/></action></nop>"
    references+=",from"
    step=$((step + 1))
    respond "180 Ringing"
}
picked_callee() {
    callee_begins
    expect_request CANCEL Reason: "cause=16"
    respond_in_dialog "200 OK"
    respond_487
    expect_request ACK
}
picked_caller() {
    send_invite
    expect 100
    expect 180
    expect 200 body "o=gateway"
    send_ack
    expect_request BYE
    respond_in_dialog "200 OK"
}
slow_callee() {
    callee_begins
    pause 1500
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    pause 1500
    respond_in_dialog "200 OK"
}
slow_caller() { call_up; pause 100; send_bye; expect 200; }
# the tags as the gateway sees them: ours is from-tag, its own is to-tag
refused() { # STATUS
    send_invite_with "$(session newcomer 1)" "Replaces: $REPLACED" "Require: replaces"
    expect_optional 100
    expect "$STATUS"
    send_ack_of_failure
}
picking() {
    send_invite_with "$(session newcomer 1)" "Replaces: $REPLACED;early-only"
    expect 100
    expect 200 body "o=gateway"
    send_ack
    pause 200
    send_bye
    expect 200
}
newcomer() { # SCENARIO
    write_scenario "$WORK/$1.xml" "$1"
    sipp "$HOST:$PORT_C" -sf "$WORK/$1.xml" -s 4989123 -i "$HOST" -bind_local -p "$PORT_TARGET" -cp $((PORT + 8)) \
        -mp $((PORT + 26)) -nostdin -m 1 -timeout "${SIPP_TIMEOUT:-20s}" -timeout_error -trace_err -error_file "$WORK/newcomer.log" \
        >"$WORK/newcomer.out" 2>&1 || fail "newcomer $1: exit status $?"
}
await() { # WHOSE REGEXP: in that side's messages
    local i
    for ((i = 0; i < 200; i++)); do
        grep -qE "$2" "$WORK/$1.msg" 2>/dev/null && return
        sleep 0.05
    done
    fail "nothing like $2 at the $1"
}
tag_of() { tr -d '\r' <"$WORK/$1.msg" | sed -nE "s/^$2:.*tag=(.*)/\1/p" | head -1; } # WHOSE HEADER
begin() { # CALLER CALLEE
    rm -f "$WORK"/*.msg
    start_gateway
    start_callee "$2" -trace_msg -message_file "$WORK/callee.msg"
    (expect_caller "$1" 4989123 -trace_msg -message_file "$WORK/caller.msg") &
    caller_pid=$!
    await callee '^SIP/2.0 180'
    await caller '^SIP/2.0 180'
    of_callee="$(<"$WORK/call-id");to-tag=$(sed 's/.*tag=//' "$WORK/from");from-tag=$(tag_of callee To)"
}
end() {
    wait $caller_pid || fail "the caller"
    expect_callee
}

add_target
cp "$WORK/gateway.toml" "$WORK/direct.toml"
RELAYED="o=gateway"
relay_media
begin picked_caller picked_callee
STATUS=481
REPLACED="$(tr -d '\r' <"$WORK/caller.msg" | sed -n 's/^Call-ID: //p' | head -1);to-tag=$(tr -d '\r' <"$WORK/caller.msg" |
    sed -nE '/^SIP\/2.0 180/,$ s/^To:.*tag=(.*)/\1/p' | head -1);from-tag=$(tag_of caller From)"
newcomer refused # a dialog that the caller has begun
REPLACED=$of_callee
newcomer picking
end
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"

cp "$WORK/direct.toml" "$WORK/gateway.toml"
RELAYED=
begin slow_caller slow_callee
STATUS=488
REPLACED=$of_callee
newcomer refused
await callee '^BYE'
STATUS=603
newcomer refused
end
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
