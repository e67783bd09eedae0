# The page with calls, in a browser: a call of two phones that speak, while it is up and when it is over.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"
PORT_PAGE=$((PORT + 37))

write_configuration
cat >>"$WORK/gateway.toml" <<END

[control]
socket = "$WORK/control"
[metrics]
listen = "$HOST:$PORT_PAGE"
page = true
token = "not-known-to-all"
[media]
mode = "relay"
first-port = $((PORT + 8))
last-port = $((PORT + 15))
END
start_gateway
# the system's Python, which has the package that speaks to browsers
look() { # NUMBER up|clear|over GATEWAYCTL
    /usr/bin/python3 "$HERE/operation/page.py" $PORT_PAGE $((PORT + 38)) "$WORK/browser-$1" "$3" "$WORK/control" "$2" >"$WORK/page.log" 2>&1 ||
        fail "what is seen of a call that is $2"
}
CODECS=PCMA start_phone alice "$PORT_CALLER" "$PORT_A" $((PORT + 16))
CODECS=PCMA start_phone bob "$PORT_CALLEE" "$PORT_B" $((PORT + 20)) answermode=auto
tell_phone "$PORT_CALLER" dial "sip:bob@$HOST:$PORT_A"
expect_log 'Accept call' 1
look 1 up "$3"

# what changes something is not to be had, nor what is no word for the socket
for path in drop/1/16 shutdown call/1%20--json calls?older=1%0Adrain 'call/%2D%2Djson' ../calls; do
    status=$(curl -s -o "$WORK/refused.log" -w '%{http_code}' --path-as-is "http://$HOST:$PORT_PAGE/control/$path")
    [[ $status == 404 ]] || fail "$path: $status"
done
post() { # TOKEN PATH
    curl -s -o "$WORK/posted.log" -w '%{http_code}' -X POST -H "Authorization: Bearer $1" "http://$HOST:$PORT_PAGE/control/$2"
}
[[ $(post "" drop/1/16) == 401 ]] || fail "without a token"
[[ $(post not-known-to-alL drop/1/16) == 401 ]] || fail "with another token"
[[ $(post not-known-to-all shutdown) == 404 ]] || fail "the end, with the token"
[[ $(post not-known-to-all drop/77/16) == 404 ]] || fail "a call that is not there"
grep -qF 'no call 77 is up' "$WORK/posted.log" || fail "no reason"
[[ $(post not-known-to-all block/a) == 200 && $(post not-known-to-all unblock/a) == 200 ]] || fail "an interface"
[[ $(curl -s "http://$HOST:$PORT_PAGE/control/status") == *'"state":"serving"'* ]] || fail "no state"
look 3 clear "$3"
expect_causes 1 16
look 2 over "$3"
stop_phones
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"
finish
