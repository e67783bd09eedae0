# Attended transfer: a peer with two calls joins their other ends, REFER with Replaces in the one naming the other. The two
# settle their session anew and go on without it, whose both dialogs end. RFC 5589, 7; RFC 3891. A dialog that is not the
# gateway's goes on to the target in an INVITE with the Replaces.
. "$(dirname "$0")/../lib.bash"
. "$HERE/target.bash"

consulting() { # the second call of the transferor
    call_up_with target
    expect_request BYE
    respond_in_dialog "200 OK"
}
call_up_with() {
    send_invite
    expect 100
    expect 200 body "${RELAYED:-$1}"
    send_ack
}
transferor() {
    call_up
    send_text retrans "$(request_text REFER 2 '[branch]' '[peer_tag_param]' "Refer-To: <sip:77@[remote_ip]?Replaces=$REPLACES>")" ''
    expect 202
    expect_notify 100
    expect_notify 200
    expect_request BYE # it has not hung up by itself
    respond_in_dialog "200 OK"
}
expect_notify() {
    expect_request NOTIFY body "SIP/2.0 $1"
    respond_once "200 OK"
}
renegotiated() {
    [[ -z ${RELAYED:-} ]] || return 0
    expect_request INVITE
    respond_again "200 OK" "$(session "$1" 2)"
    expect_request ACK
}
# either may be asked for an offer first, and the other is then offered that
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    renegotiated callee
    pause 300
    bye_from_here
    expect 200
}
target() {
    expect_invite
    respond_with "$(session target 1)" retrans "200 OK"
    expect_request ACK
    renegotiated target
    expect_request BYE
    respond_in_dialog "200 OK"
}
# a dialog that only the target knows
elsewhere_target() {
    expect_invite Replaces: "elsewhere;to-tag=1;from-tag=2"
    respond_with "$(session target 1)" retrans "200 OK"
    if [[ -n ${RELAYED:-} ]]; then expect_request ACK; else expect_request ACK body "o=callee"; fi
    expect_request BYE
    respond_in_dialog "200 OK"
}
elsewhere_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    if [[ -z ${RELAYED:-} ]]; then
        expect_request INVITE body "o=target 1 1"
        respond_again "200 OK" "$(session callee 2)"
        expect_request ACK
    fi
    pause 300
    bye_from_here
    expect 200
}

write_configuration '' 't1 = 100'
add_target
relay_media
start_gateway
start_callee callee -trace_msg -message_file "$WORK/callee.msg"
start_target target -trace_msg -message_file "$WORK/target.msg"
write_scenario "$WORK/consulting.xml" consulting
sipp "$HOST:$PORT_A" -sf "$WORK/consulting.xml" -s 77 -i "$HOST" -bind_local -p $((PORT + 9)) -cp $((PORT + 14)) \
    -mp $((PORT + 16)) -nostdin -m 1 -timeout "${SIPP_TIMEOUT:-20s}" -timeout_error -trace_msg -message_file "$WORK/consulting.msg" \
    >"$WORK/consulting.out" 2>&1 &
consulting_pid=$!
background+=($consulting_pid)
for ((i = 0; i < 100; i++)); do
    grep -q '^ACK' "$WORK/consulting.msg" 2>/dev/null && break
    sleep 0.05
done
# field NAME: of the consultation's ACK, without its line end
field() { awk -v name="$1:" '/^ACK/ { now = 1 } now && $1 == name { print; exit }' "$WORK/consulting.msg" | tr -d '\r'; }
REPLACES="$(field Call-ID | cut -d' ' -f2)%3Bto-tag%3D$(field To | sed 's/.*tag=//')%3Bfrom-tag%3D$(field From | sed 's/.*tag=//')"
expect_caller transferor 4989123
wait $consulting_pid || fail "consultation: exit status $?"
expect_callee
expect_target
if [[ -z ${RELAYED:-} ]]; then
    grep -q "o=target 1 2" "$WORK/callee.msg" && grep -q "o=callee 1 2" "$WORK/target.msg" || fail "the two have not settled a session"
fi
start_callee elsewhere_callee
start_target elsewhere_target
REPLACES='elsewhere%3Bto-tag%3D1%3Bfrom-tag%3D2' expect_caller transferor 4989123
expect_callee
expect_target
stop_gateway "3 calls placed, 3 answered, 3 cleared, 0 failed"
finish
