# What the log has at its usual level: one line a call, with date and zone, both numbers or none, and who ended it.
. "$(dirname "$0")/../lib.bash"
. "$(dirname "$0")/../plain_call.bash"

# one_line REGEXP: what the log has got since the last time is that one line
told=0
one_line() {
    expect_log "^[0-9]{4}-[0-9]{2}-[0-9]{2}T[0-9]{2}:[0-9]{2}:[0-9]{2}\.[0-9]{3}[+-][0-9]{2}:?[0-9]{2} info $1"
    local lines
    lines=$(wc -l <"$WORK/gateway.err")
    ((lines == ++told)) || fail "more lines than one"
}
secret() { call_up 'Privacy: id'; pause 100; send_bye; expect 200; }
busy_caller() { send_invite; expect 100; expect 486; send_ack_of_failure; }
busy_callee() { expect_invite; respond_finally "486 Busy Here"; expect_request ACK; }
lonely() { send_invite; expect 404; send_ack_of_failure; }

LOG_LEVEL=info
write_configuration "" "" 49
sed -i '/^call-control-log-level/d' "$WORK/gateway.toml"
start_gateway
expect_log 'interface [ab] listens' 2
told=2
expect_call
one_line 'call 1: 4420 on a to 4989123 on b, answered after 0\.[0-9]+ s, over after [0-9.]+ s, cleared by a, cause 16 \(normal-call-clearing\), ids [^ ]+@127.0.0.1 and [^ ]+$'
start_callee callee
expect_caller secret 4989123
expect_callee
one_line 'call 2: \(withheld\) on a to 4989123 on b, answered'
start_callee busy_callee
expect_caller busy_caller 4989123
expect_callee
one_line 'call 3: 4420 on a to 4989123 on b, not answered, over after [0-9.]+ s, cleared by b, cause 17 \(user-busy\), SIP 486'
expect_caller lonely 17
one_line "call 4 a refused: no route to '17', cause 3 \(no-route-to-destination\), SIP 404"
stop_gateway "4 calls placed, 2 answered, 2 cleared, 2 failed"
finish
