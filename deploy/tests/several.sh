# Three gateways behind the packaged proxy, as deploy/ has them, with calls all the while. One is killed: its own calls end, and
# no others. One is drained and started anew, and one is added: no call is lost. Prometheus has the figures of them all, and one
# database the records of their calls.
#
#     bash several.sh GATEWAY PORT GATEWAYCTL [CALLS-PER-SECOND [SECONDS]]
#
# with the executables, the first of 32 ports, and for how long calls go on between these events.
. "$(dirname "${BASH_SOURCE[0]}")/../../gateway/tests/lib.bash"
. "$HERE/certificates.bash"
. "$HERE/postgresql.bash"
CTL=$3
RATE=${4:-30}
SECONDS_EACH=${5:-0.5}
TESTS=$(dirname "${BASH_SOURCE[0]}")
HOLD=600 # milliseconds
# beside other tests nobody is to be taken for dead who only has to wait for a processor
SILENCE=4000 LATE=8
[[ -z ${4:-} ]] || SILENCE=2000 LATE=1
DEPLOY=$HERE/../../deploy
BALANCER_TRUNK=$HOST:$PORT
BALANCER_OFFICE=$HOST:$((PORT + 1))
PROVIDER=$HOST:$((PORT + 2))
EXCHANGE=$HOST:$((PORT + 3))
trunk_of() { echo "$HOST:$((PORT + 4 + 2 * $1))"; }
office_of() { echo "$HOST:$((PORT + 5 + 2 * $1))"; }
metrics_of() { echo "$HOST:$((PORT + 13 + $1))"; }
PROMETHEUS=$HOST:$((PORT + 18))
exporter_of() { echo "$HOST:$((PORT + 18 + $1))"; }
declare -A gateways # their processes, by number

# here SED-EXPRESSION...: a file of deploy/ with the addresses and folders of this test
here() {
    sed -e "s/192\.0\.2\.1:5060/$BALANCER_TRUNK/g; s/10\.0\.0\.1:5060/$BALANCER_OFFICE/g" \
        -e "s/192\.0\.2\.100:5060/$PROVIDER/g; s/10\.0\.0\.100:5060/$EXCHANGE/g" \
        -e "$(for n in 1 2 3 4; do echo "s/192\.0\.2\.2$n:5060/$(trunk_of $n)/g; s/10\.0\.0\.2$n:5060/$(office_of $n)/g"; done)" "$@"
}
# expect_soon WHAT SECONDS COMMAND...: it succeeds within the time
expect_soon() {
    local what=$1 end=$((SECONDS + $2 + 1))
    until "${@:3}"; do
        ((SECONDS < end)) || fail "not within $2 s: $what"
        sleep 0.05
    done
}
now() { date +%s.%N; }

start() { # NUMBER, after the file of that number or, for the fourth, the first
    local folder=$WORK/$1 source=$1
    mkdir -p "$folder"
    [[ -f $DEPLOY/gateways/gateway-$1.toml ]] || source=1
    sed "s/\.2$source:/.2$1:/" "$DEPLOY/gateways/gateway-$source.toml" |
        here -e "s#/var/lib/callcontrol-gateway\|/run/callcontrol-gateway\|/var/log/callcontrol-gateway#$folder#" \
            -e "s/127\.0\.0\.1:9160/$(metrics_of "$1")/" -e "s/^# postgresql = .*/postgresql = \"$POSTGRESQL\"/; s/^# spool/spool/" \
            >"$folder/gateway.toml"
    "$GATEWAY" --config "$folder/gateway.toml" --log-level warning >>"$folder/out" 2>>"$WORK/gateway-$1.log" &
    gateways[$1]=$!
    background+=($!)
    local address
    for address in "$(trunk_of "$1")" "$(office_of "$1")"; do
        wait_for_port "${gateways[$1]}" "${address#*:}" udp || fail "gateway $1 does not listen"
    done
}
start_exporter() { # NUMBER: what hands on the figures of a gateway's machine
    sed "s/9160/$((PORT + 13 + $1))/" "$DEPLOY/prometheus/exporter-exporter.yml" >"$WORK/exporter-$1.yml"
    prometheus-exporter-exporter -config.file "$WORK/exporter-$1.yml" -web.listen-address= -web.tls.listen-address "$(exporter_of "$1")" \
        -web.tls.verify -web.tls.ca "$TLS/ca.pem" -web.tls.cert "$TLS/gateway.pem" -web.tls.key "$TLS/gateway.key" >"$WORK/exporter-$1.log" 2>&1 &
    background+=($!)
}
ask() { "$CTL" --socket "$WORK/$1/control" "${@:2}"; } # NUMBER COMMAND...
# which takes 64 times T1 where a machine that stood still had two gateways answer one call
has_no_calls() { ask "$1" status | grep -qx 'calls  *0'; }
ended() { # NUMBER: by itself, with nothing left over
    local status=0
    wait "${gateways[$1]}" || status=$?
    ((status == 0)) && tail -n 1 "$WORK/$1/out" | grep -q ', 0 left over$' ||
        fail "gateway $1: exit status $status, $(tail -n 1 "$WORK/$1/out")"
}

rpc() { kamcmd -s "unix:$WORK/kamailio_ctl" "$@"; }
state_is() { # NUMBER STATE: how the balancer sees it on both sides
    rpc dispatcher.list >"$WORK/list" && local address &&
        for address in "$(trunk_of "$1")" "$(office_of "$1")"; do
            grep -A 1 "URI: sip:$address\$" "$WORK/list" | grep -q "FLAGS: $2" || return 1
        done
}
answered() { ask "$1" stats | awk '$1 == "answered" { print $2 }'; }
takes_calls() { (($(answered "$1") + 0 >= ${2:-1})); } # NUMBER [CALLS]
# go_on: calls are placed for a while
go_on() { sleep "$SECONDS_EACH"; }

# call LOG ADDRESS [ARGUMENT]...: calls of the provider's by the balancer, at that address
call() {
    exec sipp "$2" -rsa "$BALANCER_TRUNK" -sf "$TESTS/caller.xml" -s 4989123 -i "$HOST" -bind_local -p "${PROVIDER#*:}" -cp $((PORT + 5)) \
        -mp $((PORT + 24)) -nostdin -recv_timeout 20000 -trace_logs -log_file "$1" -trace_err -error_file "$WORK/caller.log" "${@:3}" \
        >"$WORK/caller.out" 2>&1
}
# figure PROMQL: its value now
figure() { python3 - "http://$PROMETHEUS/api/v1/query" "$1" 2>"$WORK/figure.log" <<'END_OF_QUERY'; }
import json, sys, urllib.parse, urllib.request
answer = json.load(urllib.request.urlopen(f"{sys.argv[1]}?{urllib.parse.urlencode({'query': sys.argv[2]})}", timeout=10))
print(*(sample["value"][1] for sample in answer["data"]["result"]))
END_OF_QUERY
figure_is() { [[ $(figure "$1") == "$2" ]]; }

# strangers_see_figures: whether the figures are shown to who has no certificate
strangers_see_figures() { python3 - "https://$(exporter_of 1)/proxy?module=callcontrol-gateway" 2>"$WORK/stranger.log" <<'END_OF_SCRAPE'; }
import ssl, sys, urllib.request
urllib.request.urlopen(sys.argv[1], context=ssl._create_unverified_context(), timeout=10).read()
END_OF_SCRAPE

start_balancer() {
    here "$DEPLOY/kamailio/dispatcher.list" | sed "/^1 sip:$(trunk_of 1) /s/rweight=10/rweight=20/" >"$WORK/dispatcher.list"
    kamailio -DD -E -f "$DEPLOY/kamailio/kamailio.cfg" -Y "$WORK" -m 256 -M 4 -A "TRUNK=udp:$BALANCER_TRUNK" -A "OFFICE=udp:$BALANCER_OFFICE" \
        -A "LIST=\"$WORK/dispatcher.list\"" -A "CONTROL=\"unix:$WORK/kamailio_ctl\"" -A PROBE=1 -A SILENCE=$SILENCE >"$WORK/kamailio.log" 2>&1 &
    kamailio_pid=$!
    trap 'kill -TERM $kamailio_pid 2>/dev/null; wait $kamailio_pid; end_server; cleanup' EXIT # its processes end with it
}
start_prometheus() {
    mkdir "$WORK/prometheus"
    cp "$DEPLOY/../gateway/deploy/prometheus/alerts.yml" "$WORK/prometheus"
    sed "$(for n in 1 2 3; do echo "s/10\.0\.0\.2$n:9998/$(exporter_of $n)/"; done)" "$DEPLOY/prometheus/gateways.yml" >"$WORK/prometheus/gateways.yml"
    sed "s#/etc/prometheus/gateways#$TLS#; s/15s/1s/" "$DEPLOY/prometheus/prometheus.yml" >"$WORK/prometheus/prometheus.yml"
    prometheus --config.file="$WORK/prometheus/prometheus.yml" --storage.tsdb.path="$WORK/prometheus/data" \
        --log.level=warn --web.listen-address="$PROMETHEUS" >"$WORK/prometheus.log" 2>&1 &
    background+=($!)
}

make_server
start_server
trap 'end_server; cleanup' EXIT
make_certificate ca ca
make_certificate gateway ca "IP:$HOST"
make_certificate prometheus ca
start_prometheus
start_balancer
for n in 1 2 3; do
    start $n
    start_exporter $n
done
sipp "$BALANCER_OFFICE" -sf "$TESTS/callee.xml" -i "$HOST" -bind_local -p "${EXCHANGE#*:}" -cp $((PORT + 4)) -mp $((PORT + 28)) -nostdin \
    -trace_err -error_file "$WORK/callee.err" >"$WORK/callee.out" 2>&1 &
background+=($!)
wait_for_port $! "${EXCHANGE#*:}" udp || fail "the exchange does not start"
for n in 1 2 3; do expect_soon "gateway $n is probed" 20 state_is $n AP; done

call "$WORK/calls" "$BALANCER_TRUNK" -r "$RATE" -l 10000 -d "$HOLD" &
caller=$!
background+=($caller)
for n in 1 2 3; do expect_soon "gateway $n has calls" 10 takes_calls $n; done
go_on

killed=$(now)
{ kill -KILL "${gateways[3]}" && wait "${gateways[3]}"; } 2>/dev/null
expect_soon "the balancer takes out who is gone" 20 state_is 3 I
go_on

ask 2 drain || fail "gateway 2 does not drain"
expect_soon "the calls of gateway 2 are over" 60 has_no_calls 2
ask 2 shutdown || fail "gateway 2 does not end"
ended 2
start 2
expect_soon "gateway 2 is probed again" 20 state_is 2 A
expect_soon "gateway 2 has calls again" 20 takes_calls 2
go_on

start 4
start_exporter 4
added=$(now)
sed -i "/sip:$(trunk_of 3) /d; /sip:$(office_of 3) /d" "$WORK/dispatcher.list"
echo "1 sip:$(trunk_of 4) 9 0 rweight=10;socket=udp:$BALANCER_TRUNK
2 sip:$(office_of 4) 9 0 rweight=10;socket=udp:$BALANCER_OFFICE" >>"$WORK/dispatcher.list"
rpc dispatcher.reload >"$WORK/rpc.log" 2>&1 || fail "kamailio does not read its list again"
sed -i 's/\]/, "'"$(exporter_of 4)"'"]/' "$WORK/prometheus/gateways.yml"
expect_soon "gateway 4 is probed" 20 state_is 4 A
settled=$(now)
expect_soon "gateway 4 has its share of a hundred calls and more" 60 takes_calls 4 27
[[ -z ${5:-} ]] || go_on

kill -USR1 $caller # no further calls
expect_soon "the last call is over" 60 eval "! kill -0 $caller 2>/dev/null"
# what is for a gateway itself, as an INVITE that replaces a dialog of its, goes there
(call "$WORK/calls_of_2" "$(trunk_of 2)" -m 6 -d 1) || fail "calls for one gateway: exit status $?"
(($(grep -c "^up .* $(trunk_of 2)\$" "$WORK/calls_of_2") == 6)) || fail "calls for one gateway do not all go there"
for n in 1 2 4; do expect_soon "gateway $n has no calls" 60 has_no_calls $n; done
expect_soon "Prometheus knows of all gateways" 20 figure_is 'count(up)' 4
expect_soon "Prometheus sees three of them" 20 figure_is 'sum(up)' 3
for n in 1 4; do
    expect_soon "Prometheus has the calls of gateway $n" 20 \
        figure_is "callcontrol_gateway_calls_answered_total{instance=\"$(exporter_of $n)\"}" "$(answered $n)"
done
strangers_see_figures && fail "figures are told to whoever asks"
grep -qi 'alert bad certificate\|certificate required' "$WORK/stranger.log" || fail "not for want of a certificate: $(tail -n 1 "$WORK/stranger.log")"
for n in 1 2 4; do
    ask $n shutdown || fail "gateway $n does not end"
    ended $n
done
sql "select leg->>'id' from call_record, jsonb_array_elements(record->'legs') leg where record->>'answeredAfter' is not null" >"$WORK/recorded"
python3 "$TESTS/lost.py" "$WORK/calls" "$WORK/recorded" "$killed" "$added" "$settled" "$(trunk_of 1)" "$(trunk_of 3)" "$(trunk_of 4)" $LATE ||
    fail "calls were lost, not shared out, or not recorded"
finish
