#!/usr/bin/env bash
# Fifty SIP calls through the gateway on loopback, with what it shows of them:
#
#     gateway/demo.sh BUILD_DIRECTORY [--calls N] [--rate R]
#
# SIPp places the calls on interface a and takes them on interface b. Exit status 0 only if SIPp's numbers and the
# gateway's agree that every call was answered and cleared and that nothing is left over.
set -uo pipefail

HERE=$(cd "$(dirname "${BASH_SOURCE[0]}")" && pwd)
HOST=127.0.0.1
. "$HERE/tests/ports.bash"

complain() {
    echo "demo: $*" >&2
    exit 1
}

build=${1:-}
[[ -n $build && $build != --* ]] || complain "usage: demo.sh BUILD_DIRECTORY [--calls N] [--rate R]"
shift
calls=50
rate=20
while (($# > 0)); do
    [[ ${2:-} =~ ^[1-9][0-9]*$ ]] || complain "$1 needs a number above 0"
    case $1 in
    --calls) calls=$2 ;;
    --rate) rate=$2 ;;
    *) complain "unknown option $1" ;;
    esac
    shift 2
done
hold=$((15000 / rate > 1500 ? 15000 / rate : 1500)) # milliseconds that each call is up, so that 15 are at once
timeout=$((calls / rate + hold / 1000 + 20))
gateway=$build/gateway/callcontrol-gateway
[[ -x $gateway ]] || complain "there is no $gateway: build it first"
command -v sipp >/dev/null || complain "SIPp is missing: install sip-tester"

WORK=$(mktemp -d "${TMPDIR:-/tmp}/gateway-demo.XXXXXX")
pids=()
cleanup() {
    local pid
    for pid in ${pids[@]+"${pids[@]}"}; do
        kill -KILL "$pid" 2>/dev/null
    done
    { wait; } 2>/dev/null
    rm -rf "$WORK"
}
trap cleanup EXIT
trap 'exit 1' INT TERM HUP

failed() {
    local file
    for file in "$WORK"/gateway.err "$WORK"/*.log; do
        [[ -s $file ]] && tail -n 20 "$file" >&2
    done
    complain "$*"
}

# Twenty ports in a row that nobody has; the system hands out none below 32768 by itself.
find_ports() {
    local base port
    for base in $(shuf -i 1300-1590 -n 40); do
        for ((port = base * 20; port < base * 20 + 20; port++)); do
            grep -qi "$(printf ':%04X 00000000:0000' "$port")" /proc/net/udp /proc/net/tcp && continue 2
        done
        PORT=$((base * 20))
        return 0
    done
    complain "no free ports"
}
find_ports

cat >"$WORK/gateway.toml" <<END
[gateway]
clear-after = 2
max-calls = 0
max-calls-per-second = 0
max-calls-per-source = 0

[[sip]]
name = "a"
listen = "$HOST:$PORT"
peer = "$HOST:$((PORT + 1))"

[[sip]]
name = "b"
listen = "$HOST:$((PORT + 2))"
peer = "$HOST:$((PORT + 3))"

[[route]]
from = "a"
to = "b"
END
"$gateway" --config "$WORK/gateway.toml" --trace-calls 1 --log-level debug >"$WORK/gateway.out" 2>"$WORK/gateway.err" &
gateway_pid=$!
pids+=($gateway_pid)
for port in $PORT $((PORT + 2)); do
    wait_for_port $gateway_pid "$port" udp || failed "the gateway does not listen"
done

sipp -sn uas -i $HOST -bind_local -p $((PORT + 3)) -cp $((PORT + 4)) -mp $((PORT + 6)) -nostdin -m "$calls" \
    -timeout ${timeout}s -timeout_error -trace_err -error_file "$WORK/callee.log" >"$WORK/callee.out" 2>&1 &
callee_pid=$!
pids+=($callee_pid)
wait_for_port $callee_pid $((PORT + 3)) udp || failed "the called side does not start"
sipp $HOST:$PORT -sn uac -s 4989123 -i $HOST -bind_local -p $((PORT + 1)) -cp $((PORT + 5)) -mp $((PORT + 12)) -nostdin \
    -m "$calls" -r "$rate" -l "$calls" -d $hold -timeout ${timeout}s -timeout_error -trace_stat -stf "$WORK/stat.csv" -fd 1 \
    -trace_err -error_file "$WORK/caller.log" >"$WORK/caller.out" 2>&1 &
caller_pid=$!
pids+=($caller_pid)

# the tree is shown when as many calls are up as there will be
want=$((calls < 10 ? calls : 10))
for ((i = 0; i < 20 * timeout; i++)); do
    kill -0 $caller_pid 2>/dev/null || break
    kill -USR1 $gateway_pid
    sleep 0.05
    (($(grep -c '^counters: ' "$WORK/gateway.out") > 0)) && up=$(tail -n 1 "$WORK/gateway.out" | sed -n 's/.*, \([0-9]*\) up$/\1/p')
    ((${up:-0} >= want)) && break
done
caller_status=0 callee_status=0 gateway_status=0
wait $caller_pid || caller_status=$?
wait $callee_pid || callee_status=$?
kill -USR1 $gateway_pid
sleep 0.1
kill -TERM $gateway_pid
wait $gateway_pid || gateway_status=$?
pids=()

# --- what there is to see ---------------------------------------------------------------------------------------------
# state N: the N-th report of the gateway's state; 'last' for the last one
state() {
    awk -v wanted="$1" '
        /^state: / { inside = 1; text = "" }
        inside { text = text $0 "\n" }
        /^counters: / && inside { inside = 0; reports[++count] = text }
        END { printf "%s", reports[wanted == "last" ? count : wanted] }' "$WORK/gateway.out"
}
echo "== The first call"
awk '/^call 1, / { inside = 1; print; next } inside && /^ / { print; next } { inside = 0 }' "$WORK/gateway.out"
echo
echo "== The calls that were up"
reports=$(grep -c '^counters: ' "$WORK/gateway.out")
state $((reports - 1))
echo
echo "== The pool when all were over"
state last
echo
echo "== The lock on reloads"
grep 'reload lock' "$WORK/gateway.err"
echo

# --- the numbers, of both -------------------------------------------------------------------------------------------
((caller_status == 0)) || failed "the calling side ended with status $caller_status"
((callee_status == 0)) || failed "the called side ended with status $callee_status"
((gateway_status == 0)) || failed "the gateway ended with status $gateway_status"
column() {
    awk -F';' -v name="$1" 'NR == 1 { for (i = 1; i <= NF; i++) if ($i == name) wanted = i } END { print $wanted }' \
        "$WORK/stat.csv"
}
read -r placed answered cleared missed left < <(sed -n \
    's/^gateway: \([0-9]*\) calls placed, \([0-9]*\) answered, \([0-9]*\) cleared, \([0-9]*\) failed, \([0-9]*\) left over$/\1 \2 \3 \4 \5/p' \
    "$WORK/gateway.out")
[[ -n ${left:-} ]] || failed "the gateway printed no counters"
successful=$(column 'SuccessfulCall(C)')
unsuccessful=$(column 'FailedCall(C)')
most=$(state last | sed -n 's/^pool: .* at most \([0-9]*\) at once.*/\1/p')
echo "SIPp: $(column 'TotalCallCreated') placed, $successful successful, $unsuccessful failed; at most $most at once"
echo "calls: $placed placed, $answered answered, $cleared cleared, $((missed > unsuccessful ? missed : unsuccessful)) failed, $left left over"
((placed == calls && answered == calls && cleared == calls && missed == 0 && left == 0)) || exit 1
((successful == calls && unsuccessful == 0 && most >= want)) || exit 1
