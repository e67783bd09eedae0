# Connections that bring no calls: those that carried garbage, half a message or nothing are closed after their time; a
# source has only so many; and without any descriptor left the gateway neither spins nor stops taking calls.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"

open=()
# open_connections NUMBER TEXT
open_connections() {
    local i fd
    for ((i = 0; i < $1; i++)); do
        exec {fd}<>"/dev/tcp/$HOST/$PORT_A" || fail "no connection"
        { printf '%b' "$2" >&"$fd"; } 2>/dev/null
        open+=("$fd")
    done
}
close_connections() {
    local fd
    for fd in "${open[@]}"; do
        exec {fd}>&-
    done
    open=()
}
# how many the gateway has, whatever their state
connections() {
    local fd count=0
    for fd in "/proc/$gateway_pid/fd"/*; do
        [[ $(readlink "$fd") =~ ^socket:\[([0-9]+)\]$ ]] || continue
        awk -v port="$(printf ':%04X' "$PORT_A")" -v inode="${BASH_REMATCH[1]}" \
            'substr($2, length($2) - 4) == port && $4 != "0A" && $10 == inode { found = 1 } END { exit !found }' /proc/net/tcp &&
            count=$((count + 1))
    done
    echo $count
}
# expect_connections NUMBER: within 5 s
expect_connections() {
    local i
    for ((i = 0; i < 100; i++)); do
        (($(connections) == $1)) && return 0
        sleep 0.05
    done
    fail "$(connections) connections instead of $1"
}
ticks() { awk '{ print $14 + $15 }' "/proc/$gateway_pid/stat"; } # of processor time, 10 ms each


TCP='transports = ["udp", "tcp"]'
write_configuration '' "$TCP"$'\ntcp-idle = 1'
start_gateway
open_connections 3 'hello\r\n\r\n'
open_connections 3 'INVITE sip:x SIP/2.0\r\nContent-Length: 100\r\n\r\nshort'
open_connections 3 ''
expect_connections 0
close_connections
open_connections 5 'hello\r\n\r\n'
close_connections
expect_connections 0
expect_call -t t1
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"

write_configuration '' "$TCP"$'\nmax-connections-per-source = 4'
start_gateway
open_connections 10 ''
expect_connections 4
close_connections
expect_connections 0
expect_call -t t1 # those that are gone do not count
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"

# as many descriptors as the gateway needs itself, and a few, and none that it inherits; not with a sanitizer, which needs
# some for its own checks
grep -qa __ubsan_handle "$GATEWAY" && finish
served=$GATEWAY
GATEWAY=$WORK/limited
printf '#!/bin/bash\nfor fd in {3..20}; do eval "exec $fd>&-"; done\nulimit -n 28\nexec "%s" "$@"\n' "$served" >"$GATEWAY"
chmod +x "$GATEWAY"
write_configuration '' "$TCP"$'\nmax-connections-per-source = 1000\ntcp-idle = 1'
start_gateway
open_connections 60 ''
before=$(ticks)
expect_call
(($(ticks) - before < 30)) || fail "$((($(ticks) - before) * 10)) ms of processor time for a call without descriptors"
close_connections
expect_connections 0
expect_call -t t1
kill -USR1 $gateway_pid
expect_trace "^interface a: [0-9]+ messages of strangers, [0-9]+ too large, 0 too many, [1-9][0-9]* connections refused$"
stop_gateway "2 calls placed, 2 answered, 2 cleared, 0 failed"
finish
