# The gateway's figures: what a page has after calls, that Prometheus reads it, and that no client harms calls. The rules of
# alerts are tried with what they were written for.
. "$(dirname "$0")/../lib.bash"
. "$(dirname "$0")/../plain_call.bash"
DEPLOY=$HERE/../deploy/prometheus
PORT_METRICS=$((PORT + 30))

# scrape [PATH]: the page, if the answer is 200
scrape() { python3 -c 'import sys, urllib.request as r; sys.stdout.write(r.urlopen(sys.argv[1], timeout=20).read().decode())' \
    "http://$HOST:$PORT_METRICS${1:-/metrics}"; }
# expect_metric SAMPLE: it is on the page, sooner or later
expect_metric() {
    local i
    for ((i = 0; i < 100; i++)); do
        scrape >"$WORK/metrics.log" 2>&1
        grep -qE "^callcontrol_gateway_$1\$" "$WORK/metrics.log" && return 0
        sleep 0.05
    done
    fail "no such figure: $1"
}
busy_caller() { send_invite; expect 100; expect 486; send_ack_of_failure; }
busy_callee() { expect_invite; respond_finally "486 Busy Here"; expect_request ACK; }

write_configuration
printf '[metrics]\nlisten = "%s:%d"\npage = true\n[records]\nfile = "%s"\n' "$HOST" $PORT_METRICS "$WORK/calls.jsonl" >>"$WORK/gateway.toml"
start_gateway
expect_metric 'calls_placed_total 0'
expect_call
start_callee busy_callee
expect_caller busy_caller 4989123
expect_callee
expect_metric 'call_parties_total\{interface="b",side="called",cause="17",answered="no"\} 1'
expect_metric 'call_parties_total\{interface="a",side="calling",cause="16",answered="yes"\} 1'
expect_metric 'calls_answered_total 1'
expect_metric 'set_up_seconds_count\{interface="b"\} 1'
expect_metric 'sip_messages_received_total\{interface="a",kind="request"\} 5'
expect_metric 'pool_calls_removed_total 2'
promtool check metrics <"$WORK/metrics.log" >"$WORK/promtool.log" 2>&1 || fail "Prometheus has something to say of the figures"

# the page for a browser
scrape / >"$WORK/page.log"
python3 - "$WORK/page.log" >"$WORK/parsed.log" 2>&1 <<'END' || fail "the page is not well formed, or has not what it should"
import sys
import xml.etree.ElementTree as tree
page = tree.fromstring(open(sys.argv[1]).read().removeprefix("<!DOCTYPE html>\n"))
tables = {title.text: [[cell.text for cell in row] for row in table] for title, table in zip(page.iter("h2"), page.iter("table"))}
print(tables)
assert tables["Since the start"][1][:4] == ["2", "1", "1", "1"]
assert tables["Interfaces"] == [["interface", "module", "state"], ["a", "sip", "in service"], ["b", "sip", "in service"]]
assert tables["Peers"][1][2] == "called" and len(tables["Peers"]) == 3
assert tables["Calls, the oldest first"] == [["call", "state", "age/s", "parties"]]
END

# connections that say nothing, and what is no request, by the thousand, while calls go on
python3 "$HERE/operation/strangers.py" $PORT_METRICS >"$WORK/strangers.log" 2>&1 &
background+=($!)
expect_call
wait "${background[0]}" || fail "the page is not to be had among strangers"
expect_metric 'calls_answered_total 2'

promtool check rules "$DEPLOY/alerts.yml" >"$WORK/promtool.log" 2>&1 || fail "the rules of alerts"
promtool test rules "$DEPLOY/alerts_test.yml" >"$WORK/promtool.log" 2>&1 || fail "the rules do not tell what they are to"
python3 "$HERE/operation/dashboard.py" "$DEPLOY" "$WORK/metrics.log" >"$WORK/dashboard.log" 2>&1 ||
    fail "the dashboard or the rules have other names than the page"
stop_gateway "3 calls placed, 2 answered, 2 cleared, 1 failed"

# nobody but this host is told; and a port that is taken is told of before anything is served
sed -i 's/^listen = "[0-9.]*:'$PORT_METRICS'"/listen = "192.0.2.1:9100"/' "$WORK/gateway.toml"
"$GATEWAY" --config "$WORK/gateway.toml" --check 2>"$WORK/refused.log" && fail "listens beyond the host"
grep -q 'metrics.listen: must be a loopback address' "$WORK/refused.log" || fail "no word of what is wrong with the address"
sed -i 's/192.0.2.1:9100/'"$HOST:$PORT_METRICS"'/' "$WORK/gateway.toml"
python3 -c 'import signal, socket, sys; s = socket.create_server(("127.0.0.1", int(sys.argv[1]))); print("there", flush=True); signal.pause()' \
    $PORT_METRICS >"$WORK/taken" &
background+=($!)
for ((i = 0; i < 200; i++)); do [[ -s $WORK/taken ]] && break; sleep 0.05; done
"$GATEWAY" --config "$WORK/gateway.toml" 2>"$WORK/refused.log" && fail "serves without its figures"
grep -q 'metrics.listen: cannot be listened on' "$WORK/refused.log" || fail "no word of the port that is taken"
finish
