# Requests as datagrams of our own making, for what SIPp does not send; sourced after lib.bash.

# parts METHOD CALL [HEADER]...: the headers of a request outside of dialogs; CALL is its Call-ID and tag.
parts() {
    printf 'Via: SIP/2.0/UDP %s:9;rport;branch=z9hG4bK%s\r\nFrom: <sip:4420@%s>;tag=%s\r\nTo: <sip:4989123@%s>\r\n' \
        "$HOST" "$RANDOM$RANDOM" "$HOST" "$2" "$HOST"
    printf 'Call-ID: %s\r\nCSeq: 1 %s\r\nContact: <sip:4420@%s>\r\n' "$2" "$1" "$HOST"
    (($# < 3)) || printf '%s\r\n' "${@:3}"
}
# request METHOD URI [HEADER]...
request() {
    printf '%s %s SIP/2.0\r\n' "$1" "$2"
    parts "$1" "c$RANDOM$RANDOM" "${@:3}"
    printf '\r\n'
}
statuses() { tr -d '\r' <"$WORK/answer.log" | awk '/^SIP\/2.0 / { printf "%s ", $2 }'; }
# ask SECONDS COMMAND...: sends what it prints as one datagram to interface a; the answers of that time go to answer.log,
# their statuses to the standard output, in a line. SECONDS/NUMBER: so many answers are enough, and nothing in the 0.2 s
# after them.
ask() {
    exec 3<>"/dev/udp/$HOST/$PORT_A" || fail "no socket"
    "${@:2}" >"$WORK/datagram"
    cat "$WORK/datagram" >&3
    timeout "${1%/*}" cat <&3 >"$WORK/answer.log" &
    local reader=$! found
    while [[ $1 == */* ]] && kill -0 $reader 2>/dev/null; do
        read -ra found <<<"$(statuses)"
        ((${#found[@]} >= ${1#*/})) && sleep 0.2 && kill $reader && break
        sleep 0.02
    done
    wait $reader 2>/dev/null
    exec 3>&-
    statuses
}
# expect_answer STATUSES [REGEXP]... -- COMMAND...: those and no other, with lines that match
expect_answer() {
    local expected answers lines=()
    read -ra expected <<<"$1"
    shift
    while [[ $1 != -- ]]; do
        lines+=("$1")
        shift
    done
    answers=$(ask 5/${#expected[@]} "${@:2}")
    [[ $answers == "${expected[*]} " ]] || fail "answers '$answers' instead of '${expected[*]}' to: ${*:2}"
    local line
    for line in ${lines[@]+"${lines[@]}"}; do
        tr -d '\r' <"$WORK/answer.log" | grep -qE -- "$line" || fail "no line of the answer matches: $line"
    done
}
