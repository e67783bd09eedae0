# For tests of transfers, beside lib.bash: a third interface c, whose peer is the target of number 77 for interface b.
PORT_C=$((PORT + 6))
PORT_TARGET=$((PORT + 7))

# add_target [LINES-OF-INTERFACE]: to the configuration, which is written when there is none
add_target() {
    [[ -f $WORK/gateway.toml ]] || write_configuration
    sed -i '0,/^from = "b"$/s//from = "b"\nprefix = "4"/' "$WORK/gateway.toml"
    cat >>"$WORK/gateway.toml" <<END

[[sip]]
name = "c"
listen = "$HOST:$PORT_C"
peer = "$HOST:$PORT_TARGET"
${1:-}

[[route]]
from = "b"
prefix = "77"
to = "c"

[[route]]
from = "a"
prefix = "77"
to = "c"
END
}

start_target() { # SCENARIO [ARGUMENT]...
    write_scenario "$WORK/$1.xml" "$1"
    sipp "$HOST:$PORT_C" -sf "$WORK/$1.xml" -i "$HOST" -bind_local -p "$PORT_TARGET" -cp $((PORT + 8)) -mp $((PORT + 26)) \
        -nostdin -m 1 -timeout "${SIPP_TIMEOUT:-20s}" -timeout_error -trace_err -error_file "$WORK/target.log" "${@:2}" \
        >"$WORK/target.out" 2>&1 &
    target_pid=$!
    background=("$target_pid")
    wait_for_port $target_pid "$PORT_TARGET" udp || fail "the target does not start"
}

expect_target() {
    local status=0
    wait "$target_pid" || status=$?
    background=()
    ((status == 0)) || fail "target: exit status $status"
}
