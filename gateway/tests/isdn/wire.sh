# A table of wire/, row by row: what is said on one wire and what is heard on the other, between SIP and lines of which the
# gateway is the user (b) and the network (c). All rows are calls through one gateway. wire.table is of what crosses,
# faults.table of exchanges that do wrong, prefixes.table of a gateway that knows its country,
# charges.table of a SIP peer that tells charges; a test is called as
#
#     bash wire.sh GATEWAY PORT EXCHANGE wire|faults|prefixes|charges
. "$(dirname "$0")/isdn.bash"

WIRE=$(dirname "$0")/wire
TABLE=$WIRE/$4.table
read -r rows from_sip to_sip < <(python3 "$WIRE/wire.py" write "$TABLE" "$WORK") || fail "no table"
charges=tell
[[ $4 == charges ]] && charges=take
write_isdn_configuration '' "codecs = [\"PCMA\", \"CLEARMODE\"]
charges = \"$charges\""
sed -i "/^\[\[route/,\$d; s/^t200 = .*/t200 = 200\nt303 = 400\nt305 = 500\nt308 = 500\nt309 = 1000\nanswer = 2000/; s/^last-port = .*/last-port = $((PORT + 99))/; s/^first-port = .*/first-port = $((PORT + 40))/" "$WORK/gateway.toml"
cat >>"$WORK/gateway.toml" <<END
[[isdn]]
name = "c"
line = "$LINE.c"
side = "network"
[isdn.timers]
reopening = 50
answer = 2000
t302 = 500
$(for from in a b c; do
    for to in a:44 b:49 c:48; do
        printf '[[route]]\nfrom = "%s"\nprefix = "%s"\nto = "%s"\n' $from ${to#*:} ${to%:*} $from "+${to#*:}" ${to%:*}
    done
done)
END
if [[ $4 == prefixes ]]; then
    sed -i 's/^\[gateway\]/&\ninternational-prefix = "00"\nnational-prefix = "0"\ncountry-code = "49"/' "$WORK/gateway.toml"
    for prefix in +498 +4948; do
        printf '[[route]]\nfrom = "b"\nprefix = "%s"\nto = "c"\n' $prefix
    done >>"$WORK/gateway.toml"
fi
for wire in b c; do
    {
        printf 'line = "%s"\ncapture = "%s"\n' "$LINE$([[ $wire == b ]] || echo .c)" "$WORK/$wire.pcap"
        [[ $wire == b ]] || echo 'user = true'
        cat "$WORK/plan_$wire.toml"
    } >"$WORK/$wire.toml"
    "$EXCHANGE" "$WORK/$wire.toml" >"$WORK/exchange_$wire.out" 2>"$WORK/exchange_$wire.log" &
    background+=($!)
done
for ((i = 0; i < 200; i++)); do
    (($(cat "$WORK"/exchange_?.out | grep -c listens) == 2)) && break
    sleep 0.05
done

sipp_rows() { # SCENARIO PORT CALLS: what SIPp is to be told
    ARGUMENTS=(-sf "$WORK/$1.xml" -i "$HOST" -bind_local -p "$2" -cp $(($2 + 1)) -mp $(($2 + 2)) -nostdin -m "$3" -trace_msg
        -message_file "$WORK/$1.messages" -message_overwrite true -trace_err -error_file "$WORK/$1.log" -timeout 40s -timeout_error)
}
sipp_rows to_sip "$PORT_CALLER" "$to_sip"
sipp "${ARGUMENTS[@]}" "$HOST:$PORT_A" >"$WORK/to_sip.out" 2>&1 &
background+=($!)
wait_for_port $! "$PORT_CALLER" udp || fail "the callee does not start"
start_isdn_gateway
expect_log 'interface c: the link is up'
sipp_rows from_sip $((PORT_CALLER + 16)) "$from_sip"
((from_sip == 0)) || sipp "${ARGUMENTS[@]}" -inf "$WORK/from_sip.csv" -r 100 -l 8 "$HOST:$PORT_A" >"$WORK/from_sip.out" 2>&1 # the judge tells of which it makes nothing
for ((i = 0; i < 300; i++)); do
    (($(grep -c 'calling side.* released' "$WORK/gateway.err") >= rows)) && break
    sleep 0.1
done
python3 "$WIRE/wire.py" judge "$TABLE" "$WORK" || fail "rows"
for wire in b c; do
    [[ $4 == faults || $4$wire == chargesb ]] || CAPTURE=$WORK/$wire.pcap expect_wellformed
done
for ((i = 0; i < 100; i++)); do # the last calls' ends are on their way
    kill -USR1 $gateway_pid
    sleep 0.1
    (($(tail -n 40 "$WORK/gateway.out" | grep -cE 'interface [bc]: link up, 30 channels free') >= 2)) && break
done
((i < 100)) || fail "channels are left over: $(grep 'channels free' "$WORK/gateway.out" | tail -n 2)"
kill -TERM $gateway_pid
wait $gateway_pid || fail "gateway: exit status $?"
gateway_pid=0
grep -q " 0 left over" "$WORK/gateway.out" || fail "calls are left over"
finish
