# Bodies that are not, or not only, a session description: its part of a multipart goes to the other side, what is optional
# is left out, and what would be needed and is not understood is refused.
. "$(dirname "$0")/../lib.bash"

MULTIPART="--b
Content-Type: application/sdp

$SDP_OF_CALLER
--b
Content-Type: application/ISUP;version=itu-t92+
Content-Disposition: signal;handling=optional

isup
--b--"

refused_with() { send_invite_with "$@"; expect 415 Accept: "application/sdp" Accept-Encoding: identity; send_ack_of_failure; }
text() { refused_with hello "Content-Type: text/plain"; }
compressed() { refused_with "$SDP_OF_CALLER" "Content-Type: application/sdp" "Content-Encoding: gzip"; }
isup() { refused_with "${MULTIPART/handling=optional/handling=required}" "Content-Type: multipart/mixed;boundary=b"; }
goes_on() { expect 100; expect_optional 180; expect 200 body "callee"; send_ack; send_bye; expect 200; }
mixed() { send_invite_with "$MULTIPART" 'Content-Type: multipart/mixed;boundary="b"'; goes_on; }
mixed_callee() {
    expect_invite Content-Type: "application/sdp" body "^v=0" nowhere "isup|--b"
    respond_with "$SDP_OF_CALLEE" retrans "200 OK"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}
optional() {
    send_invite_with hello "Content-Type: text/plain" "Content-Disposition: render;handling=optional"
    expect 100
    expect_optional 180
    expect 200 body "callee"
    send_ack "$SDP_OF_CALLER"
    pause 200 # else the BYE may overtake the session on its way through the gateway
    send_bye
    expect 200
}
optional_callee() {
    expect_invite nowhere "hello"
    respond_with "${SDP_OF_CALLEE}" retrans "200 OK"
    expect_request ACK body "o=caller"
    expect_request BYE
    respond_in_dialog "200 OK"
}
mixed_answer() { send_invite; expect 100; expect 200 Content-Type: "application/sdp" nowhere "isup"; send_ack; send_bye; expect 200; }
answering_callee() {
    expect_invite
    respond_with "$MULTIPART" retrans "200 OK" "Content-Type: multipart/mixed;boundary=b"
    expect_request ACK
    expect_request BYE
    respond_in_dialog "200 OK"
}

start_gateway
for scenario in text compressed isup; do
    expect_caller $scenario 4989123
done
start_callee mixed_callee
expect_caller mixed 4989123
expect_callee
start_callee optional_callee
expect_caller optional 4989123
expect_callee
start_callee answering_callee
expect_caller mixed_answer 4989123
expect_callee
stop_gateway "3 calls placed, 3 answered, 3 cleared, 0 failed"
finish
