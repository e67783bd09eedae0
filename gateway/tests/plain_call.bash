# A call that is answered and cleared by its caller, beside lib.bash: for tests of what else happens meanwhile.
caller() { call_up; pause 100; send_bye; expect 200; }
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
# expect_call [ARGUMENT-OF-CALLER]...: one of them, from interface a to b
expect_call() {
    start_callee callee
    expect_caller caller 4989123 "$@"
    expect_callee
}
