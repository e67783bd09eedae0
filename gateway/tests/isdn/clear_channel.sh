# 64 kbit/s of bits that are no speech (RFC 4040), either way: what the exchange sends comes back from SIPp, which sends
# each packet back, as it was to the bit. Where the interface does not take them, such a call is no call.
. "$(dirname "$0")/isdn.bash"

head -c 8000 /dev/urandom >"$WORK/bits"
write_isdn_configuration '' 'codecs = ["CLEARMODE", "PCMA"]'
start_exchange <<END
[[number]]
number = "4989123"
speaks = "file"
file = "$WORK/bits"
record = "$WORK/bits.called"

[[call]]
to = "4420"
from = "4989123"
bearer = "digital"
speaks = "file"
file = "$WORK/bits"
record = "$WORK/bits.calling"
length = 1000
after = 800
END

session_of_bits() { # OWNER TYPES
    echo "v=0
o=$1 1 1 IN IP4 [local_ip]
s=-
c=IN IP4 [local_ip]
t=0 0
m=audio [media_port] RTP/AVP $2
a=rtpmap:${2%% *} CLEARMODE/8000"
}
callee() {
    expect_invite body "RTP/AVP 96.*a=rtpmap:96 CLEARMODE/8000"
    respond_with "$(session_of_bits callee 96)" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
caller() {
    send_invite_with "$(session_of_bits caller '97 8')"
    expect 100
    expect_optional 180
    expect 200 body "RTP/AVP 97.*a=rtpmap:97 CLEARMODE/8000"
    send_ack
    pause 1000
    send_bye
    expect 200
}
# expect_bits FILE: most of the blocks came back, each whole
expect_bits() {
    python3 - "$WORK/bits" "$1" <<'END' || fail "of the bits in ${1##*/}, others came back"
import sys
sent, heard = (open(name, "rb").read() for name in sys.argv[1:])
whole = sum(sent[i:i + 160] in heard for i in range(0, len(sent), 160))
print(whole, "of", len(sent) // 160, "blocks")
sys.exit(whole < 20)
END
}

PORT_B=$PORT_A PORT_CALLEE=$PORT_CALLER start_callee callee -rtp_echo
start_isdn_gateway
expect_callee
expect_caller caller 4989123 -rtp_echo
stop_exchange
expect_bits "$WORK/bits.calling"
expect_bits "$WORK/bits.called"
expect_wire 'q931.message_type == 0x05' q931.information_transfer_capability 0x08 2
expect_wellformed
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"

write_isdn_configuration
start_exchange <<END
[[call]]
to = "4420"
bearer = "digital"
after = 800
END
start_isdn_gateway
expect_log 'call 1 b .calling side, timeslot 31. released: cause 88 '
stop_exchange
expect_report "cause 88: 1"
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
finish
