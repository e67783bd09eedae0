# A phone behind a masquerading router registers, calls, is called, hears and is heard, hangs up and is hung up, although
# it tells everybody an address that only its own network knows. Phone and router are in network namespaces of their own.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"

ROUTER=nat-r$PORT PHONE=nat-p$PORT
NETWORK=198.18.$((PORT / 40 % 256)) INSIDE=192.168.$((PORT / 40 % 256))
remove_networks() { ip netns del $ROUTER 2>/dev/null; ip netns del $PHONE 2>/dev/null; }
skip() {
    remove_networks
    echo "skipped: $1"
    exit 0
}
trap 'remove_networks; cleanup' EXIT
[[ $(id -u) == 0 ]] || skip "network namespaces are for root"
[[ -n $(type -P ip) && -n $(type -P iptables) ]] || skip "ip or iptables is not installed"
remove_networks
{ ip netns add $ROUTER && ip netns add $PHONE; } 2>/dev/null || skip "no network namespaces here"
in_router() { ip netns exec $ROUTER "$@"; }
in_phone() { ip netns exec $PHONE "$@"; }
build_networks() {
    ip link add nat-o$PORT type veth peer name outside netns $ROUTER &&
        ip addr add $NETWORK.1/24 dev nat-o$PORT && ip link set nat-o$PORT up &&
        in_router ip link add inside type veth peer name phone netns $PHONE &&
        in_router ip addr add $NETWORK.2/24 dev outside && in_router ip link set outside up &&
        in_router ip addr add $INSIDE.1/24 dev inside && in_router ip link set inside up &&
        in_router ip route add default via $NETWORK.1 &&
        in_router sysctl -q -w net.ipv4.ip_forward=1 &&
        in_router iptables -t nat -A POSTROUTING -o outside -p udp -j MASQUERADE --to-ports 40000-60000 --random &&
        in_phone ip addr add $INSIDE.2/24 dev phone && in_phone ip link set phone up && in_phone ip link set lo up &&
        in_phone ip route add default via $INSIDE.1
}
build_networks 2>"$WORK/networks.log" || skip "the networks cannot be made: $(cat "$WORK/networks.log")"

# the phone inside: as start_phone, but in its own network, where commands for it come by a file
start_inner_phone() {
    local folder="$WORK/inner"
    mkdir -p "$folder"
    python3 "$HERE/speech.py" say 99 60 "$folder/said.wav"
    cat >"$folder/config" <<END
sip_listen $INSIDE.2:5062
net_interface phone
rtp_ports 30000-30003
audio_source aufile,$folder/said.wav
audio_player aufile,$folder/played.wav
ausrc_srate 8000
module_path $(dirname "$(find /usr/lib -path '*/baresip/modules/account.so' | head -n 1)")
module g711.so
module aufile.so
module sndfile.so
module_tmp account.so
module_app menu.so
module_app ctrl_tcp.so
ctrl_tcp_listen $INSIDE.2:4444
snd_path $folder
END
    echo "<sip:inner@$NETWORK.1:$PORT_A>;regint=600;audio_codecs=PCMU;answermode=auto;auth_user=inner;auth_pass=secret" >"$folder/accounts"
    touch "$folder/contacts"
    ip netns exec $PHONE baresip -f "$folder" </dev/null >"$WORK/inner.log" 2>&1 & # not by the function: that would be a shell with a child
    background+=($!)
}
tell_inner_phone() {
    in_phone bash -c '. "$1"; HOST=$2; fail() { exit 1; }; tell_phone "${@:3}"' - "$HERE/phones.bash" $INSIDE.2 $((4444 - 32)) "$@" ||
        fail "the inner phone does not listen"
}

heard_by() { find "$WORK/$1" -name '*-dec.wav' -printf '%s %p\n' | sort -rn | head -n 1 | cut -d' ' -f2; } # of several calls the longest

printf 'inner:office:secret\n' >"$WORK/passwords"
chmod 600 "$WORK/passwords"
cat >"$WORK/gateway.toml" <<END
[gateway]
call-control-log-level = 2

[media]
mode = "relay"
first-port = $((PORT + 32))
last-port = $((PORT + 39))

[[sip]]
name = "a"
listen = "$NETWORK.1:$PORT_A"
allow = ["$NETWORK.0/24"]
nat = true
authenticate = true
realm = "office"
algorithms = ["MD5"]
passwords = "$WORK/passwords"
registrar = true

[[sip]]
name = "b"
listen = "$HOST:$PORT_B"
peer = "$HOST:$PORT_CALLEE"

[[route]]
from = "a"
to = "b"

[[route]]
from = "b"
to = "a"
END
registered() { # TIMES
    local i
    for ((i = 0; i < 200; i++)); do
        kill -USR1 $gateway_pid
        sleep 0.05
        grep -qE "^interface a: 1 contacts, $1 " "$WORK/gateway.out" && return 0
    done
    fail "the phone behind the router has not registered"
}
expect_frames() { # PHONE: until enough was heard
    local i
    for ((i = 0; i < 200; i++)); do
        (($(stat -c %s "$(heard_by "$1")" 2>/dev/null || echo 0) > 40000)) && return 0
        sleep 0.05
    done
    fail "phone $1 heard next to nothing"
}

start_gateway
start_inner_phone
registered 1
start_phone outer "$PORT_CALLEE" "$PORT_B" $((PORT + 16)) "answermode=auto"

# it calls and hangs up
tell_inner_phone dial "sip:outer@$NETWORK.1:$PORT_A"
expect_log 'EP b/1\] Accept call'
expect_frames outer
expect_frames inner
tell_inner_phone hangup
expect_log 'call 1 a \(calling side\) released: cause 16 '
expect_log 'call 1: inner on a to outer on b, answered .* cleared by a'

# it calls and is hung up: the BYE finds it
tell_inner_phone dial "sip:outer@$NETWORK.1:$PORT_A"
expect_log 'EP b/2\] Accept call'
sleep 0.5
tell_phone "$PORT_CALLEE" hangup
expect_log 'call 2: inner on a to outer on b, answered .* cleared by b'
wait_for_text() { local i; for ((i = 0; i < 200; i++)); do tr '\r' '\n' <"$WORK/$1.log" | grep -aqE "$2" && return 0; sleep 0.05; done; fail "phone $1 does not say: $2"; }
wait_for_text inner 'session closed|Call with .* terminated'

# it is called, and is hung up
tell_phone "$PORT_CALLEE" dial "sip:inner@$HOST:$PORT_B"
expect_log 'EP a/3\] Accept call'
sleep 0.5
tell_phone "$PORT_CALLEE" hangup
expect_log 'call 3: outer on b to inner on a, answered .* cleared by b'
stop_phones
stop_gateway "3 calls placed, 3 answered, 3 cleared, 0 failed"
expect_speech inner outer 50
expect_speech outer inner 50
finish
