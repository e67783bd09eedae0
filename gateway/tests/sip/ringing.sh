# Each change while the callee is alerted reaches the caller, and what it was told last is repeated before a proxy gives
# the call up: each minute, or 120 times T1 if that is less. RFC 3261, 13.3.1.1.
. "$(dirname "$0")/../lib.bash"

caller() {
    send_invite
    expect 100
    expect 183 body "o=callee 1 1"
    expect 183 body "o=callee 1 2"
    expect 180 body "o=callee 1 2"
    expect 180 body "o=callee 1 2" # repeated
    expect 200 body "o=callee 1 3"
    send_ack
    pause 100
    send_bye
    expect 200
}
callee() {
    expect_invite
    respond_with "$(session callee 1)" '' "183 Session Progress"
    pause 50
    respond_with "$(session callee 2)" '' "183 Session Progress"
    pause 50
    respond "180 Ringing"
    pause 2000
    respond_with "$(session callee 3)" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

write_configuration '' $'t1 = 10\nt1x64 = 2000'
start_gateway
start_callee callee
expect_caller caller 4989123 -nr # or SIPp passes over what is repeated
expect_callee
expect_causes 1 16
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
