# How long the signalling loop is busy at once, by processor time: what else the machine does meanwhile does not count. Sourced after
# lib.bash; watch_turns before the gateway starts, expect_short_turns before it ends.
PORT_TURNS=$((PORT + 31))
LONGEST_TURN=0.005 # seconds, a bound of the histogram
grep -qaE '__(asan|tsan)_init' "$GATEWAY" && LONGEST_TURN=0.02 # with a sanitizer all takes several times as long

watch_turns() { printf '\n[metrics]\nlisten = "%s:%d"\n' "$HOST" $PORT_TURNS >>"$WORK/gateway.toml"; }
expect_short_turns() {
    python3 -c 'import sys, urllib.request as r; sys.stdout.buffer.write(r.urlopen(sys.argv[1], timeout=20).read())' \
        "http://$HOST:$PORT_TURNS/metrics" | grep '^callcontrol_gateway_loop_turn_seconds' >"$WORK/turns"
    awk -v longest="$LONGEST_TURN" '
        index($1, "le=\"" longest "\"") { short = $2 }
        index($1, "_count") { all = $2 }
        END { exit !(all > 0 && short == all) }' "$WORK/turns" || fail "a turn took longer than $LONGEST_TURN s: $(<"$WORK/turns")"
}
