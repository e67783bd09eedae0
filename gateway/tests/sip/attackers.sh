# The usual tools of attackers, as they are used: an address that serves others is not found; where everybody may ask, no
# user and no password is found out, a flood of requests gets no more octets than it has, and each source one line of the
# log at most. A phone that knows its password is served meanwhile.
. "$(dirname "$0")/../lib.bash"

[[ -n $(type -P sipsak) && -n $(type -P svwar) ]] || { echo "skipped: sipsak or sipvicious is not installed"; exit 0; }
ATTACKER=127.0.0.77
GUESSER=127.0.0.78
export HOME=$WORK # where the tools keep what they have found

printf 'alice:office:secret\nbob:office:12\n' >"$WORK/passwords"
chmod 600 "$WORK/passwords"
cat >"$WORK/gateway.toml" <<END
[gateway]
call-control-log-level = 2

[[sip]]
name = "a"
listen = "$HOST:$PORT_A"
peer = "$HOST:$PORT_CALLER"

[[sip]]
name = "b"
listen = "$HOST:$PORT_B"
allow = ["127.0.0.0/8"]
authenticate = true
realm = "office"
algorithms = ["MD5"] # which is all that svcrack knows
passwords = "$WORK/passwords"
registrar = true
END
# relay PORT INTERFACE-PORT NAME [ADDRESS]
relay() {
    python3 "$HERE/relay.py" "${4:-$ATTACKER}" "$1" $HOST "$2" "$WORK/$3.octets" &
    background+=($!)
    wait_for_port $! "$1" udp || fail "the relay does not start"
}
# expect_octets NAME LEAST: so many were sent, and no more came back
expect_octets() {
    local in out i
    for ((i = 0; i < 200; i++)); do # some may be on their way
        read -r in out <"$WORK/$1.octets"
        ((in >= $2)) && break
        sleep 0.05
    done
    ((in >= $2)) || fail "$1: the attack was none: $in octets"
    ((out <= in)) || fail "$1: $out octets for $in"
    echo "$1: $out octets for $in"
}
attack() { timeout "$1" "${@:2}" >"$WORK/attack.log" 2>&1; } # SECONDS COMMAND...: they go on for long when nothing answers
registering() { sipsak -U -s "sip:alice@$HOST:$PORT_B" -C "sip:alice@$HOST:5099" -u alice -a secret -x 60 >"$WORK/sipsak.log" 2>&1; }

start_gateway
relay $((PORT + 6)) "$PORT_A" closed
relay $((PORT + 7)) "$PORT_B" open
relay $((PORT + 14)) "$PORT_B" guessing $GUESSER

# an address that is for others
attack 3 svmap -p $((PORT + 6)) -P $((PORT + 8)) $ATTACKER
grep -q "$((PORT + 6))" "$WORK/attack.log" && fail "svmap has found it: $(cat "$WORK/attack.log")"
timeout 3 sipsak -s "sip:100@$ATTACKER:$((PORT + 6))" >"$WORK/attack.log" 2>&1 && fail "sipsak got an answer"
read -r in out <"$WORK/closed.octets"
((in > 300 && out == 0)) || fail "$out octets for $in at an address that is for others"

# one that anybody may ask: who is there, and with what password
attack 3 svwar -p $((PORT + 7)) -P $((PORT + 9)) -m REGISTER -e alice,bob,100-110 $ATTACKER
grep -qE 'alice|bob|\b100\b' <(grep -v '^\(WARNING\|ERROR\)' "$WORK/attack.log") && fail "svwar has found users: $(cat "$WORK/attack.log")"
attack 3 svwar -p $((PORT + 7)) -P $((PORT + 9)) -m INVITE --force -e alice,bob,dave,100-120 $ATTACKER
grep -q 'alice' "$WORK/attack.log" && ! grep -q 'dave' "$WORK/attack.log" && fail "svwar tells users from others: $(cat "$WORK/attack.log")"
# a flood of what nobody has asked for
attack 10 python3 - $ATTACKER $((PORT + 7)) <<'END'
import socket, sys, time
s = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
s.bind(("127.0.0.77", 0))
for method in ("OPTIONS", "INVITE", "CANCEL", "REGISTER"):
    for i in range(200):
        s.sendto(f"{method} sip:1@h SIP/2.0\r\nVia: SIP/2.0/UDP 127.0.0.77;rport;branch=z9hG4bK{method}{i}\r\nFrom: <sip:1@h>;tag=1\r\n"
                 f"To: <sip:1@h>\r\nCall-ID: {method}{i}\r\nCSeq: 1 {method}\r\n\r\n".encode(), (sys.argv[1], int(sys.argv[2])))
        if i % 10 == 9: time.sleep(0.01) # or what is in between loses some
END
registering || fail "a phone that knows its password is not served: $(cat "$WORK/sipsak.log")"
expect_octets open 60000

# and what the password is
timeout 30 svcrack -p $((PORT + 14)) -P $((PORT + 15)) -u bob -r 1-40 -z 2 $GUESSER >"$WORK/attack.log" 2>&1 & # as long as it tries
cracking=$!
background+=($cracking)
expect_log "$GUESSER has failed to say who it is"
kill $cracking
grep -qE '\| *bob' "$WORK/attack.log" && fail "svcrack has found the password: $(cat "$WORK/attack.log")"
expect_at_most_one() { (($(grep -E "$ATTACKER|$GUESSER" "$WORK/gateway.err" | grep -cE "$1") <= 1)) || fail "more than one line: $1"; }
expect_at_most_one "interface a: $ATTACKER sends more than"
expect_at_most_one "interface b: $ATTACKER sends more than"
(($(grep -E "$ATTACKER|$GUESSER" "$WORK/gateway.err" | grep -vc " sends more than ") == 1)) || fail "attackers fill the log: $(grep -E "$ATTACKER|$GUESSER" "$WORK/gateway.err")"
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"
finish
