# What a call costs (3GPP TS 24.647) crosses the gateway: in INFO so far, in BYE in all, or in its answer to who hangs up. What is no charge is refused, and
# an interface that does not take any understands none.
. "$(dirname "$0")/../lib.bash"

advice() { # ELEMENTS
    echo '<?xml version="1.0" encoding="UTF-8"?><aoc xmlns="http://uri.etsi.org/ngn/params/xml/simservs/aoc">'"$1</aoc>"
}
amount() {
    echo "<recorded-charges><recorded-currency-units><currency-id>EUR</currency-id><currency-amount>$1</currency-amount></recorded-currency-units></recorded-charges>"
}
charge_of_callee() { # SEQUENCE BODY STATUS
    request_from_callee INFO "$1" "$2" "Content-Type: application/vnd.etsi.aoc+xml"
    expect "$3"
}
caller() {
    call_up
    expect_request INFO Content-Type: "application/vnd.etsi.aoc.xml" body \
        ".aoc xmlns=.http://uri.etsi.org/ngn/params/xml/simservs/aoc...aoc-d..charging-info.subtotal.*currency-id.EUR.*currency-amount.0.25.*/aoc-d"
    respond_once "200 OK"
    send_text retrans "$(request_text INFO 2 '[branch]' '[peer_tag_param]' 'Content-Type: application/vnd.etsi.aoc+xml')" \
        "$(advice "<aoc-d>$(amount 9)</aoc-d>")"
    expect 415
    expect_request BYE Content-Type: "application/vnd.etsi.aoc.xml" body "aoc-e.*currency-amount.0.5./currency-amount"
    respond_in_dialog "200 OK"
}
callee() {
    expect_invite Accept: "application/vnd.etsi.aoc.xml"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    charge_of_callee 1 "$(advice "<aoc-d>$(amount 0.25)")" 400
    charge_of_callee 2 "$(advice "<aoc-d><charging-info>subtotal</charging-info>$(amount 0.25)</aoc-d>")" 200
    pause 500
    send_text retrans "BYE sip:gateway@[remote_ip]:[remote_port] SIP/2.0
Via: SIP/2.0/[transport] [local_ip]:[local_port];branch=[branch]
From: <sip:callee@[local_ip]:[local_port]>;tag=[pid]callee[call_number]
To:[\$caller]
[last_Call-ID:]
CSeq: 3 BYE
Content-Type: application/vnd.etsi.aoc+xml
Max-Forwards: 70" "$(advice "<aoc-e>$(amount 0.5)</aoc-e>")"
    expect 200
}

write_configuration '' 'charges = "tell"'
sed -i '/name = "b"/,$ s/^charges = .*/charges = "take"/' "$WORK/gateway.toml"
start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_trace "told peer Charge=EUR 0.5 .total."
expect_log "the peer's charge cannot be read"

thrifty_caller() {
    call_up
    expect_request INFO body "aoc-d.*currency-amount.0.25"
    respond_once "200 OK"
    send_bye
    expect 200 CSeq: BYE Content-Type: "application/vnd.etsi.aoc.xml" body "aoc-e.*currency-amount.0.5./currency-amount"
}
hung_up_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    charge_of_callee 1 "$(advice "<aoc-d><charging-info>subtotal</charging-info>$(amount 0.25)</aoc-d>")" 200
    expect_request BYE
    send_text '' "SIP/2.0 200 OK
[last_Via:]
[last_From:]
[last_To:]
[last_Call-ID:]
[last_CSeq:]
Content-Type: application/vnd.etsi.aoc+xml" "$(advice "<aoc-e>$(amount 0.5)</aoc-e>")"
}
start_callee hung_up_callee
expect_caller thrifty_caller 4989123
expect_callee
expect_log 'call 2: .* cleared by a, cause 16 '
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
