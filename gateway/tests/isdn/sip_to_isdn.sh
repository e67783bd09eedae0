# A SIP phone calls a number of the exchange: numbers, names and causes cross, and another reader finds on the D channel
# what was said.
. "$(dirname "$0")/isdn.bash"

write_isdn_configuration
PLAN=$(
    cat <<END
[[number]]
number = "4989123"
connected = "89124"
name = "Bob"
units = 3
interval = 50

[[number]]
number = "4989200"
does = "busy"

[[number]]
number = "4989124"
units = 25
currency = "EUR"
releases = 150

[[number]]
number = "4989300"
does = "reject"
cause = 88
END
)
start_exchange <<<"$PLAN"
start_isdn_gateway

answered() {
    send_invite
    expect 100
    expect 180
    expect 200 body "m=audio" P-Asserted-Identity: "89124"
    send_ack
    pause 300
    send_bye "Reason: Q.850;cause=31"
    expect 200
}
refused() {
    send_invite
    expect 100
    expect "$STATUS" Reason: "Q.850;cause=$CAUSE"
    send_ack
}

expect_caller answered 4989123
expect_isdn_causes 1 31
STATUS=486 CAUSE=17 expect_caller refused 4989200
expect_isdn_causes 2 17
STATUS=503 CAUSE=88 expect_caller refused 4989300
expect_isdn_causes 3 88
STATUS=404 CAUSE=1 expect_caller refused 4989400
expect_isdn_causes 4 1
stop_exchange
expect_report "cause 31: 1"
expect_wellformed
SETUP='q931.message_type == 0x05'
expect_wire "$SETUP" q931.called_party_number.digits 4989123
expect_wire "$SETUP" q931.calling_party_number.digits 4420 4
expect_wire "$SETUP" q931.information_transfer_capability 0x00 4
expect_wire 'q931.message_type == 0x45' q931.cause_value 31
# AOC-D in units (operation 34) of 3, 6, ...: the subtotal; AOC-E (36) goes with RELEASE
expect_wire 'q931.message_type == 0x62 && q932.ros.argument[0:12] == 30:0a:a1:05:30:03:02:01:03:82:01:00' q932.ros.local 34
expect_wire 'q931.message_type == 0x4d && q932.ros.local == 36' q932.ros.local 36
expect_trace 'told peer Charge=3 units .subTotal.'
tell_trace 'Charge=[0-9]+ units .*'
stop_gateway "4 calls placed, 1 answered, 1 cleared, 3 failed"

# the same charges where the phone is told them, in money
charged() {
    call_up
    expect_request INFO Content-Type: "application/vnd.etsi.aoc.xml" body \
        "aoc-d..charging-info.subtotal.*currency-id.EUR.*currency-amount.0.25.*/aoc-d"
    respond_once "200 OK"
    expect_request BYE body "aoc-e.*currency-amount.0.25./currency-amount"
    respond_in_dialog "200 OK"
}
write_isdn_configuration '' 'charges = "tell"'
start_exchange <<<"$PLAN"
start_isdn_gateway
RELAYED=m=audio expect_caller charged 4989124
stop_exchange
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
