# The records of calls: each as the schema has it; a log rotation; a disk that is full, with calls lost or refused.
. "$(dirname "$0")/../lib.bash"
. "$(dirname "$0")/../plain_call.bash"
CTL=$3
export CALLCONTROL_GATEWAY_SOCKET=$WORK/control

# expect_stat NAME VALUE
expect_stat() {
    local i
    for ((i = 0; i < 100; i++)); do
        "$CTL" stats | grep -qE "^$1 +$2\$" && return 0
        sleep 0.05
    done
    fail "$1 is not $2: $("$CTL" stats)"
}
# expect_records FILE EXPRESSION...
expect_records() {
    python3 "$HERE/operation/records.py" "$HERE/../operation/record/call-record.schema.json" "$@" >"$WORK/records.log" 2>&1 ||
        fail "records of $1: $(cat "$WORK/records.log")"
}
secret() { call_up 'Privacy: id' 'Diversion: <sip:4930@h>;reason=user-busy'; pause 100; send_bye; expect 200; }
busy_caller() { send_invite; expect 100; expect 486; send_ack_of_failure; }
busy_callee() { expect_invite; respond "180 Ringing"; pause 100; respond_finally "486 Busy Here"; expect_request ACK; }
ringing_caller() { send_invite; expect 100; expect 180; expect 486; send_ack_of_failure; }
refused() { send_invite; expect 503; send_ack_of_failure; }
configure() {
    write_configuration
    printf '[control]\nsocket = "%s"\n[records]\nfile = "%s"\n%s\n' "$WORK/control" "$WORK/calls.jsonl" "${1:-}" >>"$WORK/gateway.toml"
}

configure
start_gateway
expect_call
start_callee callee
expect_caller secret 4989123
expect_callee
expect_stat records-written 2
mv "$WORK/calls.jsonl" "$WORK/old.jsonl"
kill -HUP $gateway_pid
for ((i = 0; i < 100; i++)); do [[ -e $WORK/calls.jsonl ]] && break; sleep 0.05; done
start_callee busy_callee
expect_caller ringing_caller 4989123
expect_callee
stop_gateway "3 calls placed, 2 answered, 2 cleared, 1 failed"
expect_records "$WORK/old.jsonl" 'len(r) == 2' 'r[0]["legs"][0]["number"] == "4420"' 'r[0]["legs"][1]["dialled"] == "4989123"' \
    'r[0]["legs"][0]["interface"] == "a" and r[0]["legs"][1]["interface"] == "b"' \
    'r[0]["answeredAfter"] is not None and r[0]["ringingAfter"] is None' 'r[0]["clearedBy"] == r[0]["legs"][0]["leg"]' \
    'all(l["cause"] == 16 and l["id"] for l in r[0]["legs"])' 'r[0]["legs"][0]["quality"]["codec"] == "PCMA"' \
    'r[1]["legs"][0]["number"] is None and r[1]["legs"][0]["presentation"] == "restricted"' \
    'r[1]["legs"][0]["redirection"]["number"] == "4930"'
expect_records "$WORK/calls.jsonl" 'len(r) == 1' 'r[0]["ringingAfter"] is not None and r[0]["answeredAfter"] is None' \
    'r[0]["clearedBy"] == r[0]["legs"][1]["leg"]' 'r[0]["legs"][1]["cause"] == 17 and r[0]["legs"][1]["sipStatus"] == 486'

# what does not fit on the disk waits; what does not fit in memory is counted, or not called at all
rm "$WORK/calls.jsonl"
ln -s /dev/full "$WORK/calls.jsonl"
configure $'kept = 1\nwhen-full = "refuse"'
start_gateway
expect_call
expect_stat records-waiting 1
expect_caller refused 4989123
expect_stat refused 1
rm "$WORK/calls.jsonl"
kill -HUP $gateway_pid
expect_stat records-written 1
expect_call
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
expect_records "$WORK/calls.jsonl" 'len(r) == 2' '[c["call"] for c in r] == [1, 2]'

rm "$WORK/calls.jsonl"
ln -s /dev/full "$WORK/calls.jsonl"
configure 'kept = 1'
start_gateway
expect_call
expect_call
expect_stat records-lost 1
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
expect_log 'error 2 records of calls are lost'
finish
