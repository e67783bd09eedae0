# Two interfaces whose peers are each other: the call comes round until its hops are used up, and ends for all. RFC 3261,
# 8.1.1.6; cause 25.
. "$(dirname "$0")/../lib.bash"

caller() {
    send_invite "Max-Forwards: 6"
    expect 100
    expect 483
    send_ack_of_failure
}

write_configuration
sed -i "s/^peer = .*:$PORT_CALLER\"/peer = \"$HOST:$PORT_B\"/; s/^peer = .*:$PORT_CALLEE\"/peer = \"$HOST:$PORT_A\"/" "$WORK/gateway.toml"
start_gateway
expect_caller caller 4989123
expect_log "calling side\) released: cause 25 .*SIP 483" 6
stop_gateway "6 calls placed, 0 answered, 0 cleared, 6 failed"
# the context's own limit
sed -i 's/^\[gateway\]/&\nmax-hops = 3/' "$WORK/gateway.toml"
plain_caller() {
    send_invite
    expect 100
    expect 483
    send_ack_of_failure
}
start_gateway
expect_caller plain_caller 4989123
stop_gateway "4 calls placed, 0 answered, 0 cleared, 4 failed"
finish
