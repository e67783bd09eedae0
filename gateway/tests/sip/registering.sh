# An interface registers with its peer, is asked for a password, for longer, is granted less, refreshes, waits after a
# refusal, and takes itself back at the end. RFC 3261, 10.2.
. "$(dirname "$0")/../lib.bash"

answer_registration() { # STATUS-AND-PHRASE [HEADER]...
    local text="SIP/2.0 $1
[last_Via:]
[last_From:]
[last_To:];tag=[pid]registrar
[last_Call-ID:]
[last_CSeq:]"
    (($# == 1)) || text+=$'\n'$(printf '%s\n' "${@:2}")
    send_text '' "$text" ''
}
registrar() {
    expect_request REGISTER Expires: "600" From: "sip:4420@$HOST:$PORT_CALLEE" Contact: "sip:4420@$HOST:$PORT_B.$" nowhere "Authorization|Route"
    answer_registration "401 Unauthorized" 'WWW-Authenticate: Digest realm="r",nonce="n",qop="auth",algorithm=SHA-256'
    expect_request REGISTER Expires: "600" Authorization: 'uri=.sip:'"$HOST:$PORT_CALLEE"'.,.*algorithm=SHA-256'
    answer_registration "423 Interval Too Brief" "Min-Expires: 700"
    expect_request REGISTER Expires: "700" Authorization: 'nc=00000002'
    answer_registration "200 OK" "Contact: <sip:other@$HOST>;expires=77" "[last_Contact:];expires=1"
    expect_request REGISTER Authorization: 'nc=00000003' # after 0.8 s
    answer_registration "200 OK" "[last_Contact:];expires=1"
    expect_request REGISTER
    answer_registration "503 Service Unavailable"
    expect_request REGISTER Expires: "700" # after 0.5 to 1 s
    answer_registration "200 OK" "Contact: <sip:other@$HOST>;expires=77" # which is not us
    expect_request REGISTER
    answer_registration "200 OK" "[last_Contact:]" "Expires: 300"
    expect_request REGISTER Expires: "^ *0"
    answer_registration "200 OK"
}

echo '4420:r:secret' >"$WORK/passwords"
chmod 600 "$WORK/passwords"
write_configuration
sed -i "s,^name = \"b\",&\nuser = \"4420\"\npasswords = \"$WORK/passwords\"\nregister = true\nregister-retry = 1," "$WORK/gateway.toml"
start_callee registrar
start_gateway
expect_log 'interface b: registered as sip:4420@.* for 1 s'
sleep 1 # the second wait in a row is a longer one
expect_log 'interface b: registered as sip:4420@.* for 300 s'
kill -USR1 $gateway_pid
expect_trace '^interface b: registered for (300|299) s as sip:4420@.*, 6 requests, 2 failures$'
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"
expect_callee
[[ $(grep -c 'not registered' "$WORK/gateway.err") == 1 ]] || fail "not one line for each row of failures"

# nobody is there: the end does not wait for him
start_gateway
expect_log 'interface b: not registered as sip:4420@.*: 503'
SECONDS=0
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"
((SECONDS <= 6)) || fail "the end took $SECONDS s"
finish
