# What the ISDN tests share, beside lib.bash: a gateway with a SIP interface a and a primary-rate line, and the exchange at
# its other end. A test is called as
#
#     bash sip_to_isdn.sh GATEWAY PORT EXCHANGE

. "$(dirname "${BASH_SOURCE[0]}")/../lib.bash"
EXCHANGE=$3
LINE=$WORK/line
CAPTURE=$WORK/line.pcap
exchange_pid=0
trap '((exchange_pid > 0)) && kill -KILL $exchange_pid 2>/dev/null; cleanup' EXIT

# write_isdn_configuration [LINES-OF-LINE [LINES-OF-SIP]]
write_isdn_configuration() {
    cat >"$WORK/gateway.toml" <<END
[gateway]
call-control-log-level = 2

[media]
mode = "relay"
first-port = $((PORT + 8))
last-port = $((PORT + 15))

[[sip]]
name = "a"
listen = "$HOST:$PORT_A"
peer = "$HOST:$PORT_CALLER"
${2:-}

[[isdn]]
name = "b"
line = "$LINE"
${1:-}
[isdn.timers]
reopening = 50
t200 = 200

[[route]]
from = "a"
prefix = "49"
to = "b"

[[route]]
from = "b"
to = "a"
END
}

# start_exchange: by the plan on standard input
start_exchange() {
    {
        echo "line = \"$LINE\""
        echo "capture = \"$CAPTURE\""
        cat
    } >"$WORK/plan.toml"
    : >"$WORK/exchange.out"
    "$EXCHANGE" "$WORK/plan.toml" >"$WORK/exchange.out" 2>"$WORK/exchange.log" &
    exchange_pid=$!
    local i
    for ((i = 0; i < 100; i++)); do
        grep -q listens "$WORK/exchange.out" && return 0
        sleep 0.05
    done
    fail "the exchange does not start"
}

# start_isdn_gateway: with the line up
start_isdn_gateway() {
    "$GATEWAY" --config "$WORK/gateway.toml" --trace-calls 1 --log-level debug >"$WORK/gateway.out" 2>"$WORK/gateway.err" &
    gateway_pid=$!
    wait_for_port $gateway_pid "$PORT_A" udp || fail "the gateway does not listen"
    expect_log 'interface b: the link is up'
}

# stop_exchange: with its report
stop_exchange() {
    kill -TERM $exchange_pid
    wait $exchange_pid || fail "exchange: exit status $?"
    exchange_pid=0
}

# expect_report LINE: of the exchange
expect_report() {
    grep -qxF "exchange: $1" "$WORK/exchange.out" || fail "the exchange does not report: $1, but $(cat "$WORK/exchange.out")"
}

# await_wire FILTER: until the exchange has seen such a message
await_wire() {
    local i
    for ((i = 0; i < 50; i++)); do
        [[ -n $(tshark -r "$CAPTURE" -Y "$1" 2>/dev/null) ]] && return 0
        sleep 0.1
    done
    fail "the exchange sees nothing of $1"
}

# expect_wire FILTER FIELD VALUE [TIMES]: what another reader finds in that field of the messages that the filter takes
expect_wire() {
    local found count
    found=$(tshark -r "$CAPTURE" -Y "$1" -T fields -e "$2" 2>/dev/null)
    count=$(grep -cxF -- "$3" <<<"$found")
    ((count == ${4:-1})) || fail "on the wire, of $1: $2 is '$found' instead of '$3'"
}

# expect_wellformed: it finds no fault with any frame, and there are some. It takes the operations of EuroISDN's services,
# which EN 300 182-1 and EN 300 207-1 number, for those of another protocol, QSIG, so what it says of these is not asked.
expect_wellformed() {
    local frames faults
    frames=$(tshark -r "$CAPTURE" -Y q931 2>/dev/null | wc -l)
    faults=$(tshark -r "$CAPTURE" -Y '(_ws.malformed || _ws.expert.severity == error) && !qsig' -V 2>/dev/null)
    ((frames > 0)) && [[ -z $faults ]] || fail "$frames messages on the wire, with faults: ${faults:0:3000}"
}

# expect_isdn_causes CALL CAUSE: of a call from SIP, at its two legs
expect_isdn_causes() {
    expect_log "call $1 a \(calling side\) released: cause $2 "
    expect_log "b \(called side, timeslot 1\) released: cause $2 "
}
