# Streams whose second message claims to be larger than anything: the limit holds for every message of a connection, not
# for its first alone, and the gateway still takes calls, over the same transport too.
. "$(dirname "$0")/../lib.bash"

# message METHOD CONTENT-LENGTH [HEADER]...
message() {
    printf '%s sip:4989123@%s SIP/2.0\r\nVia: SIP/2.0/TCP %s:9;branch=z9hG4bK%s\r\nMax-Forwards: 70\r\n' \
        "$1" "$HOST" "$HOST" "$RANDOM$RANDOM"
    printf 'From: <sip:4420@%s>;tag=x\r\nTo: <sip:4989123@%s>\r\nCall-ID: %s\r\nCSeq: 1 %s\r\n' "$HOST" "$HOST" "$RANDOM" "$1"
    (($# < 3)) || printf '%s\r\n' "${@:3}"
    printf 'Content-Length: %s\r\n\r\n' "$2"
}
# stream_of COMMAND...: what it prints goes over a connection; the statuses that come back until the gateway has nothing
# more to say, in a line.
stream_of() {
    exec 3<>"/dev/tcp/$HOST/$PORT_A" || fail "no connection"
    "$@" >&3 2>/dev/null
    timeout 2 cat <&3 | tr -d '\r' | awk '/^SIP\/2.0 / { printf "%s ", $2 }'
    exec 3>&-
}
resident() { awk '/^VmHWM/ { print $2 }' "/proc/$gateway_pid/status"; } # kB, at most so far

two_messages() { message OPTIONS 0; message OPTIONS 0; }
monster() { message OPTIONS 0; message OPTIONS "$1"; printf x; }
large_body() { message OPTIONS 0; message OPTIONS 5000; printf '%5000s' ''; }
large_header() { message OPTIONS 0; message OPTIONS 0 "X-Long: $(printf '%3000s' '' | tr ' ' x)"; }
endless_header() { message OPTIONS 0; printf 'OPTIONS sip:x SIP/2.0\r\nX: '; head -c 400000 /dev/zero | tr '\0' x; }

caller() { call_up; pause 100; send_bye; expect 200; }
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration '' $'transports = ["udp", "tcp"]\nmax-message-size = 4096\nmax-header-size = 2048'
start_gateway
[[ $(stream_of two_messages) == "200 200 " ]] || fail "two good messages on one connection"
before=$(resident)
for length in 2147483647 4294967295 4294967290 1000000000 99999999999999999999 4097; do
    answers=$(stream_of monster $length)
    kill -0 $gateway_pid 2>/dev/null || fail "the gateway is gone after a message of $length octets"
    [[ $answers == "200 4"* || $answers == "200 " ]] || fail "answers to a message of $length octets: $answers"
done
[[ $(stream_of large_body) == "200 413 " ]] || fail "a body above the limit"
[[ $(stream_of large_header) == "200 413 " ]] || fail "a header above the limit"
stream_of endless_header >/dev/null
(($(resident) - before < 8192)) || fail "$(($(resident) - before)) kB for messages that are not there"
start_callee callee
expect_caller caller 4989123 -t t1
expect_callee
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"

# what is not configured is not there
write_configuration
start_gateway
owns_port $gateway_pid "$PORT_A" tcp && fail "TCP is open although nobody asked for it"
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"
finish
