# Blind transfer to a peer that transfers by itself: it is sent REFER, and what it tells by NOTIFY goes to whoever asked.
# RFC 3515.
. "$(dirname "$0")/../lib.bash"

refer() { # SEQUENCE
    send_text retrans "$(request_text REFER "$1" '[branch]' '[peer_tag_param]' "Refer-To: <sip:77@[remote_ip]>")" ''
    expect 202
    expect_notify 100
}
expect_notify() {
    expect_request NOTIFY body "SIP/2.0 $1"
    respond_once "200 OK"
}
caller() {
    call_up
    refer 2
    expect_notify 500 # refused as a whole: cause 63
    refer 3
    expect_notify 486
    refer 4
    expect_notify 200
    send_text retrans "$(request_text BYE 5 '[branch]' '[peer_tag_param]')" ''
    expect 200
}
notify() { # SEQUENCE SIPFRAG STATE
    request_from_callee NOTIFY "$1" "SIP/2.0 $2" "Event: refer" "Subscription-State: $3" "Content-Type: message/sipfrag"
    expect "${4:-200}"
}
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    notify 1 "200 OK" terminated 481 # of nothing
    expect_request REFER Refer-To: "sip:77@" Referred-By: "sip:gateway@"
    respond_once "405 Method Not Allowed"
    expect_request REFER
    respond_once "202 Accepted"
    notify 2 "100 Trying" active
    notify 3 "486 Busy Here" "terminated;reason=noresource"
    expect_request REFER
    respond_once "202 Accepted"
    notify 4 "180 Ringing" active
    notify 5 "200 OK" "terminated;reason=noresource"
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration '' 'transfer = "refer"'
start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
expect_causes 1 16
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
