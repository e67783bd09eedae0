# What an operator asks and has done over the local socket, while calls are up.
. "$(dirname "$0")/../lib.bash"
CTL=$3
export CALLCONTROL_GATEWAY_SOCKET=$WORK/control

# ask STATUS PATTERN COMMAND...: gatewayctl ends with that status, and a line of what it prints matches
ask() {
    local status=0
    "$CTL" "${@:3}" >"$WORK/ctl.log" 2>&1 || status=$?
    ((status == $1)) || fail "gatewayctl ${*:3}: exit status $status instead of $1"
    [[ -z $2 ]] || grep -qE -- "$2" "$WORK/ctl.log" || fail "gatewayctl ${*:3}: no line matches $2"
}
# until_asked PATTERN COMMAND...: the same, sooner or later
until_asked() {
    local i
    for ((i = 0; i < 100; i++)); do
        "$CTL" "${@:2}" 2>&1 | grep -qE -- "$1" && return 0
        sleep 0.05
    done
    fail "gatewayctl ${*:2}: no line matches $1: $("$CTL" "${@:2}" 2>&1)"
}
caller() {
    send_invite
    expect 100
    expect 200
    send_ack
    expect_request BYE Reason: 'Q.850;cause=31'
    respond_in_dialog "200 OK"
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE Reason: 'Q.850;cause=31'
    respond_in_dialog "200 OK"
}
turned_away() { send_invite; expect 100; expect 503; send_ack_of_failure; }
refused() { send_invite; expect 503; send_ack_of_failure; }
asking() { send_request OPTIONS; expect "$1"; }
blocked() { asking 503; }
served() { asking 200; }

ask 3 'No such file or directory' status
write_configuration
cat >>"$WORK/gateway.toml" <<END
[control]
socket = "$WORK/control"
mode = "0600"
END
start_gateway
ask 0 '^state +serving$' status
ask 0 '^\{"state":"serving","calls":0,"interfaces":2,' status --json
ask 0 '^ +call state' calls
start_callee callee
run_caller caller 4989123 &
background+=($!)
until_asked '^ +1 ACTIVE +[0-9.]+ +[0-9.]+  a/1 CONNECTED, b/1 CONNECTED; 4420 - 4989123$' calls
ask 0 '^ +1 ACTIVE' calls --interface b
ask 0 '^\{"call":1,' --json calls
"$CTL" calls --interface c | grep -q ACTIVE && fail "a call on an interface that it does not touch"
"$CTL" calls --older 1000 | grep -q ACTIVE && fail "a call that is not so old"
ask 0 'Held by: adapter `1` of endpoint `a` \(own\)' call 1
ask 0 'State: .* -> CONNECTED' call 1
ask 0 '^\{.*"kind":' --json call 1
ask 0 '4420' history 1 e164
ask 0 '^a +sip +in service$' interfaces
# offer WORD...: what bash offers for the last word; complete_words EXPECTED WORD...: that is it
offer() {
    PATH="$(dirname "$CTL"):$PATH" bash -c 'source "$1"; COMP_WORDS=("${@:2}"); COMP_CWORD=$(($# - 2)); _gatewayctl
        echo "${COMPREPLY[*]}"' _ "$HERE/../tools/gatewayctl/completion.bash" "$@"
}
complete_words() {
    local offered
    offered=$(offer "${@:2}")
    [[ $offered == "$1" ]] || fail "completion of ${*:2}: $offered"
}
complete_words "a b" gatewayctl block ""
complete_words "age rate quality" gatewayctl top --sort ""
complete_words "on off" gatewayctl trace ""
# what there is, is completed and in the manual
verbs=0
known=" $(offer gatewayctl "") "
while read -r verb _; do
    verbs=$((verbs + 1))
    [[ $known == *" $verb "* ]] || fail "bash does not complete $verb"
    grep -qE "^\.(B|BI|BR) \"?$verb\b|, \"? ?$verb\b" "$HERE/../tools/gatewayctl/gatewayctl.1" || fail "the manual does not know $verb"
done < <("$CTL" help)
((verbs > 15)) || fail "help lists $verbs commands"

complete_words "status stats" gatewayctl --json sta
complete_words "--interface" gatewayctl calls --i
ask 0 '^\{"interface":"b","module":"sip","blocked":false\}$' interfaces --json
ask 0 '^up +1$' stats
ask 0 "^a +$HOST:$PORT_CALLER +up\$" peers
ask 0 '' registrations
ask 0 '' trace on 4420
ask 0 '' trace on 1
ask 1 'wants on or off' trace at 1
ask 1 'no call 7 is up' drop 7 16
ask 1 'from 1 to 127' drop 1 128
ask 1 'nothing is known of a call 7' call 7
ask 1 'there is no command .nonsense.' nonsense
ask 1 'usage: drop SERIAL CAUSE' drop 1
ask 1 'usage: status' status --older 3
ask 1 '"status":"error","reason":"there is no interface .c."' block c --json
ask 2 'no word of it may have blanks' "drop 1 16"
ask 2 'a command is wanted'
ask 0 '' drop 1 31
expect_callee
wait "${background[0]}" || fail "the caller was not cleared as asked"
expect_causes 1 31
expect_log "control: drop 1 31 asked for by uid [0-9]+, pid [0-9]+: done"
ask 0 'releases|RELEASED' call 1 # the recorder knows it still
expect_trace '^trace: call 1$'
expect_trace 'State: .* -> RELEASED'
ask 1 '1 is not traced' trace off 1
ask 0 '' trace off 4420

# an interface out of service refuses calls either way, and tells who asks
ask 0 '' block a
expect_caller refused 4989123
expect_caller blocked 4989123
ask 0 '^a +sip +blocked$' interfaces
ask 0 '' unblock a
expect_caller served 4989123
ask 1 'is blocked' unblock a
ask 0 '' block b
expect_caller turned_away 4989123
ask 0 '' unblock b
ask 0 '' drain
ask 0 '^state +draining$' status
expect_caller blocked 4989123
ask 0 '' resume
expect_caller served 4989123

ask 0 '' shutdown --graceful 5
expect_end "2 calls placed, 1 answered, 1 cleared, 1 failed"
[[ ! -e $WORK/control ]] || fail "the socket is left behind"
finish
