# Modules come from the folder of the gateway's modules, third parties' as our own; what is no module is refused in one
# line; without SIP nothing of a SIP stack is in the process.
. "$(dirname "$0")/../lib.bash"
MODULES=$3

# refused LINE CONFIGURATION
refused() {
    printf '%s' "$2" >"$WORK/gateway.toml"
    "$GATEWAY" --config "$WORK/gateway.toml" --modules "$MODULES" >"$WORK/gateway.out" 2>"$WORK/gateway.err" && fail "served: $2"
    (($(wc -l <"$WORK/gateway.err") == 1)) || fail "more than one line"
    grep -qE "^callcontrol-gateway: $WORK/gateway.toml: $1$" "$WORK/gateway.err" || fail "the line does not match: $1"
}

refused "ghost: is not a key, and there is no module $MODULES/callcontrol-gateway-ghost.so" $'[[ghost]]\nname = "a"\n'
refused "\.\./fakes: is neither a key nor the name of a module" $'[["../fakes"]]\nname = "a"\n'
refused "old: $MODULES/callcontrol-gateway-old.so is a module of version 0, this gateway's are of version 4" \
    $'[[old]]\nname = "a"\n'
refused "text: $MODULES/callcontrol-gateway-text.so: (file too short|invalid ELF header)" $'[[text]]\nname = "a"\n'
refused "empty: $MODULES/callcontrol-gateway-empty.so is no module of a gateway" $'[[empty]]\nname = "a"\n'
refused "fakes\[0\].number: is not a key" $'[[fakes]]\nname = "a"\nnumber = 3\n'
refused "others: needs the outermost loop, which another module has" \
    $'[[fakes]]\nname = "a"\nloop = 1\n[[others]]\nname = "b"\nloop = 1\n'

printf '[gateway]\nclear-after = 0\n[[fakes]]\nname = "anna"\n[[fakes]]\nname = "bert"\n' >"$WORK/gateway.toml"
"$GATEWAY" --config "$WORK/gateway.toml" --modules "$MODULES" --log-level debug >"$WORK/gateway.out" 2>"$WORK/gateway.err" &
gateway_pid=$!
expect_log 'reload lock taken by Call-Control'
kill -USR1 $gateway_pid
expect_trace '^state: 1 calls up$'
expect_trace '^fake anna sees CONNECTED$'
grep -q 'sofia' "/proc/$gateway_pid/maps" && fail "a SIP stack is in a gateway without SIP"
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"
expect_log 'ending: 1 calls are cleared'
finish
