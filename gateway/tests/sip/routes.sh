# A route names the causes upon which the next one is tried, each with the number as it shapes it: the caller hears of the
# one that is reached alone. What a route does not name, and a party that has rung, end the call.
. "$(dirname "$0")/../lib.bash"

refusing_callee() {
    expect_invite msg "INVITE sip:4989123@"
    respond_finally "503 Service Unavailable"
    expect_request ACK
}
ringing_callee() {
    expect_invite
    respond "180 Ringing"
    pause 100
    respond_finally "503 Service Unavailable"
    expect_request ACK
}
busy_callee() { expect_invite; respond_finally "486 Busy Here"; expect_request ACK; }
next_callee() {
    expect_invite msg "INVITE sip:089123@" body "m=audio"
    respond "180 Ringing"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
caller() { call_up; pause 100; send_bye; expect 200; }
rung_caller() { send_invite; expect 100; expect 180; expect 503; send_ack_of_failure; }
busy_caller() { send_invite; expect 100; expect 486; send_ack_of_failure; }

write_configuration '' '' 49
cat >>"$WORK/gateway.toml" <<END
[[sip]]
name = "c"
listen = "$HOST:$((PORT + 6))"
peer = "$HOST:$((PORT + 7))"

[[route]]
from = "a"
prefix = "49"
strip = 2
prepend = "0"
to = "c"
END
sed -i '0,/^to = "b"/s//&\nnext-on = [38, 41]/' "$WORK/gateway.toml"
relay_media
[[ $("$GATEWAY" --config "$WORK/gateway.toml" --route 4989123 --from a) == '4989123 from a: prefix "49" to b
4989123 from a: prefix "49" to c as 089123 (tried when that ends with cause 38, 41)' ]] || fail "the dry run"
start_gateway

PORT_CALLEE=$((PORT + 7)) PORT_B=$((PORT + 6)) PORT=$((PORT + 14)) start_callee next_callee
next=$callee_pid
background+=($next)
start_callee refusing_callee
expect_caller caller 4989123
expect_callee
wait $next || fail "the next callee: exit status $?"
expect_log 'call 1 a goes on to c after cause 41 '

start_callee ringing_callee
expect_caller rung_caller 4989123
expect_callee
start_callee busy_callee
expect_caller busy_caller 4989123
expect_callee
stop_gateway "3 calls placed, 1 answered, 1 cleared, 2 failed"
finish
