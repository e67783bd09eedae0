# An INVITE that takes the place of another dialog (RFC 3891): the one of the callee, while the call is up. The caller is
# offered the newcomer's session, the callee hung up on. What is not there gets 481, what must be early 486.
. "$(dirname "$0")/../lib.bash"
. "$HERE/target.bash"

caller() {
    call_up
    if [[ -z ${RELAYED:-} ]]; then
        expect_request INVITE body "o=newcomer"
        respond_again "200 OK" "$(session caller 2)"
        expect_request ACK
    fi
    expect_request BYE
    respond_in_dialog "200 OK"
}
callee() {
    expect_invite
    # the newcomer is told of the dialog by a file
    echo "<nop><action><ereg regexp=\".*\" search_in=\"var\" variable=\"caller\" assign_to=\"from\"/>"
    echo "<exec command=\"echo '[call_id]' > $WORK/call-id; echo '[\$caller]' > $WORK/from\"/></action></nop>"
    references+=",from"
    step=$((step + 1))
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# the tags as the gateway sees them: ours is the callee's, from-tag; its own is to-tag
newcomer() {
    local dialog tag
    dialog=$(<"$WORK/call-id")
    tag=$(sed 's/.*tag=//' "$WORK/from")
    send_invite_with "$(session newcomer 1)" "Replaces: unknown;to-tag=1;from-tag=2" "Require: replaces"
    expect_optional 100
    expect 481
    send_ack_of_failure
    send_again 2 "Replaces: $dialog;to-tag=$tag;from-tag=$(<"$WORK/tag");early-only"
    expect_optional 100
    expect 486
    send_ack_of_failure 2
    send_again 3 "Replaces: $dialog;to-tag=$tag;from-tag=$(<"$WORK/tag")"
    expect 100
    expect 200 body "${RELAYED:-o=caller 1 2}"
    send_ack '' 3
    pause 100
    send_text retrans "$(request_text BYE 4 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
send_again() { # SEQUENCE HEADER
    invite_step=$step
    send_text retrans "$(request_text INVITE "$1" '[branch]' '' "$2")" "$(session newcomer 1)"
}

add_target
relay_media
start_gateway
start_callee callee -trace_msg -message_file "$WORK/callee.msg"
(expect_caller caller 4989123) &
caller_pid=$!
for ((i = 0; i < 100; i++)); do # until the call is up
    grep -q '^ACK' "$WORK/callee.msg" 2>/dev/null && break
    sleep 0.05
done
sed -n 's/^To:.*tag=\(.*callee1\).*/\1/p' "$WORK/callee.msg" | tr -d '\r' | head -1 >"$WORK/tag"
write_scenario "$WORK/newcomer.xml" newcomer
sipp "$HOST:$PORT_C" -sf "$WORK/newcomer.xml" -s 4989123 -i "$HOST" -bind_local -p "$PORT_TARGET" -cp $((PORT + 8)) \
    -mp $((PORT + 26)) -nostdin -m 1 -timeout "${SIPP_TIMEOUT:-20s}" -timeout_error -trace_err -error_file "$WORK/newcomer.log" \
    >"$WORK/newcomer.out" 2>&1 || fail "newcomer: exit status $?"
wait $caller_pid || fail "the caller"
expect_callee
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
