# Headers that cross from side to side, in the INVITE, its answers and the BYE, and those that do not.
. "$(dirname "$0")/../lib.bash"

UUI='0468656c6c6f;encoding=hex;purpose=isdn-uui'
caller() {
    send_invite "User-to-User: $UUI" 'Alert-Info: <http://host/ring>' 'Call-Info: <http://host/face>;purpose=icon' \
        'Subject: the invoice' 'Priority: urgent' 'Session-ID: 0123456789;remote=0' 'X-Customer: 77' 'X-Secret: 1' \
        'P-Charging-Vector: icid-value=1' 'Geolocation: <sip:40.7@host>'
    expect 100
    expect 180 Alert-Info: 'http://callee/ring' P-Early-Media: 'sendrecv' Session-ID: '^ *ab' nowhere 'X-Other'
    expect 200 User-to-User: '^ *0461;encoding=hex' X-Customer: '^ *88' Session-ID: '^ *ab' nowhere 'P-Early-Media|Alert-Info'
    send_ack
    expect_request BYE User-to-User: '^ *.last words.;purpose=app' nowhere '0461'
    respond_in_dialog "200 OK"
}
callee() {
    expect_invite User-to-User: "^ *$UUI" Alert-Info: 'http://host/ring' Call-Info: 'http:..host.face.;purpose=icon' \
        Subject: '^ *the invoice' Priority: '^ *urgent' Session-ID: '^ *0123456789;remote=0' X-Customer: '^ *77' \
        P-Charging-Vector: 'icid-value=1' Geolocation: 'sip:40.7@host' nowhere 'X-Secret'
    respond "180 Ringing" 'Alert-Info: <http://callee/ring>' 'P-Early-Media: sendrecv' 'Session-ID: ab;remote=01' 'X-Other: 1'
    pause 100
    respond_with "$SDP_OF_CALLEE" retrans "200 OK" 'User-to-User: 0461;encoding=hex' 'X-Customer: 88' 'Session-ID: ab;remote=01'
    expect_request ACK
    pause 200 # else the end may overtake the answer on its way through the gateway
    bye_from_here 'User-to-User: "last words";purpose=app'
    expect 200
}
# nothing of a caller without a number leaks to a peer that is not trusted, nor does what is for trusted ones
withheld() {
    local FROM='"Anonymous" <sip:anonymous@anonymous.invalid>'
    send_invite 'P-Asserted-Identity: <sip:4420@[local_ip]>' 'Privacy: id' "User-to-User: $UUI" 'Subject: 4420' \
        'Call-Info: <sip:4420@host>' 'X-Customer: 4420' 'Priority: urgent' 'P-Charging-Vector: icid-value=1'
    expect 100
    expect 486 User-to-User: '^ *04626f;encoding=hex'
    send_ack_of_failure
}
callee_of_withheld() {
    expect_invite Priority: '^ *urgent' nowhere 'X-Customer|Subject|Call-Info|User-to-User|P-Charging'
    respond_finally "486 Busy Here" 'User-to-User: 04626f;encoding=hex'
    expect_request ACK
}
refusing_trust() { sed -i '/^name = "b"/a trusted = false' "$WORK/gateway.toml"; }

write_configuration '' 'headers = ["X-Customer"]'
start_gateway
start_callee callee
expect_caller caller 4989123
expect_callee
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
refusing_trust
start_gateway
start_callee callee_of_withheld
expect_caller withheld 4989123
expect_callee
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
finish
