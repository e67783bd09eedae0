# One side speaks SRTP with keys from the session descriptions, the other plainly: they hear each other to the bit, and what
# goes to the secured side is never in the clear. Who wants what its interface does not allow is refused with 488.
# RFC 3711, RFC 4568.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"

configure() { # SRTP of interface a, of interface b
    write_configuration
    sed -i "0,/^peer = .*/s//&\nsrtp = \"$1\"/" "$WORK/gateway.toml"
    sed -i "/^name = \"b\"/s/$/\nsrtp = \"$2\"/" "$WORK/gateway.toml"
    cat >>"$WORK/gateway.toml" <<END

[media]
mode = "relay"
first-port = $((PORT + 8))
last-port = $((PORT + 15))
END
}
phones() { # mediaenc of alice, of bob
    MODULES=srtp start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16)) ${1:+"mediaenc=$1"}
    MODULES=srtp start_phone bob "$PORT_CALLEE" "$PORT_B" $((PORT + 20)) "answermode=auto${2:+;mediaenc=$2}"
    tell_phone "$PORT_CALLER" dial "sip:bob@$HOST:$PORT_A"
}
talk() { # SRTP of interface a, of interface b; mediaenc of alice, of bob
    configure "$1" "$2"
    start_gateway
    phones "$3" "$4"
    expect_log 'Accept call'
    sleep 3
    tell_phone "$PORT_CALLER" hold
    sleep 0.3
    tell_phone "$PORT_CALLER" resume
    sleep 2
    tell_phone "$PORT_CALLER" hangup
    expect_causes 1 16
    stop_phones
    expect_speech alice bob 180 # before and after
    expect_speech bob alice 100
    for phone in alice bob; do
        mode=$([[ $phone == alice ]] && echo "$3" || echo "$4")
        count=$(tr '\r' '\n' <"$WORK/$phone.log" | grep -ac 'SRTP is Enabled')
        [[ -n $mode && $count != 0 || -z $mode && $count == 0 ]] || fail "phone $phone: $count times secured"
        rm -r "${WORK:?}/$phone"
    done
    stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
}
refused() { # SRTP of interface a, of interface b; mediaenc of alice, of bob; who is told of it in the log
    configure "$1" "$2"
    start_gateway
    phones "$3" "$4"
    expect_log "call 1 $5 released: cause [0-9]+ .*SIP 488"
    stop_phones
    rm -r "${WORK:?}/alice" "${WORK:?}/bob"
    stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
}

talk required off srtp-mand ''
talk off required '' srtp-mand
talk optional optional srtp ''
refused off off srtp-mand '' 'a \(calling side\)'
refused required off '' '' 'a \(calling side\)'

# what comes to the secured side
secured() {
    send_invite_with "v=0
o=caller 1 1 IN IP4 $HOST
s=-
c=IN IP4 $HOST
t=0 0
m=audio $((PORT + 27)) RTP/SAVP 0
a=crypto:3 AES_CM_128_HMAC_SHA1_80 inline:d0RmdmcmVCspeEc3QGZiNWpVLFJhQX1cfHAwJSoj"
    expect 100
    expect_optional 180
    expect 200 body "RTP/SAVP 0.*a=crypto:3 AES_CM_128_HMAC_SHA1_80 inline:[A-Za-z0-9+/]{40}"
    send_ack
    pause 3000
    send_bye
    expect 200
}
configure required off
start_gateway
start_phone bob "$PORT_CALLEE" "$PORT_B" $((PORT + 24)) answermode=auto
python3 "$HERE/speech.py" overhear "$WORK/bob/said.wav" $((PORT + 27)) 100 &
listener=$!
background+=($listener)
sleep 0.5
expect_caller secured bob
wait $listener || fail "what was overheard"
stop_phones
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
