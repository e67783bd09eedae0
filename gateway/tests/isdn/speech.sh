# Speech between a phone and a B channel: A-law is relayed to the bit, both ways; of another law it is what transcoding
# makes of it. The exchange sends back what it hears, and keeps it.
. "$(dirname "$0")/isdn.bash"
. "$HERE/phones.bash"

write_isdn_configuration
start_exchange <<END
[[number]]
number = "4989123"
speaks = "echo"
record = "$WORK/record.al"
END
start_isdn_gateway

talk() { # CODECS CALL
    CODECS=$1 start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16))
    tell_phone "$PORT_CALLER" dial "sip:4989123@$HOST:$PORT_A"
    expect_log 'Accept call' "$2"
    sleep 5
    tell_phone "$PORT_CALLER" hangup
    expect_log "call $2 a \\(calling side\\) released: cause 16 "
    stop_phones
}

talk PCMA 1
expect_trace 'told peer Current Codec=PCMA'
(($(stat -c %s "$WORK/record.al") > 100 * 160)) || fail "the exchange heard little"
expect_speech alice alice 150 a
rm -r "$WORK/alice"

talk PCMU 2
expect_speech alice alice 150 mu,a,mu
stop_exchange
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
