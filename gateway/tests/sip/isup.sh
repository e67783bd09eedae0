# Two exchanges that speak ISUP within SIP hear each other's messages through the gateway, where both interfaces allow it:
# with the INVITE, its answers and the BYE, each once. Where one of them does not, what is optional is dropped, and what is
# not gets 415. RFC 3204.
. "$(dirname "$0")/../lib.bash"

BOUNDARY='Content-Type: multipart/mixed;boundary=isup'
with_isup() { # MESSAGE [SESSION]: a body
    [[ -z ${2:-} ]] || printf -- '--isup\nContent-Type: application/sdp\n\n%s\n' "$2"
    printf -- '--isup\nContent-Type: application/ISUP;version=itu-t92+\n%s\n%s\n--isup--\n' "${DISPOSITION:-}" "$1"
}
type_of() { echo "application/ISUP;version=itu-t92.[^:]*Content-Disposition: signal;handling=optional[^:]*$1"; }

caller() {
    send_invite_with "$(with_isup "the IAM" "$SDP_OF_CALLER")" "$BOUNDARY"
    expect 100
    expect 180 msg "$(type_of "the ACM")"
    expect 200 msg "$(type_of "the ANM")" msg "o=callee" nowhere "the ACM"
    send_ack
    pause 100
    send_text retrans "$(request_text BYE 3 '[branch]' '[peer_tag_param]' "$BOUNDARY")" "$(with_isup "the REL")"
    expect 200
}
callee() {
    expect_invite msg "$(type_of "the IAM")" msg "o=caller"
    respond_with "$(with_isup "the ACM")" '' "180 Ringing" "$BOUNDARY"
    pause 200
    respond_with "$(with_isup "the ANM" "$SDP_OF_CALLEE")" retrans "200 OK" "$BOUNDARY"
    expect_request ACK
    expect_request BYE msg "$(type_of "the REL")"
    respond_in_dialog "200 OK"
}
rejected_caller() {
    send_invite_with "$(with_isup "the IAM" "$SDP_OF_CALLER")" "$BOUNDARY"
    expect 100
    expect 486 msg "$(type_of "the REL")"
    send_ack_of_failure
}
busy_callee() {
    expect_invite msg "$(type_of "the IAM")"
    respond_with "$(with_isup "the REL")" retrans "486 Busy Here" "$BOUNDARY"
    expect_request ACK
}
refused_caller() {
    send_invite_with "$(with_isup "the IAM" "$SDP_OF_CALLER")" "$BOUNDARY"
    expect 415
    send_ack_of_failure
}
plain_callee() {
    expect_invite msg "o=caller" nowhere "the IAM"
    respond_finally "486 Busy Here"
    expect_request ACK
}
plain_rejected_caller() {
    send_invite_with "$(with_isup "the IAM" "$SDP_OF_CALLER")" "$BOUNDARY"
    expect 100
    expect 486
    send_ack_of_failure
}

write_configuration '' 'isup = true'
start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
start_callee busy_callee
expect_caller rejected_caller 4989123
expect_callee
stop_gateway "2 calls placed, 1 answered, 1 cleared, 1 failed"

# the called side allows none
write_configuration
sed -i '0,/^peer = /s//isup = true\npeer = /' "$WORK/gateway.toml"
start_gateway
start_callee plain_callee
expect_caller plain_rejected_caller 4989123
expect_callee
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"

# the calling side allows none
write_configuration
start_gateway
expect_caller refused_caller 4989123
start_callee plain_callee
DISPOSITION=$'Content-Disposition: signal;handling=optional\n' expect_caller plain_rejected_caller 4989123
expect_callee
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
finish
