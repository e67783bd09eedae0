# Two phones register with their passwords and call each other by their names, although nobody knows their addresses; after
# the gateway was killed and started anew they can do so at once. Who has not registered is absent, who does not exist
# unknown.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"

REGINT=600
printf 'alice:office:{MD5}%s\nbob:office:secret\ncarol:office:secret\n' "$(printf alice:office:sesame | md5sum | cut -d' ' -f1)" >"$WORK/passwords"
chmod 600 "$WORK/passwords"
cat >"$WORK/gateway.toml" <<END
[gateway]
call-control-log-level = 2

[[sip]]
name = "a"
listen = "$HOST:$PORT_A"
allow = ["$HOST"]
authenticate = true
realm = "office"
algorithms = ["MD5"]
passwords = "$WORK/passwords"
registrar = true
registrations = "$WORK/contacts"

[[sip]]
name = "b"
listen = "$HOST:$PORT_B"
peer = "$HOST:$((PORT + 6))"

[[route]]
from = "a"
to = "a"
END
in_file() { python3 -c 'import sqlite3, sys; print(sqlite3.connect(sys.argv[1]).execute("select count(*) from binding").fetchone()[0])' "$WORK/contacts"; }
call_bob() { # NUMBER-OF-CALL
    tell_phone "$PORT_CALLER" dial "sip:bob@$HOST:$PORT_A"
    expect_log 'Accept call'
    sleep 0.5
    tell_phone "$PORT_CALLER" hangup
    expect_log 'call 1 a \((calling|called) side\) released: cause 16 ' 2
}

start_gateway
start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16)) "auth_user=alice;auth_pass=sesame"
start_phone bob "$PORT_CALLEE" "$PORT_A" $((PORT + 20)) "answermode=auto;auth_user=bob;auth_pass=secret"
for ((i = 0; i < 100; i++)); do [[ $(in_file) == 2 ]] && break; sleep 0.05; done
[[ $(in_file) == 2 ]] || fail "the phones have not registered"
call_bob
tell_phone "$PORT_CALLER" dial "sip:carol@$HOST:$PORT_A"
expect_log 'call 2 a \(called side\) released: cause 20 \(subscriber-absent\), SIP 480'
tell_phone "$PORT_CALLER" dial "sip:dave@$HOST:$PORT_A"
expect_log 'call 3 a \(called side\) released: cause 1 \(unallocated-number\), SIP 404'

kill -KILL $gateway_pid
wait $gateway_pid 2>/dev/null
start_gateway
call_bob
kill -USR1 $gateway_pid
expect_trace '^interface a: 2 contacts, 0 registrations taken, 0 refused, 0 failures to write$'
stop_phones # which take themselves back
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
[[ $(in_file) == 0 ]] || fail "$(in_file) contacts are left"
finish
