# A call in G.729, which is only relayed, is transferred to somebody who speaks another codec: the one who could speak that
# is offered it.
. "$(dirname "$0")/../lib.bash"
. "$HERE/target.bash"

voice() { session "$1" "$2" sendrecv "$3"; }
caller() {
    send_invite_with "$(voice caller 1 '18 8')"
    expect 100
    expect 200 body "RTP/AVP 18[^0-9]"
    send_ack
    expect_request INVITE body "m=audio [0-9]+ RTP/AVP 8 "
    respond_again "200 OK" "$(voice caller 2 8)"
    expect_request ACK
    pause 200
    send_bye
    expect 200
}
callee() {
    expect_invite body "RTP/AVP 8 18 0 "
    respond_with "$(voice callee 1 18)" retrans "200 OK"
    expect_request ACK
    request_from_callee REFER 1 '' "Refer-To: <sip:77@[remote_ip]>"
    expect 202
    expect_notify 100
    expect_notify 200
    request_from_callee BYE 2 ''
    expect 200
}
expect_notify() {
    expect_request NOTIFY body "SIP/2.0 $1"
    respond_once "200 OK"
}
target() {
    expect_invite body "RTP/AVP 8 18 0 "
    respond_with "$(voice target 1 8)" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

RELAYED=yes
write_configuration '' 'codecs = ["PCMA", "G729", "PCMU"]'
add_target 'codecs = ["PCMA", "G729", "PCMU"]'
relay_media
start_gateway
start_callee callee
start_target target
expect_caller caller 4989123
expect_callee
expect_target
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
