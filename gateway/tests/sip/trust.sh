# Interface a's peer is not trusted: what it asserts is not believed, on the way in and in its answers, and no header of any
# message to it tells a number that somebody has withheld. RFC 3325.
. "$(dirname "$0")/../lib.bash"

WITHHELD='P-Asserted-Identity: "Secret" <sip:+99887766@[local_ip]>'
ending() { # as the called side, once the 200 is sent
    expect_request ACK nowhere 99887766
    expect_request BYE nowhere 99887766
    respond_in_dialog "200 OK"
}

# from a to b: who calls is not who it says, and who answers is not told
asserting_caller() {
    send_invite "P-Asserted-Identity: <sip:+1234567@[local_ip]>" "Diversion: <sip:555@[local_ip]>;reason=user-busy;screen=yes"
    expect 100
    expect 180 nowhere '99887766|Secret'
    expect 200 Privacy: "id" nowhere '99887766|Secret'
    send_ack
    send_bye
    expect 200 nowhere '99887766|Secret'
}
unimpressed_callee() {
    expect_invite From: "sip:4420@" nowhere "1234567|P-Asserted-Identity|screen=yes"
    respond "180 Ringing" "$WITHHELD" "Privacy: id"
    pause 100
    respond_with "$SDP_OF_CALLEE" retrans "200 OK" "$WITHHELD" "Privacy: id"
    ending
}

# from b to a: who withholds is not told, and who answers asserts nothing
withholding_caller() {
    send_invite "$WITHHELD" "Privacy: id" "Diversion: <sip:99887766@[local_ip]>;reason=user-busy;privacy=full" \
        'History-Info: <sip:99887766@[local_ip]?Privacy=history>;index=1, <sip:4989123@[local_ip];cause=486>;index=1.1'
    expect 100
    expect 200 nowhere '1234567'
    send_ack
    pause 100
    send_bye
    expect 200
}
curious_callee() {
    expect_invite From: 'sip:anonymous@anonymous.invalid' Privacy: "id" nowhere '99887766|Secret|P-Asserted-Identity|Diversion|History-Info'
    respond_with "$SDP_OF_CALLEE" retrans "200 OK" "P-Asserted-Identity: <sip:+1234567@[local_ip]>"
    ending
}

write_configuration
sed -i 's/^name = "a"/&\ntrusted = false/' "$WORK/gateway.toml"
start_gateway
start_callee unimpressed_callee
expect_caller asserting_caller 4989123
expect_callee
FROM='"Secret" <sip:99887766@[local_ip]>'
PORT_CALLEE=$PORT_CALLER PORT_B=$PORT_A start_callee curious_callee
PORT_CALLER=$PORT_CALLEE PORT_A=$PORT_B expect_caller withholding_caller 4989123
expect_callee
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
