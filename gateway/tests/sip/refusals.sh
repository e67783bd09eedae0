# What RFC 3261, section 8.2, has refused, in its order: URIs of other schemes, extensions, numbers of hops out of range;
# for OPTIONS and BYE as for INVITE. A request that comes twice by different ways is one.
. "$(dirname "$0")/../lib.bash"
. "$(dirname "$0")/../datagrams.bash"

with_tag() { request BYE sip:4989123@x | sed 's/^To: .*>/&;tag=none/'; }
merged() { printf 'INVITE sip:4989123@%s SIP/2.0\r\n' "$HOST"; parts INVITE once 'Max-Forwards: 70'; printf '\r\n'; }

caller() {
    send_invite
    expect 100
    expect 200 Allow: "INVITE, ACK" Contact: "sip:gateway@$HOST:$PORT_A>" nowhere "Supported: [a-z]"
    send_ack
    send_bye "Require: never-heard"
    expect 420 Unsupported: never-heard
    send_text retrans "$(request_text BYE 4 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
tcp_caller() { send_invite; expect 100; expect 200 Contact: "sip:gateway@$HOST:$PORT_A;transport=tcp"; send_ack; send_bye; expect 200; }
callee() {
    expect_invite Allow: "INVITE, ACK"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
tel_callee() { expect_invite To: "sip:\+4989123@"; respond_finally "486 Busy Here"; expect_request ACK; }
ringing_callee() {
    expect_invite
    respond "180 Ringing"
    expect_request CANCEL
    respond_in_dialog "200 OK"
    respond_487
    expect_request ACK
}
long_caller() { send_invite; expect 100; expect_optional 180; expect 503; send_ack_of_failure; }

write_configuration 'clear-after = 1' 'transports = ["udp", "tcp"]'
start_gateway
for uri in mailto:4989123@x http://4989123@x urn:service:counseling sips:4989123@x; do
    expect_answer 416 -- request INVITE "$uri"
    expect_answer 416 -- request OPTIONS "$uri"
done
expect_answer 420 '^Unsupported: one, *two|^Unsupported: one' -- request OPTIONS "sip:x@$HOST" 'Require: one, two'
expect_answer 420 '^Unsupported: one' -- request INVITE "sip:x@$HOST" 'Require: one'
expect_answer 400 -- request INVITE "sip:x@$HOST" 'Max-Forwards: 256'
expect_answer 400 -- request OPTIONS "sip:x@$HOST" 'Max-Forwards: 100000'
expect_answer 483 -- request INVITE "sip:x@$HOST" 'Max-Forwards: 0'
expect_answer 200 '^Allow: INVITE' '^Supported:' '^Accept-Encoding: identity' -- request OPTIONS "sip:x@$HOST" 'Max-Forwards: 0'
expect_answer 481 -- with_tag

start_callee tel_callee
expect_answer "100 486" -- request INVITE 'tel:+49-89-123;phone-context=x'
expect_callee
for transport in u1 t1; do
    start_callee callee
    [[ $transport == u1 ]] && expect_caller caller 4989123 || expect_caller tcp_caller 4989123 -t t1
    expect_callee
done

# the same request again with another branch, while the first is served
start_callee ringing_callee
expect_answer "100 180" -- merged
expect_answer 482 -- merged

# no new calls are wanted, and who asks is told so
kill -TERM $gateway_pid
expect_answer 503 '^Retry-After: [0-9]' -- request OPTIONS "sip:x@$HOST"
expect_callee
expect_end "4 calls placed, 2 answered, 2 cleared, 2 failed"
finish
