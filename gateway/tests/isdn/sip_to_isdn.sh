# A SIP phone dials a number of the exchange digit by digit; another subscriber answers, to whom the number is forwarded. The
# exchange charges while speech goes both ways, and releases the call: charges and cause arrive as they were said.
. "$(dirname "$0")/isdn.bash"

head -c 16000 /dev/urandom >"$WORK/speech"
write_isdn_configuration '' $'overlap = "invite"\ncharges = "tell"'
start_exchange <<END
[[number]]
number = "4989124"
connected = "89300"
name = "Bob"
speaks = "file"
file = "$WORK/speech"
record = "$WORK/heard"
units = 25
currency = "EUR"
interval = 400
releases = 1500
release-cause = 41
END
start_isdn_gateway

session_of_phone="${SDP_OF_CALLER/40000/[media_port]}"
dial() { # DIGITS SEQUENCE
    send_text retrans "$(request_text INVITE "$2" '[branch]' '' | sed "s/\[service\]/$1/")" "$session_of_phone"
    expect 100
}
refused_as_incomplete() { # DIGITS SEQUENCE STEPS-SINCE-ITS-INVITE
    expect 484 CSeq: "$2 INVITE"
    send_text '' "$(request_text ACK "$2" "[branch-$3]" '[peer_tag_param]' | sed "s/\[service\]/$1/")" ''
}
phone() {
    dial 498 1
    pause 100
    send_text retrans "$(request_text INVITE 2 '[branch]' '' | sed 's/\[service\]/4989/')" "$session_of_phone"
    refused_as_incomplete 498 1 5
    expect 100
    pause 100
    send_text retrans "$(request_text INVITE 3 '[branch]' '' | sed 's/\[service\]/4989124/')" "$session_of_phone"
    refused_as_incomplete 4989 2 6
    expect 100
    expect_optional 180
    expect 200 body "m=audio" P-Asserted-Identity: "Bob.*89300"
    send_ack '' 3
    echo '<label id="talk"/>'
    expect_request INFO Content-Type: "application/vnd.etsi.aoc.xml" | sed 's/<recv /<recv optional="true" next="charged" /'
    expect_request BYE Reason: "Q.850;cause=41" body "aoc-e.*currency-id.EUR.*currency-amount"
    respond_in_dialog "200 OK"
    echo '<nop next="over"/><label id="charged"/>'
    respond_once "200 OK"
    echo '<nop next="talk"/><label id="over"/><nop/>'
}
amounts() { # ELEMENT: the amounts of money that the phone was told in it
    python3 - "$WORK/messages" "$1" <<'END'
import re, sys
text = open(sys.argv[1], errors="replace").read()
bodies = re.findall(f"<{sys.argv[2]}>.*?</{sys.argv[2]}>", text, re.S)
told = [re.search(r"currency-id>(\w+)<.*?currency-amount>([0-9.]+)<", body, re.S).groups() for body in bodies]
print(", ".join(dict.fromkeys(" ".join(one) for one in told)))
END
}
# both ways: each block of 20 ms that the exchange said went to the phone, which sent it back
expect_speech_back() {
    python3 - "$WORK/speech" "$WORK/heard" <<'END' || fail "the speech is not what was said"
import sys
said, heard = (open(name, "rb").read() for name in sys.argv[1:])
same = sum(said[i:i + 160] in heard for i in range(0, len(said), 160))
print(f"speech: {same} of {len(said) // 160} blocks of 20 ms came back from the phone as the exchange had said them, to the bit")
sys.exit(same < 20)
END
}

expect_caller phone 498 -rtp_echo -trace_msg -message_file "$WORK/messages"
expect_log 'call 1 a .calling side. released: cause 41 '
stop_exchange
expect_wellformed
expect_wire 'q931.message_type == 0x05' q931.called_party_number.digits 498
expect_wire 'q931.message_type == 0x45' q931.cause_value 41
digits=$(tshark -r "$CAPTURE" -Y 'q931.message_type == 0x7b' -T fields -e q931.called_party_number.digits 2>/dev/null | xargs)
[[ $digits == "9 1 2 4" ]] || fail "digits of INFORMATION: $digits"
expect_log 'call 1: 4420 on a to 89300 on b, '
during=$(amounts aoc-d)
total=$(amounts aoc-e)
[[ $during == "EUR 0.25"* && -n $total && $during == *"$total" ]] || fail "charges of '$during', then '$total'"
echo "dialled: 498 in SETUP, $digits in INFORMATION; forwarded to and answered by Bob, 89300"
expect_speech_back
echo "charged while it was up: $during; at the end: $total"
echo "released by the exchange with cause 41, by the gateway with BYE and cause 41"
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"

# who hangs up hears what it has cost in all with the answer to his BYE
write_isdn_configuration '' 'charges = "tell"'
start_exchange <<END
[[number]]
number = "4989123"
units = 25
currency = "EUR"
interval = 400
END
start_isdn_gateway
charged() {
    call_up
    expect_request INFO body "aoc-d.*currency-amount.0.25"
    respond_in_dialog "200 OK"
    send_bye
    expect 200 CSeq: BYE Content-Type: "application/vnd.etsi.aoc.xml" body "aoc-e.*currency-id.EUR.*currency-amount.0.25"
}
RELAYED=m=audio expect_caller charged 4989123
expect_log 'call 1 a .calling side. released: cause 16 '
expect_log 'b .called side, timeslot 1. released: cause 16 '
expect_log 'call 1: 4420 on a to 4989123 on b, .* cleared by a, cause 16 '
stop_exchange
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"

# in units, by an interface that tells nobody
write_isdn_configuration
start_exchange <<END
[[number]]
number = "4989123"
units = 3
interval = 50
END
start_isdn_gateway
answered() {
    call_up
    pause 300
    send_bye
    expect 200
}
RELAYED=m=audio expect_caller answered 4989123
await_wire 'q931.message_type == 0x5a'
stop_exchange
# AOC-D in units (operation 34) of 3, 6, ...: the subtotal; AOC-E (36) goes with RELEASE
expect_wire 'q931.message_type == 0x62 && q932.ros.argument[0:12] == 30:0a:a1:05:30:03:02:01:03:82:01:00' q932.ros.local 34
expect_wire 'q931.message_type == 0x4d && q932.ros.local == 36' q932.ros.local 36
expect_trace 'told peer Charge=3 units .subTotal.'
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
