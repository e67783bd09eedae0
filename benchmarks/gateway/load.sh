# A gateway under load: processor time of a call at a low and at a high rate, a rate that it must hold for a while, many calls up at
# once, and what memory is left after many calls. SIPp is the peers, on the same machine: its time is not counted, and tells how fast
# the machine was meanwhile.
#
#     bash benchmarks/gateway/load.sh GATEWAY PORT [PART]...        # parts: cost evidence rate up growth; all of them without
. "$(dirname "${BASH_SOURCE[0]}")/../../gateway/tests/lib.bash"
. "$(dirname "${BASH_SOURCE[0]}")/measure.bash"
PORT_METRICS=$((PORT + 30))
SIPP_TIMEOUT=900s
LOG_LEVEL=info
BUFFER=4194304     # octets of SIPp's sockets; with its own choice they lose what comes while it does not run
EVERYTHING_OVER=40 # seconds after which no transaction is left

# of_screen WORDS: the last figure of such a line of the caller's last screen
of_screen() { grep -F "$1" "$WORK/caller.out" | tail -n 1 | grep -oE '[0-9]+' | tail -n 1; }
metric() { scrape 1 | awk -v name="callcontrol_gateway_$1" '$1 == name { print $2 }'; }

# datagrams that came faster than the gateway took them, so far
lost_by_gateway() {
    awk -v ports="$(printf '%04X %04X' $PORT_A $PORT_B)" '{ split($2, address, ":") } index(ports, address[2]) { sum += $NF } END { print sum + 0 }' /proc/net/udp
}

# note_children: processor time of what has run here and is over, in microseconds; not for a subshell, where that is nothing
note_children() {
    times >"$WORK/times"
    children=$(awk 'NR == 2 { for (i = 1; i <= 2; i++) { split($i, part, /[ms]/); sum += part[1] * 60 + part[2] } printf "%d", sum * 1e6 }' "$WORK/times")
}

# load CALLS PER-SECOND MILLISECONDS [COMMAND]...: that many calls of that length, however they end, and meanwhile the command
load() {
    local before started lost background_pid=0
    HELD=$3
    start_callee callee -m "$1" -l 1000000 -buff_size $BUFFER
    note_children
    lost=$(lost_by_gateway)
    of_peers=$children
    before=$(processor)
    started=$EPOCHREALTIME
    (($# < 4)) || { "${@:4}" & background_pid=$!; }
    run_caller caller 4989123 -m "$1" -r "$2" -l 1000000 -buff_size $BUFFER
    seconds=$(awk -v a="$started" -v b="$EPOCHREALTIME" -v held="$3" 'BEGIN { print b - a - held / 1000 }')
    used=$(($(processor) - before))
    failed=$(of_screen "Failed call")
    ((background_pid == 0)) || wait $background_pid
    kill $callee_pid 2>/dev/null
    wait $callee_pid 2>/dev/null
    callee_pid=0
    note_children
    of_peers=$((children - of_peers))
    tell "$1 calls at $2 a second: failed" "$failed" ''
    tell "  a second that SIPp came to" "$(divided "$1" "$seconds")" ''
    tell "  repeated by SIPp's calling side" "$(awk '/ (INVITE|BYE) -+>/ { sum += $4 } END { print sum + 0 }' "$WORK/caller.out")" ''
    tell "  datagrams that found the gateway's sockets full" $(($(lost_by_gateway) - lost)) ''
    tell "  processor time of 1,000 calls" "$(divided "$used" "$1")" ms
    tell "  of SIPp's both sides, for comparison" "$(divided "$of_peers" "$1")" ms
}

cost() {
    load 300 100 100 >/dev/null
    load 3000 100 100
    load 15000 1000 100
}

# what records, figures that are asked for once a second, and a capture server cost together, beside a gateway without these
start_server() {
    python3 -c 'import socket, sys
server = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
server.bind((sys.argv[1], int(sys.argv[2])))
while True: server.recv(65536)' "$HOST" $((PORT + 29)) &
    background=($!)
    wait_for_port $! $((PORT + 29)) udp || fail "no capture server"
}
ask_for_figures() {
    local i
    for ((i = 0; i < 10; i++)); do
        scrape 1 >"$WORK/figures.log"
        sleep 1
    done
}
restart_with() { # LINES
    end_gateway
    configure '' "$1"
    [[ -n $1 ]] || sed -i '/^\[records\]/,$d' "$WORK/gateway.toml"
    start_gateway_as_shipped
    load 300 100 100 >/dev/null
}
evidence() {
    local round without=0 all=0
    start_server
    for round in 1 2 3; do
        restart_with ''
        load 5000 500 100 >/dev/null
        without=$((without + used))
        restart_with $'[capture]\nserver = "'"$HOST:$((PORT + 29))"'"'
        load 5000 500 100 ask_for_figures >/dev/null
        all=$((all + used))
    done
    kill "${background[0]}"
    background=()
    tell "processor time of 1,000 calls at 500 a second" "$(divided $without 15000)" ms
    tell "  with records, figures and capture" "$(divided $all 15000)" ms
    tell "  more by" "$(awk -v a=$without -v b=$all 'BEGIN { printf "%.1f", 100 * (b - a) / a }')" '%'
}
rate() { load 120000 2000 100; }
up() {
    local before
    before=$(memory)
    load 20000 400 110000 tell_of_calls "$before"
}
tell_of_calls() { # MEMORY-BEFORE
    sleep 52 # all are up, and of those of the last 32 seconds the transactions last
    tell "calls up at the same time" "$(metric pool_most_calls)" ''
    tell "  memory of a call, six tenths of which have transactions" "$(divided $((($(memory) - $1) * 1024)) 20000)" octets
    sleep $EVERYTHING_OVER
    tell "  when the transactions are over" "$(divided $((($(memory) - $1) * 1024)) 20000)" octets
}
memory_after() {
    sleep $EVERYTHING_OVER
    memory
}
growth() {
    local first last
    load 20000 1000 100 >/dev/null
    first=$(memory_after)
    load 180000 1000 100
    last=$(memory_after)
    tell "memory after 20,000 calls" "$first" KiB
    tell "memory after 200,000 calls" "$last" KiB
    tell "  more by" "$(awk -v a="$first" -v b="$last" 'BEGIN { printf "%.1f", 100 * (b - a) / a }')" '%'
}

parts=("${@:3}")
((${#parts[@]} > 0)) || parts=(cost evidence rate up growth)
for part in "${parts[@]}"; do
    configure ''
    start_gateway_as_shipped
    "$part"
    end_gateway
done
