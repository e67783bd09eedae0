# What the SIP tests share: a gateway and SIPp peers on ports of the test's own, and checks. A test is called as
#
#     bash answered.sh GATEWAY PORT
#
# with the executable and the first of 32 ports, sources this file, and ends with `finish`.
set -uo pipefail

GATEWAY=$1
PORT=$(($2 + ${GATEWAY_TEST_PORT_OFFSET:-0}))
HERE=$(dirname "${BASH_SOURCE[0]}")
WORK=$(mktemp -d "${TMPDIR:-/tmp}/gateway-test.XXXXXX")
HOST=127.0.0.1
PORT_A=$PORT           # the gateway's interface a, its peer, and what SIPp needs besides
PORT_CALLER=$((PORT + 1))
PORT_B=$((PORT + 2))   # the gateway's interface b, its peer
PORT_CALLEE=$((PORT + 3))
gateway_pid=0
callee_pid=0
background=()

. "$HERE/ports.bash"
. "$HERE/scenario.bash"

fail() {
    echo "FAILED: $*"
    local file
    for file in "$WORK"/gateway.out "$WORK"/gateway.err "$WORK"/*.log; do
        [[ -s $file ]] && echo "--- ${file##*/}" && tail -n 60 "$file"
    done
    exit 1
}

cleanup() {
    local pid
    for pid in "$gateway_pid" "$callee_pid" ${background[@]+"${background[@]}"}; do
        ((pid > 0)) && kill -KILL "$pid" 2>/dev/null
    done
    { wait; } 2>/dev/null
    rm -rf "$WORK"
}
trap cleanup EXIT
trap 'exit 1' INT TERM

# write_configuration [LINES-OF-GATEWAY [LINES-OF-INTERFACE [PREFIX]]]
write_configuration() {
    cat >"$WORK/gateway.toml" <<END
[gateway]
call-control-log-level = 2
${1:-}

[[sip]]
name = "a"
listen = "$HOST:$PORT_A"
peer = "$HOST:$PORT_CALLER"
${2:-}

[[sip]]
name = "b"
listen = "$HOST:$PORT_B"
peer = "$HOST:$PORT_CALLEE"
${2:-}

[[route]]
from = "a"
prefix = "${3:-}"
to = "b"

[[route]]
from = "b"
to = "a"
END
}

# relay_media: where a test is to be of that, RELAYED is what every session description of the gateway has
relay_media() {
    [[ -n ${RELAYED:-} ]] || return 0
    cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
first-port = $((PORT + 32))
last-port = $((PORT + 39))
END
}

# start_gateway [ARGUMENT]...: with the configuration written before; the first call, or as many as TRACED says, is traced,
# and the log is that of LOG_LEVEL.
start_gateway() {
    [[ -f $WORK/gateway.toml ]] || write_configuration
    "$GATEWAY" --config "$WORK/gateway.toml" --trace-calls "${TRACED:-1}" --log-level "${LOG_LEVEL:-debug}" "$@" >"$WORK/gateway.out" 2>"$WORK/gateway.err" &
    gateway_pid=$!
    local port transport
    for port in $PORT_A $PORT_B; do
        for transport in $(transports); do
            wait_for_port $gateway_pid "$port" "$transport" || fail "the gateway does not listen"
        done
    done
}

# transports: on which every interface of the configuration listens
transports() {
    local found
    found=$(grep -E '^transports? =' "$WORK/gateway.toml" | tail -n 1 | grep -oE '"(udp|tcp)"' | tr -d '"')
    echo "${found:-udp}"
}

# start_callee SCENARIO [ARGUMENT]...: SIPp as the peer of interface b, for one call unless the arguments say more.
start_callee() {
    write_scenario "$WORK/$1.xml" "$1"
    sipp "$HOST:$PORT_B" -sf "$WORK/$1.xml" -i "$HOST" -bind_local -p "$PORT_CALLEE" -cp $((PORT + 4)) -mp $((PORT + 10)) \
        -nostdin -m 1 -timeout ${SIPP_TIMEOUT:-20s} -timeout_error -trace_err -error_file "$WORK/callee.log" "${@:2}" >"$WORK/callee.out" 2>&1 &
    callee_pid=$!
    wait_for_port $callee_pid "$PORT_CALLEE" udp || fail "the callee does not start"
}

# run_caller SCENARIO NUMBER [ARGUMENT]...: SIPp as the peer of interface a, one call; its exit status.
run_caller() {
    write_scenario "$WORK/$1.xml" "$1"
    sipp "$HOST:$PORT_A" -sf "$WORK/$1.xml" -s "$2" -i "$HOST" -bind_local -p "$PORT_CALLER" -cp $((PORT + 5)) \
        -mp $((PORT + 20)) -nostdin -m 1 -timeout ${SIPP_TIMEOUT:-20s} -timeout_error -trace_err -error_file "$WORK/caller.log" "${@:3}" \
        >"$WORK/caller.out" 2>&1
}

# expect_caller SCENARIO NUMBER [ARGUMENT]...: the same, and it must succeed.
expect_caller() {
    run_caller "$@" || fail "caller $1: exit status $?"
}

expect_callee() {
    local status=0
    wait $callee_pid || status=$?
    callee_pid=0
    ((status == 0)) || fail "callee: exit status $status"
}

# expect_log REGEXP [TIMES]: so many lines of the gateway's log match.
expect_log() {
    local i count
    for ((i = 0; i < 200; i++)); do # a line may be on its way
        count=$(grep -cE -- "$1" "$WORK/gateway.err")
        ((count == ${2:-1})) && return 0
        sleep 0.05
    done
    fail "$count lines of the log instead of ${2:-1} match: $1"
}

# expect_causes CALL CAUSE [CAUSE-OF-CALLED-SIDE]: the Q.850 causes with which the two legs were released.
expect_causes() {
    expect_log "call $1 a \(calling side\) released: cause $2 "
    expect_log "call $1 b \(called side\) released: cause ${3:-$2} "
}

# expect_trace REGEXP: of the first call's ladder, which is printed when the call is done.
expect_trace() {
    local i
    for ((i = 0; i < 200; i++)); do
        grep -qE -- "$1" "$WORK/gateway.out" && return 0
        sleep 0.05
    done
    fail "no line of the trace matches: $1"
}

# tell_trace REGEXP: what matches first in the trace, for whoever looks on
tell_trace() { grep -oE -m 1 -- "$1" "$WORK/gateway.out"; }

# expect_no_calls SECONDS: after which no call is up any more
expect_no_calls() {
    local i
    for ((i = 0; i < $1 * 5; i++)); do
        kill -USR1 $gateway_pid
        sleep 0.2
        [[ $(grep -E '^state: ' "$WORK/gateway.out" | tail -n 1) == "state: 0 calls up" ]] && return 0
    done
    fail "$(grep -E '^state: ' "$WORK/gateway.out" | tail -n 1) after $1 s"
}

# expect_end COUNTERS: the gateway ends, by itself or when asked (stop_gateway), with status 0 and nothing left over.
expect_end() {
    local status=0
    wait $gateway_pid || status=$?
    gateway_pid=0
    ((status == 0)) || fail "gateway: exit status $status"
    grep -qxF "gateway: $1, 0 left over" "$WORK/gateway.out" || fail "the gateway's last line is not: gateway: $1, 0 left over"
}

stop_gateway() {
    kill -TERM $gateway_pid
    expect_end "$1"
}

finish() {
    echo "passed"
    exit 0
}
