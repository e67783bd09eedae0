# Two phones that have no codec in common hear each other: the gateway makes of each one's speech what the other takes. Of
# G.711 either way it is the sound to the bit; of the others it is as near as the codec lets it be.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"

write_configuration
cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
first-port = $((PORT + 8))
last-port = $((PORT + 15))
END
start_gateway

talk() { # CODECS of alice, of bob; the number of the call; "speak": not noise
    CODECS=$1 SAID=${4:+"$4 1 8"} start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16))
    CODECS=$2 SAID=${4:+"$4 2 8"} start_phone bob "$PORT_CALLEE" "$PORT_B" $((PORT + 20)) answermode=auto
    tell_phone "$PORT_CALLER" dial "sip:bob@$HOST:$PORT_A"
    expect_log 'Accept call' "$3"
    sleep 4
    tell_phone "$PORT_CALLER" hangup
    expect_causes "$3" 16
    stop_phones
}

talk PCMA PCMU 1
expect_trace 'told peer Current Codec=PCMA'
expect_trace 'told peer Current Codec=PCMU'
# as far as the record of a call of four seconds can be: each side's own, up to its last tenth of a second
for codec in PCMA PCMU; do
    expect_trace "did  Quality-Of-Service=MOS: [34].*$codec 20ms.*Transmitted packets: (1[5-9]|2[0-9])[0-9],.*Received packets: (1[5-9]|2[0-9])[0-9],"
done
tell_trace 'Quality-Of-Service=.*PCMA.*'
tell_trace 'Quality-Of-Service=.*PCMU.*'
expect_speech alice bob 150 a,mu
expect_speech bob alice 150 mu,a
rm -r "$WORK/alice" "$WORK/bob"

export MODULES="g722 opus"
talk PCMA G722 2 speak
expect_voice alice bob 3
expect_voice bob alice 3
rm -r "$WORK/alice" "$WORK/bob"

talk opus PCMU 3 speak
expect_voice alice bob 4
expect_voice bob alice 4
stop_gateway "3 calls placed, 3 answered, 3 cleared, 0 failed"
finish
