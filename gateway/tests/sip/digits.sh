# Digits by INFO, either way: both kinds of bodies come in, one goes out, one digit after the other. RFC 6086.
. "$(dirname "$0")/../lib.bash"

info() { # SEQUENCE TYPE BODY
    send_offer INFO "$1" "$3" "Content-Type: $2"
    expect "${4:-200}"
}
caller() {
    call_up
    info 2 application/dtmf-relay $'Signal=5\nDuration=160'
    info 3 application/dtmf '*1'
    info 4 application/dtmf-relay 'Signal=x' 400
    info 5 text/plain 'hello' 415
    expect_request INFO body "Signal=9.*Duration=250" Content-Type: "application/dtmf-relay"
    respond_once "200 OK"
    send_text retrans "$(request_text BYE 6 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
expect_digit() {
    expect_request INFO body "Signal=$1" Content-Type: "application/dtmf-relay"
    respond_once "200 OK"
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_digit "5.*Duration=160"
    expect_digit "[*]"
    expect_digit 1
    pause 100
    request_from_callee INFO 1 9 "Content-Type: application/dtmf"
    expect 200
    expect_request BYE
    respond_in_dialog "200 OK"
}

start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_causes 1 16
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
