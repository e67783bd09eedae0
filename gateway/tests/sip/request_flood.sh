# One address floods the gateway with requests that begin no call: as many a second are answered as the interface allows, the others
# dropped, counted and told once. Calls come in meanwhile, and requests over a connection get 503.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"

FLOOD=2000
# flood METHOD: nobody waits for the answers
flood() {
    flooding() { send_text '' "$(request_text "$METHOD" 1 '[branch]' '')" ''; }
    METHOD=$1
    write_scenario "$WORK/flood.xml" flooding
    sipp "$HOST:$PORT_A" -sf "$WORK/flood.xml" -s none -i "$HOST" -bind_local -p $((PORT + 6)) -cp $((PORT + 7)) -mp $((PORT + 26)) \
        -nostdin -m $FLOOD -r $FLOOD -timeout 20s >"$WORK/flood.out" 2>&1
}
figure() { # NAME INTERFACE
    python3 -c 'import sys, urllib.request as r; sys.stdout.buffer.write(r.urlopen(sys.argv[1], timeout=20).read())' \
        "http://$HOST:$((PORT + 30))/metrics" | awk -v name="callcontrol_gateway_$1{interface=\"$2\"}" '$1 == name { print $2 }'
}

write_configuration '' $'transports = ["udp", "tcp"]\nmax-requests-per-source = 50'
printf '\n[metrics]\nlisten = "%s:%d"\n' "$HOST" $((PORT + 30)) >>"$WORK/gateway.toml"
start_gateway
expect_call
(($(figure sip_requests_dropped_total a) == 0)) || fail "an ordinary call is too much"
for method in OPTIONS REGISTER MESSAGE SUBSCRIBE; do
    flood $method
    expect_call
done
dropped=$(figure sip_requests_dropped_total a)
((dropped >= 4 * FLOOD - 4000 && dropped < 4 * FLOOD)) || fail "$dropped of $((4 * FLOOD)) dropped"
(($(figure sip_requests_dropped_total b) == 0)) || fail "the other interface has its own count"
expect_log "interface a: $HOST sends more than 50 requests a second" 1

# over a connection: every request is answered
probes() {
    local i
    for ((i = 1; i <= 200; i++)); do
        printf 'OPTIONS sip:x SIP/2.0\r\nVia: SIP/2.0/TCP %s:9;branch=z9hG4bKp%d\r\nFrom: <sip:a@h>;tag=1\r\nTo: <sip:b@h>\r\n' "$HOST" "$i"
        printf 'Call-ID: p%d\r\nCSeq: 1 OPTIONS\r\nMax-Forwards: 70\r\nContent-Length: 0\r\n\r\n' "$i"
    done
}
exec 3<>"/dev/tcp/$HOST/$PORT_A"
probes >&3
timeout 3 cat <&3 >"$WORK/answers"
exec 3>&-
answered=$(grep -c '^SIP/2.0 200' "$WORK/answers")
refused=$(grep -c '^SIP/2.0 503' "$WORK/answers")
((answered > 0 && refused > 0 && answered + refused == 200)) || fail "$answered answered and $refused refused, of 200"
expect_call
stop_gateway "6 calls placed, 6 answered, 6 cleared, 0 failed"
finish
