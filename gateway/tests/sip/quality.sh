# At a call's end each side records what signalling knows of its media, and the other side sees it; with an offer in the
# INVITE and with one in the answer. A call without an answer has no record.
. "$(dirname "$0")/../lib.bash"

caller() { call_up; send_bye; expect 200; }
callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE"$'\na=ptime:30' retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
late_caller() {
    send_invite_with ''
    expect 100
    expect 200 body "o=callee"
    send_ack "$SDP_OF_CALLER"
    expect_request BYE
    respond_in_dialog "200 OK"
}
late_callee() {
    expect_invite
    respond_with "$SDP_OF_CALLEE"$'\na=ptime:30' retrans "200 OK"
    expect_request ACK body "o=caller"
    pause 100
    bye_from_here
    expect 200
}
rejected_caller() { send_invite; expect 100; expect 486; send_ack_of_failure; }
rejecting_callee() { expect_invite; respond_finally "486 Busy Here"; expect_request ACK; }

# expect_records MEDIA: both sides wrote a record with it before they dropped, and the called side was told
expect_records() {
    expect_trace "^ *[0-9.]+  did  Quality-Of-Service=MOS: 0.00$1$"
    expect_trace "^ *[0-9.]+ {60,}did  Quality-Of-Service=MOS: 0.00$1$"
}

for case in caller:callee late_caller:late_callee rejected_caller:rejecting_callee; do
    start_gateway
    start_callee "${case#*:}"
    expect_caller "${case%:*}" 4989123
    expect_callee
    case $case in
    caller:*)
        stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
        expect_records ", Media: RTP PCMA 30ms"
        expect_trace "^ *[0-9.]+ {60,}told peer Quality-Of-Service=MOS: 0.00, Media: RTP PCMA 30ms$"
        ;;
    late_caller:*)
        stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
        expect_records ", Media: RTP PCMA 0ms" # the answer is the caller's
        expect_trace "^ *[0-9.]+  told peer Quality-Of-Service=MOS: 0.00, Media: RTP PCMA 0ms$"
        ;;
    *)
        stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
        grep -q Quality-Of-Service "$WORK/gateway.out" && fail "a call without an answer has a record"
        ;;
    esac
done
finish
