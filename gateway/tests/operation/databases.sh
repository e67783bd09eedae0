# The records of calls in databases, SQLite and a server of PostgreSQL that goes and comes back; a gateway that is killed with
# calls up, whose successor writes what was known of them.
. "$(dirname "$0")/../lib.bash"
. "$(dirname "$0")/../plain_call.bash"
. "$(dirname "$0")/../postgresql.bash"
CTL=$3
export CALLCONTROL_GATEWAY_SOCKET=$WORK/control
trap 'end_server; cleanup' EXIT

# the calls that a database has, in order, those that were interrupted with a "!"
in_server() {
    sql "select string_agg(call || case when record->'interrupted' = 'true' then '!' else '' end, ' ' order by process, call) from call_record"
}
in_sqlite() {
    python3 -c 'import sqlite3, sys
print(" ".join(str(c) + ("!" if i else "") for c, i in sqlite3.connect(sys.argv[1]).execute(
    "select call, record ->> \"interrupted\" from call_record order by process, call")))' "$WORK/calls.sqlite"
}
in_file() { python3 -c 'import json, sys
print(" ".join(str(r["call"]) + ("!" if r["interrupted"] else "") for r in map(json.loads, open(sys.argv[1]))))' "$WORK/calls.jsonl"; }
# expect_records WHERE CALLS
expect_records() {
    local i
    for ((i = 0; i < 400; i++)); do
        [[ $("in_$1" 2>"$WORK/in.log") == "$2" ]] && return 0
        sleep 0.05
    done
    fail "the records in the $1 are $("in_$1"), not $2"
}
expect_spooled() {
    local i
    for ((i = 0; i < 400; i++)); do
        "$CTL" stats | grep -qE "^records-spooled +$1\$" && return 0
        sleep 0.05
    done
    fail "records-spooled is not $1: $("$CTL" stats)"
}
lasting() { call_up; pause 20000; }
forgotten() { expect_invite; respond_with "$SDP_OF_CALLEE" retrans "200 OK"; expect_request ACK; pause 20000; }

make_server
write_configuration
cat >>"$WORK/gateway.toml" <<END
[control]
socket = "$WORK/control"
[records]
file = "$WORK/calls.jsonl"
sqlite = "$WORK/calls.sqlite"
postgresql = "$POSTGRESQL"
spool = "$WORK/spool"
END

# the server is not there yet, is there, goes, and comes back; what it can never take holds up nobody
mkdir "$WORK/spool"
printf '{"process":"before","call":1,"words":"\\u0000"}\n' >"$WORK/spool/postgresql.spool"
start_gateway
expect_log 'error records: postgresql takes none, they wait on the disk: Connection refused'
expect_call
expect_spooled 2
start_server
expect_log 'info records: postgresql takes them again'
expect_records server "1"
expect_log 'error records: postgresql refuses one, which is in .*/postgresql.refused: '
grep -q '"before"' "$WORK/spool/postgresql.refused" || fail "what was refused is lost"
expect_call
expect_records server "1 2"
stop_server immediate
expect_call
expect_spooled 1
start_server
expect_records server "1 2 3"

# killed with a call up
start_callee forgotten
SIPP_TIMEOUT=30s run_caller lasting 4989123 &
background+=($!)
for ((i = 0; i < 200; i++)); do "$CTL" calls | grep -q 'b/[0-9]* CONNECTED' && break; sleep 0.05; done
kill -KILL $gateway_pid "$callee_pid" "$(pgrep -P "${background[0]}")"
{ wait $gateway_pid "$callee_pid" "${background[0]}"; } 2>/dev/null
gateway_pid=0 callee_pid=0 background=()
mv "$WORK/gateway.err" "$WORK/gateway.err.before"
start_gateway
expect_log 'warning 1 calls were not over, or not written, when the process before ended'
expect_call
for place in server sqlite file; do expect_records $place "1 2 3 4! 1"; done
kill -KILL $gateway_pid
{ wait $gateway_pid; } 2>/dev/null
mv "$WORK/gateway.err" "$WORK/gateway.err.again"
start_gateway
expect_log 'warning .* calls were not over' 0
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"
for place in server sqlite file; do expect_records $place "1 2 3 4! 1"; done
python3 "$HERE/operation/records.py" "$HERE/../operation/record/call-record.schema.json" "$WORK/calls.jsonl" \
    'r[3]["interrupted"] and r[3]["endedAfter"] is None and r[3]["answeredAfter"] is not None' \
    'r[3]["legs"][1]["dialled"] == "4989123"' 'r[4]["process"] > r[3]["process"]' >"$WORK/records.log" 2>&1 || fail "records"
grep -l "$POSTGRESQL_PASSWORD" "$WORK"/gateway.err* "$WORK"/gateway.out "$WORK"/spool/* && fail "the password is told"
finish
