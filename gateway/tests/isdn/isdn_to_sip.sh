# The exchange calls a SIP phone, digit by digit, and redirected; of a busy one it hears so in the channel first, if the line
# asks for that. What crosses of who calls is in wire.sh.
. "$(dirname "$0")/isdn.bash"

write_isdn_configuration
start_exchange <<END
[[call]]
to = "4420777#"
from = "4989123"
overlap = true
length = 300
after = 1500
END

callee() {
    expect_invite To: "4420777@" From: "4989123@" body "m=audio"
    respond "180 Ringing"
    pause 100
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE Reason: "Q.850;cause=16;"
    respond_in_dialog "200 OK"
}
PORT_B=$PORT_A PORT_CALLEE=$PORT_CALLER start_callee callee
start_isdn_gateway
expect_callee
expect_log 'call 1 b \(calling side, timeslot 31\) released: cause 16 '
stop_exchange
expect_report "0 calls received, 0 answered; 1 placed, 1 answered, 1 over; 0 units charged"
expect_wellformed
expect_wire 'q931.message_type == 0x7b' q931.called_party_number.digits '#'
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"

busy() {
    expect_invite
    respond_finally "486 Busy Here"
    expect_request ACK
}
write_isdn_configuration 'failure-tone = 1'
start_exchange <<END
[[call]]
to = "4420888"
after = 800
END
PORT_B=$PORT_A PORT_CALLEE=$PORT_CALLER start_callee busy
start_isdn_gateway
expect_callee
expect_log 'call 1 b \(calling side, timeslot 31\) released: cause 17 '
stop_exchange
expect_report "cause 17: 1"
expect_wellformed
expect_wire 'q931.message_type == 0x03' q931.progress_indicator.description 0x08
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
finish
