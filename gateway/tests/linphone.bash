# A phone that joins two calls, which baresip cannot: linphonec, beside phones.bash. It says nothing.

# start_linphone NAME PORT RTP-PORT: answers no call before it is told
start_linphone() {
    local folder="$WORK/$1"
    mkdir -p "$folder/.local/share/linphone"
    mkfifo "$folder/commands"
    cat >"$folder/config" <<END_OF_FILE
[sip]
sip_port=$2
sip_tcp_port=0
guess_hostname=0
[net]
firewall_policy=0
[rtp]
audio_rtp_port=$3
[video]
enabled=0
capture=0
display=0
automatically_initiate=0
automatically_accept=0
[misc]
history_max_size=0
END_OF_FILE
    HOME="$folder" linphonec -c "$folder/config" -d 0 <"$folder/commands" >"$WORK/$1.log" 2>&1 &
    background+=($!)
    exec 8>"$folder/commands"
    tell_linphone "soundcard use files"
    wait_for_port ${background[-1]} "$2" udp || fail "phone $1 does not start"
}

# tell_linphone COMMAND: to the last one that was started
tell_linphone() { echo "$1" >&8; }

# expect_linphone NAME TEXT [COUNT]: it has said so
expect_linphone() {
    local i
    for ((i = 0; i < 200; i++)); do
        (($(grep -c -- "$2" "$WORK/$1.log") >= ${3:-1})) && return 0
        sleep 0.05
    done
    fail "phone $1 does not say '$2'"
}
