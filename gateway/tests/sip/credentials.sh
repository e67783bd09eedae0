# The callee asks who calls (401, 407): every request of the gateway is shown the credentials from a file, also those in the
# dialog; a nonce that has expired is replaced, wrong credentials are shown once, and an endless challenge ends.
# RFC 3261, 22; RFC 8760.
. "$(dirname "$0")/../lib.bash"

# verified USER PASSWORD: whether SIPp finds the credentials of the last request right, by its own arithmetic
verified() {
    cat <<END
<recv request="$3"><action><verifyauth assign_to="valid" username="$1" password="$2"/></action></recv>
<nop test="valid" next="$4"/>
<recv request="NEVER" timeout="1"/>
<label id="$4"/>
END
    step=$((step + 3))
    references+=",valid"
}
DIGEST='Digest realm="example.net"'
# of the one header, and not of the other whose name ends like it
OURS='[[:cntrl:]]Authorization: [^[:cntrl:]]*'
PROXYS='[[:cntrl:]]Proxy-Authorization: [^[:cntrl:]]*'
ask_who() { respond_with '' '' "$1" "${@:2}"; }
ask_who_in_dialog() { # STATUS-AND-PHRASE HEADER
    send_text '' "SIP/2.0 $1
[last_Via:]
[last_From:]
[last_To:]
[last_Call-ID:]
[last_CSeq:]
$2" ''
}

# --- all sorts of requests
caller() {
    send_invite
    expect 100
    expect 183
    expect 200 body "callee"
    send_ack
    send_offer INVITE 2 "$(session caller 2 sendonly)"
    expect_optional 100
    expect 200
    send_ack '' 2
    send_text retrans "$(request_text INFO 3 '[branch]' '[peer_tag_param]' 'Content-Type: application/dtmf-relay')" \
        $'Signal=5\nDuration=160'
    expect 200
    pause 300
    send_text retrans "$(request_text BYE 4 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
callee() {
    expect_invite nowhere "uthorization:"
    ask_who "401 Unauthorized" 'WWW-Authenticate: Basic realm="example.net"' \
        'WWW-Authenticate: Digest realm="example.net",nonce="x",algorithm=WHIRLPOOL' \
        "WWW-Authenticate: $DIGEST,nonce=\"one\",algorithm=MD5,qop=\"auth,auth-int\",opaque=\"o\""
    expect_request ACK
    verified gateway secret INVITE first
    ask_who "407 Proxy Authentication Required" 'Proxy-Authenticate: Digest realm="other.net",nonce="two"'
    expect_request ACK
    expect_invite msg "$OURS""nc=00000002" msg "$PROXYS"'username=.gateway., realm=.other.net., nonce=.two., uri=.sip:4989123@'
    respond_with "$SDP_OF_CALLEE" '' "183 Session Progress" "Require: 100rel" "RSeq: 7"
    expect_request PRACK msg "$OURS"'nonce=.one.'
    ask_who_in_dialog "401 Unauthorized" "WWW-Authenticate: $DIGEST,nonce=\"three\",qop=\"auth\",stale=TRUE"
    expect_request PRACK msg "$OURS"'nonce=.three..*nc=00000001' RAck: "7 [0-9]+ INVITE"
    respond_in_dialog "200 OK"
    answer_again ";tag=[pid]callee[call_number]"
    expect_request ACK msg "$OURS"'nonce=.one..*nc=00000002' msg "$PROXYS"'other.net'
    expect_request INVITE msg "$OURS"'nonce=.three.' body "sendonly"
    ask_who_in_dialog "401 Unauthorized" "WWW-Authenticate: $DIGEST,nonce=\"four\",algorithm=SHA-256,qop=\"auth\""
    expect_request ACK
    expect_request INVITE msg "$OURS"'example.net..*nonce=.four..*response=.[0-9a-f]{64}.*algorithm=SHA-256' body "sendonly"
    respond_again "200 OK" "$(session callee 2 recvonly)"
    expect_request ACK msg "$OURS"'nonce=.four..*nc=00000001'
    expect_request INFO msg "$OURS"'nonce=.four.'
    ask_who_in_dialog "401 Unauthorized" "WWW-Authenticate: $DIGEST,nonce=\"five\",qop=\"auth-int\",stale=true"
    expect_request INFO msg "$OURS"'nonce=.five..*qop=auth-int' body "Signal=5"
    respond_in_dialog "200 OK"
    expect_request BYE msg "$OURS"'nonce=.five..*nc=00000002'
    ask_who_in_dialog "401 Unauthorized" "WWW-Authenticate: $DIGEST,nonce=\"six\""
    expect_request BYE msg "$OURS"'nonce=.six.' CSeq: "[0-9]+ BYE"
    respond_in_dialog "200 OK"
}

# --- what is not taken
refused_caller() {
    send_invite
    expect 100
    expect "$1"
    send_ack_of_failure
}
wrong_caller() { refused_caller 403; }
wrong_callee() {
    expect_invite msg "$PROXYS""other.net" msg "$OURS"'nonce=.six.'
    ask_who "407 Proxy Authentication Required" "Proxy-Authenticate: $DIGEST,nonce=\"seven\",qop=\"auth\""
    expect_request ACK
    expect_invite msg "$PROXYS"'nonce=.seven.'
    ask_who "407 Proxy Authentication Required" "Proxy-Authenticate: $DIGEST,nonce=\"eight\",qop=\"auth\""
    expect_request ACK
}
endless_callee() {
    local nonce
    for nonce in 1 2 3 4 5; do
        expect_invite nowhere " nonce=.$nonce.,"
        ask_who "407 Proxy Authentication Required" "Proxy-Authenticate: $DIGEST,nonce=\"$nonce\",qop=\"auth\",stale=true"
        expect_request ACK
    done
}
unknown_callee() {
    expect_invite
    ask_who "401 Unauthorized" 'WWW-Authenticate: Digest realm="of somebody else",nonce="1"'
    expect_request ACK
}

echo 'gateway:example.net:secret' >"$WORK/passwords"
echo 'gateway:other.net:{MD5}00112233445566778899aabbccddeeff' >>"$WORK/passwords"
chmod 640 "$WORK/passwords"
write_configuration '' "user = \"gateway\"
passwords = \"$WORK/passwords\""
start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_trace 'once more with credentials'
for case in wrong endless unknown; do
    start_callee ${case}_callee
    expect_caller wrong_caller 4989123
    expect_callee
done
expect_log "the peer refuses our credentials, realm 'example.net'" # and no line for each
kill -USR1 $gateway_pid
expect_trace '^interface b: 11 challenges answered, 3 credentials not taken$'
grep -qE 'secret|00112233' "$WORK"/gateway.{out,err} && fail "a password in the log"
stop_gateway "4 calls placed, 1 answered, 1 cleared, 3 failed"
finish
