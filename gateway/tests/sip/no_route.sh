# No route leads to the number: 404 with the cause, and nobody is called. The longest prefix decides, and a dry run tells how.
. "$(dirname "$0")/../lib.bash"

caller() { send_invite; expect 404 Reason: "Q.850;cause=3;"; send_ack_of_failure; }

write_configuration '' '' 49
start_gateway
expect_caller caller 4420
expect_log "call 1 a refused: no route to '4420', cause 3 "
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"

# asked without a call
told() { # LINES ARGUMENT...
    [[ $("$GATEWAY" --config "$WORK/gateway.toml" "${@:2}" 2>&1) == "$1" ]] || fail "${*:2}: $("$GATEWAY" --config "$WORK/gateway.toml" "${@:2}" 2>&1)"
}
printf '[[route]]\nfrom = "a"\nprefix = "4989"\nto = "a"\n' >>"$WORK/gateway.toml"
told '4989123 from a: prefix "4989" to a
4989123 from a: prefix "49" to b (not taken: a longer one fits)' --route 4989123 --from a
told '4420 from a: no route, 404 with cause 3' --route 4420 --from a
told "callcontrol-gateway: there is no interface 'c'" --route 4420 --from c
finish
