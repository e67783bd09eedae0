# The torture messages of RFC 5118, about version 6 of the internet protocol in SIP, each as a datagram and as a connection
# of its own, to an interface of that version.
. "$(dirname "$0")/../lib.bash"

grep -q '^0*1 ' /proc/net/if_inet6 2>/dev/null || { echo "passed, without version 6 on this host"; exit 0; }
write_configuration 'max-calls-per-second = 0' $'transports = ["udp", "tcp"]\nallow = ["::1"]\nmax-connections-per-source = 200' 4989
sed -i "s/\"$HOST:/\"[::1]:/" "$WORK/gateway.toml"
start_gateway
HOST=::1
. "$HERE/torture.bash"
URI_HOST="[::1]"

TYPE='Content-Type: application/sdp'
# session6 LINES-OF-THE-SESSION [LINES-OF-ITS-STREAM]
session6() { printf 'body:v=0\\r\\no=a 1 1 IN IP6 2001:db8::20\\r\\ns=-\\r\\n%st=0 0\\r\\nm=audio 49217 RTP/AVP 0\\r\\n%s' "$1" "${2:-}"; }

# OPTIONS in place of the RFC's REGISTER, which is refused whatever it says
torture uri '200' 'OPTIONS sip:[2001:db8::10] SIP/2.0'                                    # 4.1
torture nobrackets '400|' 'OPTIONS sip:2001:db8::10 SIP/2.0'                              # 4.2
torture portwithin '200' 'OPTIONS sip:[2001:db8::10:5070] SIP/2.0'                        # 4.3: a host without a port
torture portbehind '200' 'OPTIONS sip:[2001:db8::10]:5070 SIP/2.0'                        # 4.4
torture received '200' 'OPTIONS sip:[2001:db8::10] SIP/2.0' \
    'Via: SIP/2.0/TRANSPORT [::1]:9;rport;received=[2001:db8::9:255];branch=z9hG4bKreceived' # 4.5
torture receivedbare '200' 'OPTIONS sip:[2001:db8::10] SIP/2.0' \
    'Via: SIP/2.0/TRANSPORT [::1]:9;rport;received=2001:db8::9:255;branch=z9hG4bKreceivedbare'
torture session '100 404|404' 'INVITE sip:user@[2001:db8::10] SIP/2.0' "$TYPE" "$(session6 'c=IN IP6 2001:db8::20\r\n')" # 4.6
torture severalvia '200' 'OPTIONS sip:user@[2001:db8::10] SIP/2.0' \
    'Via: SIP/2.0/TRANSPORT [::1]:9;rport;branch=z9hG4bKseveralvia\r\nVia: SIP/2.0/TRANSPORT [2001:db8::9:1];received=[2001:db8::9:255];branch=z9hG4bKb\r\nVia: SIP/2.0/TRANSPORT 192.0.2.1;branch=z9hG4bKc' # 4.7
torture severalsession '100 404|404' 'INVITE sip:user@[2001:db8::10] SIP/2.0' "$TYPE" \
    "$(session6 '' 'c=IN IP6 2001:db8::20\r\nm=video 49300 RTP/AVP 31\r\nc=IN IP4 192.0.2.20\r\n')" # 4.8
torture mapped '100 404|404' 'INVITE sip:user@[::ffff:192.0.2.10] SIP/2.0' 'Contact: <sip:a@[::ffff:192.0.2.10]>' "$TYPE" \
    "$(session6 'c=IN IP6 ::ffff:192.0.2.10\r\n')" # 4.9
torture threecolons '200|400' 'OPTIONS sip:user@[2001:db8:::192.0.2.1] SIP/2.0' # 4.10: by the older grammar

send_datagrams
send_streams true
kill -TERM $gateway_pid
status=0
wait $gateway_pid || status=$?
gateway_pid=0
((status == 0)) || fail "gateway: exit status $status"
grep -qE '^gateway: [0-9]+ calls placed, 0 answered, 0 cleared, [0-9]+ failed, 0 left over$' "$WORK/gateway.out" || fail "the last line"
finish
