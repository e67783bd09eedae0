# Phones for tests with speech, beside lib.bash: baresip, which says what stands in a file and writes down what it hears.
# Each has a folder of its name in $WORK: said.wav, and heard.wav when it has ended.

# start_phone NAME PORT GATEWAY-PORT RTP-PORT [PARAMETER-OF-ACCOUNT]: commands for it go to the port 32 above its own. Before
# it may stand CODECS, as baresip names them, SAID: how speech.py makes what it says, without the file, and MODULES besides.
start_phone() {
    local folder="$WORK/$1" module
    mkdir -p "$folder"
    python3 "$HERE/speech.py" ${SAID:-say $2 30} "$folder/said.wav"
    cat >"$folder/config" <<END
sip_listen $HOST:$2
rtp_ports $4-$(($4 + 3))
audio_source aufile,$folder/said.wav
audio_player aufile,$folder/played.wav
ausrc_srate 8000
module_path $(dirname "$(find /usr/lib -path '*/baresip/modules/account.so' | head -n 1)")
module g711.so
module aufile.so
module sndfile.so
$(for module in ${MODULES:-}; do echo "module $module.so"; done)
module_tmp account.so
module_app menu.so
module_app ctrl_tcp.so
ctrl_tcp_listen $HOST:$(($2 + 32))
snd_path $folder
END
    echo "<sip:$1@$HOST:$2>;regint=${REGINT:-0};audio_codecs=${CODECS:-PCMU};outbound=\"sip:$HOST:$3\"${5:+;$5}" >"$folder/accounts"
    touch "$folder/contacts"
    baresip -f "$folder" </dev/null >"$WORK/$1.log" 2>&1 &
    background+=($!)
    wait_for_port $! "$2" udp || fail "phone $1 does not start"
    wait_for_port $! $(($2 + 32)) tcp || fail "phone $1 takes no commands"
}

# tell_phone PORT COMMAND [PARAMETERS]
tell_phone() {
    local text="{\"command\":\"$2\",\"params\":\"${3:-}\"}"
    exec 9<>"/dev/tcp/$HOST/$(($1 + 32))" || fail "the phone does not listen"
    printf '%d:%s,' ${#text} "$text" >&9
    local answer
    IFS= read -r -t 1 -n 20 answer <&9
    exec 9>&-
}

# stop_phones: so that what they heard is written to its end
stop_phones() {
    local pid
    for pid in "${background[@]}"; do
        kill -TERM "$pid" 2>/dev/null
        wait "$pid" 2>/dev/null
    done
    background=()
}

# heard_by NAME: the file of what it heard
heard_by() { find "$WORK/$1" -name '*-dec.wav' | head -n 1; }

# expect_speech FROM TO FRAMES [LAWS]: at least so many frames of what FROM said were heard by TO as they were
expect_speech() {
    local heard
    heard=$(heard_by "$2")
    [[ -n $heard ]] || fail "phone $2 heard nothing"
    echo -n "$1 to $2: "
    python3 "$HERE/speech.py" compare "$WORK/$1/said.wav" "$heard" "$3" ${4:+"$4"} || fail "speech from $1 to $2"
}

# expect_voice FROM TO DECIBELS: what TO heard sounds like what FROM said, and not like what it said itself
expect_voice() {
    local heard
    heard=$(heard_by "$2")
    [[ -n $heard ]] || fail "phone $2 heard nothing"
    echo -n "$1 to $2: "
    python3 "$HERE/speech.py" distance "$WORK/$1/said.wav" "$heard" "$3" "$WORK/$2/said.wav" || fail "speech from $1 to $2"
}

# expect_digits NAME DIGITS: the phone was told these by telephone events, each once and in this order
expect_digits() {
    local heard i
    for ((i = 0; i < 60; i++)); do
        heard=$(tr '\r' '\n' <"$WORK/$1.log" | grep -a "received event: .* (end=1)" | sed "s/.*event: '\(.\)'.*/\1/" | tr -d '\n')
        [[ $heard == "$2" ]] && return 0
        sleep 0.05
    done
    fail "phone $1 was told '$heard' instead of '$2'"
}
