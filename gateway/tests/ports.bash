# Which process listens where, from what the kernel tells; sourced by the tests and the demonstration.

# owns_port PID PORT udp|tcp: whether the process has that port. Asked before any load, so that none goes to a stranger.
owns_port() {
    local inode
    for inode in $(awk -v port="$(printf ':%04X' "$2")" \
        'substr($2, length($2) - 4) == port && ($4 == "07" || $4 == "0A") { print $10 }' "/proc/net/$3" "/proc/net/${3}6" 2>/dev/null); do
        if find "/proc/$1/fd" -lname "socket:\[$inode\]" 2>/dev/null | grep -q .; then
            return 0
        fi
    done
    return 1
}

# wait_for_port PID PORT udp|tcp: at most 10 s; fails at once when the process ends.
wait_for_port() {
    local i
    for ((i = 0; i < 200; i++)); do
        owns_port "$1" "$2" "$3" && return 0
        kill -0 "$1" 2>/dev/null || return 1
        sleep 0.05
    done
    return 1
}
