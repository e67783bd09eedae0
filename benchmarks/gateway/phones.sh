# A registrar whose phones refresh their registrations every minute, each asked for its password every time: the share of a processor
# that this takes. Then the gateway is killed amid that and started again, and phones from all over the list are called, none of which
# may be out of reach. SIPp is the phones, whose time is not counted.
#
#     bash benchmarks/gateway/phones.sh GATEWAY PORT [PHONES [SECONDS]]
. "$(dirname "${BASH_SOURCE[0]}")/../../gateway/tests/lib.bash"
. "$(dirname "${BASH_SOURCE[0]}")/measure.bash"
PHONES=${3:-10000}
SECONDS_OF_REFRESHING=${4:-60}
PER_SECOND=$(((PHONES + 59) / 60))
AT_FIRST=$((PHONES < 3000 ? PHONES / 6 : 500)) # a second
CALLS=$((PHONES < 1000 ? PHONES : 1000))
PORT_METRICS=$((PORT + 30))
SIPP_TIMEOUT=300s
LOG_LEVEL=info
HELD=100

refresh() {
    local text="REGISTER sip:$HOST:$PORT_A SIP/2.0
Via: SIP/2.0/[transport] [local_ip]:[local_port];branch=[branch]
From: <sip:[field0]@$HOST>;tag=[pid]r[call_number]
To: <sip:[field0]@$HOST>
Call-ID: [call_id]
Contact: <sip:[field0]@$HOST:$PORT_CALLER>;expires=120
Max-Forwards: 70"
    send_text retrans "$text"$'\nCSeq: 1 REGISTER' ''
    echo '<recv response="401" auth="true"/>'
    step=$((step + 1))
    send_text retrans "$text"$'\nCSeq: 2 REGISTER\n[field1]' ''
    expect_optional 401 # again, to a first one that was repeated
    expect 200
}
call_phone() { caller >"$WORK/call"; sed 's/\[service\]/[field0]/g' "$WORK/call"; }
users() { awk -v n="$PHONES" -v every="$1" 'BEGIN { print "SEQUENTIAL"
    for (i = 0; i < n; i += every) printf "u%d;[authentication username=u%d password=secret]\n", i, i }'; }
run_phones() { run_caller refresh x -inf "$WORK/users.csv" -m "$1" -r "$2" -l 2000; }
contacts() { scrape 1 | awk '/^callcontrol_gateway_sip_contacts/ { print $2 }'; }
share() { awk -v a="$1" -v b="$2" -v c="$3" 'BEGIN { printf "%.1f", 100 * a / 1e6 / (c - b) }'; }

awk -v n="$PHONES" 'BEGIN { for (i = 0; i < n; ++i) print "u" i ":office:secret" }' >"$WORK/passwords"
chmod 600 "$WORK/passwords"
users 1 >"$WORK/users.csv"
users $((PHONES / CALLS)) >"$WORK/called.csv"
configure 'max-requests-per-source = 0'
sed -i -e "s,^name = \"a\",&\nauthenticate = true\nregistrar = true\nrealm = \"office\"\nalgorithms = [\"MD5\"]\npasswords = \"$WORK/passwords\"\nregistrations = \"$WORK/contacts\"\nallow = [\"$HOST\"]," \
    -e "/^peer = \"$HOST:$PORT_CALLER\"/d" "$WORK/gateway.toml"
start_gateway_as_shipped

before=$(processor)
run_phones "$PHONES" $AT_FIRST || fail "the phones cannot register: exit status $?"
tell "phones registered" "$(contacts)" ''
tell "  processor time of the first registration, at $AT_FIRST a second" "$(divided $(($(processor) - before)) "$PHONES")" us
before=$(processor)
started=$EPOCHREALTIME
run_phones $((PER_SECOND * SECONDS_OF_REFRESHING)) "$PER_SECOND" || fail "the phones cannot refresh: exit status $?"
used=$(($(processor) - before))
tell "processor time of a refresh, at $PER_SECOND a second" "$(divided $used $((PER_SECOND * SECONDS_OF_REFRESHING)))" us
tell "  the share of a processor" "$(share $used "$started" "$EPOCHREALTIME")" '%'

run_phones $((PER_SECOND * 5)) "$PER_SECOND" &
background=($!)
sleep 2
kill -KILL $gateway_pid
{ wait $gateway_pid; } 2>/dev/null
started=$EPOCHREALTIME
start_gateway_as_shipped
tell "listens again after" "$(awk -v a="$started" -v b="$EPOCHREALTIME" 'BEGIN { printf "%.2f", b - a }')" s
wait "${background[0]}" # who was asked by the one that was killed is asked once more, which a phone obeys and SIPp does not
background=()
[[ $(contacts) == "$PHONES" ]] || fail "$(contacts) of $PHONES phones are known to the gateway that was started again"
PORT_B=$PORT_A PORT_CALLEE=$PORT_CALLER start_callee callee -m "$CALLS"
PORT_A=$PORT_B PORT_CALLER=$PORT_CALLEE expect_caller call_phone x -inf "$WORK/called.csv" -m "$CALLS" -r 50
kill $callee_pid # which counts what it was sent again as a failure of its own
wait $callee_pid 2>/dev/null
callee_pid=0
tell "phones called after that, none out of reach" "$CALLS" ''
end_gateway
finish
