# What an operator hears of who is registered: a phone with the gateway, the gateway with a provider, which then wants to be
# left alone.
. "$(dirname "$0")/../lib.bash"
CTL=$3
export CALLCONTROL_GATEWAY_SOCKET=$WORK/control

# expect_line PATTERN COMMAND...: sooner or later
expect_line() {
    local i
    for ((i = 0; i < 200; i++)); do
        "$CTL" "${@:2}" >"$WORK/ctl.log" 2>&1 && grep -qE -- "$1" "$WORK/ctl.log" && return 0
        sleep 0.05
    done
    fail "gatewayctl ${*:2}: no line matches $1"
}
phone() {
    local text="REGISTER sip:$HOST:$PORT_A SIP/2.0
Via: SIP/2.0/[transport] [local_ip]:[local_port];branch=[branch]
From: <sip:alice@$HOST>;tag=[pid]r[call_number]
To: <sip:alice@$HOST>
Call-ID: [call_id]
Max-Forwards: 70
Contact: <sip:alice@$HOST:$PORT_CALLER>;expires=600"
    send_text retrans "$text
CSeq: 1 REGISTER" ''
    echo '<recv response="401" auth="true"/>'
    step=$((step + 1))
    send_text retrans "$text
CSeq: 2 REGISTER
[authentication username=alice password=secret]" ''
    expect 200
}
provider() {
    expect_request REGISTER
    send_text '' "SIP/2.0 200 OK
[last_Via:]
[last_From:]
[last_To:];tag=[pid]registrar
[last_Call-ID:]
[last_CSeq:]
[last_Contact:]
Expires: 300" ''
}
busy() { expect_invite; respond_finally "503 Service Unavailable" "Retry-After: 30"; expect_request ACK; }
caller() { send_invite; expect 100; expect 503; send_ack_of_failure; }

printf 'alice:office:secret\n4420:*:secret\n' >"$WORK/passwords"
chmod 600 "$WORK/passwords"
write_configuration
printf '[control]\nsocket = "%s"\n' "$WORK/control" >>"$WORK/gateway.toml"
sed -i -e "s,^name = \"a\",&\nregistrar = true\nauthenticate = true\nrealm = \"office\"\nalgorithms = [\"MD5\"]\npasswords = \"$WORK/passwords\"\nallow = [\"$HOST\"]," \
    -e "s,^name = \"b\",&\nregister = true\nuser = \"4420\"\npasswords = \"$WORK/passwords\"," "$WORK/gateway.toml"
start_callee provider
start_gateway
expect_callee
expect_line "^b +peer +4420 +$HOST:$PORT_CALLEE +(300|29[0-9])\$" registrations
expect_line '^interface +side +user +contact +seconds$' registrations
expect_caller phone x
expect_line "^a +here +alice +sip:alice@$HOST:$PORT_CALLER +(600|59[0-9])\$" registrations
expect_line "^\\{\"interface\":\"a\",\"side\":\"here\",\"user\":\"alice\",\"contact\":\"sip:alice@$HOST:$PORT_CALLER\",\"seconds\":\"[0-9]+\"\\}\$" \
    registrations --json
expect_line "^b +$HOST:$PORT_CALLEE +called\$" peers
kill -KILL $gateway_pid
wait $gateway_pid 2>/dev/null

sed -i -e '/^register = true/d' -e '/^registrar = true/d' -e '/^authenticate = true/d' -e '/^realm =/d' -e '/^algorithms =/d' -e '/^passwords =/d' -e '/^user =/d' "$WORK/gateway.toml"
start_gateway
start_callee busy
expect_caller caller 4989123
expect_callee
expect_line "^b +$HOST:$PORT_CALLEE +busy\$" peers
expect_line '^a .* called$' peers
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
finish
