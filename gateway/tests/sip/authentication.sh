# An interface asks who calls: SIPp and a phone that know the password get through, nobody else; what was sent once is not
# taken twice, nor for another number, and who guesses is not answered any more, but for an
# emergency number, for which nobody is asked. RFC 3261, 22; RFC 7616.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"
. "$HERE/phones.bash"

knowing_caller() { # with SIPp's own arithmetic
    send_invite
    echo '<recv response="401" auth="true"/>'
    step=$((step + 1))
    send_ack_of_failure
    invite_step=$step
    send_text retrans "$(request_text INVITE 2 '[branch]' '' "[authentication username=$LOGIN password=$PASSWORD]")" "$SDP_OF_CALLER"
    expect "$1"
}
right_caller() { # and the same request again, as another transaction
    knowing_caller 100
    expect_optional 180
    expect 200
    send_ack '' 2
    send_text retrans "$(request_text BYE 3 '[branch]' '[peer_tag_param]')" '' # inside the dialog nobody is asked
    expect 200
}
wrong_caller() {
    knowing_caller 401
    send_ack_of_failure 2
}
# a proxy on the way that has put another number in the place of the one which the caller meant
moved_caller() { knowing_caller 400; send_ack_of_failure 2; }
unasked() { send_request OPTIONS; expect 401 WWW-Authenticate: 'Digest realm="office", nonce="[0-9a-f]+", algorithm=MD5, qop="auth"'; }

ALICE_HASH=$(printf 'alice:office:open-sesame' | md5sum | cut -d' ' -f1)
printf 'alice:office:{MD5}%s\n4420:office:secret\n' "$ALICE_HASH" >"$WORK/passwords"
chmod 600 "$WORK/passwords"
write_configuration
sed -i "s,^name = \"a\",&\nauthenticate = true\nrealm = \"office\"\nalgorithms = [\"MD5\"]\npasswords = \"$WORK/passwords\"," "$WORK/gateway.toml"
printf '\n[[route]]\nfrom = "a"\nnumber = "112"\nto = "b"\nemergency = true\n' >>"$WORK/gateway.toml"
start_gateway
run_caller unasked x || fail "OPTIONS of a stranger"
start_callee callee
LOGIN=4420 PASSWORD=secret expect_caller right_caller 4989123 -auth_uri "4989123@$HOST:$PORT_A"
expect_callee
expect_causes 1 16
kill -USR1 $gateway_pid
expect_trace '^interface a: 1 requests of known users, 2 asked who, 0 wrong, 0 stale, 0 replayed, 0 for another URI; 0 addresses banned, 0 requests of theirs ignored$'

# a phone, whose password is in the file as a hash
start_callee callee
start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16)) "auth_user=alice;auth_pass=open-sesame"
tell_phone "$PORT_CALLER" dial "sip:4989123@$HOST:$PORT_A"
expect_log 'Accept call' 2
sleep 0.3
tell_phone "$PORT_CALLER" hangup
stop_phones
expect_causes 2 16
expect_callee

LOGIN=4420 PASSWORD=secret expect_caller moved_caller 4989123 -auth_uri "4989124@$HOST:$PORT_A"

# five times wrong, by a user that there is and one that there is not: the answers are alike, and then there is none
for ((i = 0; i < 5; i++)); do
    LOGIN=$([[ $i == [024] ]] && echo 4420 || echo nobody) PASSWORD=wrong expect_caller wrong_caller 4989123 -auth_uri "4989123@$HOST:$PORT_A"
done
expect_log "interface a: $HOST has failed to say who it is, and is not served for 60 s"
SIPP_TIMEOUT=1s run_caller unasked x && fail "who is banned was answered"

# but for an emergency
start_callee callee
expect_caller caller 112
expect_callee
expect_log "is an emergency call to '112'"
kill -USR1 $gateway_pid
expect_trace '^interface a: 2 requests of known users, [0-9]+ asked who, 5 wrong, 0 stale, 0 replayed, 1 for another URI; 1 addresses banned, [1-9][0-9]* requests of theirs ignored$'
grep -qE "secret|sesame|$ALICE_HASH" "$WORK"/gateway.{out,err} && fail "a password in the log"
stop_gateway "3 calls placed, 3 answered, 3 cleared, 0 failed"
finish
