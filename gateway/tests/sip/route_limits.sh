# A route that is full leaves its calls to the next one, and the caller hears of it only when all are; an emergency number
# is refused by no limit and no operator. Numbers that are dialled with a prefix take the routes of their international
# form.
. "$(dirname "$0")/../lib.bash"

caller() {
    call_up
    expect_request BYE
    respond_in_dialog "200 OK"
}
hanging_up() { call_up; pause 100; send_bye; expect 200; }
full() { send_invite; expect 503 Reason: 'Q.850;cause=34' nowhere Retry-After; send_ack_of_failure; }
turned_away() { send_invite; expect 503 Retry-After: 5; send_ack_of_failure; }
dialling_service() {
    request_text() { eval "$(declare -f plain_text)"; plain_text "$@" | sed 's/^INVITE sip:[^ ]*/INVITE urn:service:sos.fire/'; }
    hanging_up
}
eval "plain_$(declare -f request_text | sed '1s/request_text/text/')"

answering() { # PART REGEXP...
    expect_invite "$@"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
hanging_up_callee() { # PART REGEXP...
    expect_invite "$@"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    pause 20000
}
first_callee() { answering msg 'INVITE sip:.4989123@'; }
second_callee() { answering msg 'INVITE sip:95089124@'; }
callee_of_112() { answering msg 'INVITE urn:service:sos SIP' To: '.urn:service:sos.'; }
callee_of_service() { answering msg 'INVITE sip:112@'; }

# peer NUMBER OFFSET: the ports of an interface of that number, and of SIPp there besides
peer() { PORT_B=$((PORT + $1)) PORT_CALLEE=$((PORT + $1 + 1)) PORT=$((PORT + $2)) "${@:3}"; }
interface() { # NAME NUMBER
    printf '[[sip]]\nname = "%s"\nlisten = "%s:%s"\npeer = "%s:%s"\n' "$1" $HOST $((PORT + $2)) $HOST $((PORT + $2 + 1))
}
# start_caller NUMBER OFFSET MEDIA: its call stays up
start_caller() {
    write_scenario "$WORK/caller.xml" caller
    sipp "$HOST:$PORT_A" -sf "$WORK/caller.xml" -s "$1" -i $HOST -bind_local -p $((PORT + $2)) -cp $((PORT + $2 + 1)) \
        -mp $((PORT + $3)) -nostdin -m 1 -timeout 30s -timeout_error >"$WORK/up$2.out" 2>&1 &
    background+=($!)
}
control() { python3 -c 'import socket, sys
s = socket.socket(socket.AF_UNIX)
s.connect(sys.argv[1])
s.sendall(sys.argv[2].encode() + b"\n")
sys.stdout.write(s.recv(10000).decode())' "$WORK/control" "$1"; }
routed() { "$GATEWAY" --config "$WORK/gateway.toml" --from a --route "$1"; }

{
    printf '[gateway]\ncall-control-log-level = 2\nmax-calls = 3\nclear-after = 0\n'
    printf 'international-prefix = "00"\nnational-prefix = "0"\ncountry-code = "49"\n'
    printf '[records]\nfile = "%s"\n[control]\nsocket = "%s"\n' "$WORK/records" "$WORK/control"
    interface a 0
    interface b 2
    interface c 6
    interface d 8
    cat <<END
[[route]]
from = "a"
prefix = "+4989"
to = "b"
max-calls = 1
[[route]]
from = "a"
prefix = "+49"
to = "c"
strip = 3
prepend = "950"
max-calls = 1
[[route]]
from = "a"
number = "112"
to = "d"
strip = 3
prepend = "urn:service:sos"
emergency = true
[[route]]
from = "a"
number = "urn:service:sos.fire"
to = "d"
strip = 20
prepend = "112"
emergency = true
END
} >"$WORK/gateway.toml"
[[ $(routed 089123) == '089123 is +4989123
+4989123 from a: prefix "+4989" to b, 1 calls at most
+4989123 from a: prefix "+49" to c as 95089123, 1 calls at most (tried when that is full)' ]] || fail "the dry run"
[[ $(routed 112) == '112 from a: number "112" to d as urn:service:sos, an emergency number' ]] || fail "the dry run of 112"
start_gateway

start_callee first_callee
background+=($callee_pid)
start_caller 089123 33 13
expect_log 'EP b/1\] Accept call'
peer 6 14 start_callee second_callee
background+=($callee_pid)
start_caller 004989124 36 17
expect_log 'EP c/2\] Accept call'
expect_caller full 089125
expect_log "call 3 a refused: no route to '089125' has room, cause 34 "

sed -i 's/max-calls = 3/max-calls = 2/' "$WORK/gateway.toml"
kill -HUP $gateway_pid
expect_log 'configuration is read again'
expect_caller turned_away 0171
peer 8 19 start_callee callee_of_112
expect_caller hanging_up 112
expect_callee
control drain >"$WORK/drain.log"
expect_caller turned_away 0171
peer 8 19 start_callee callee_of_service
expect_caller dialling_service x
expect_callee
expect_log "is an emergency call to '(112|urn:service:sos.fire)'" 2
expect_log 'info call [0-9]+: emergency, 4420 on a to ' 2
stop_gateway "5 calls placed, 4 answered, 4 cleared, 1 failed"
(($(grep -c '"emergency":true' "$WORK/records") == 2)) || fail "the records"
finish
