# The database of call records is away, and the disk where they wait for it is full: they wait in memory, up to a limit, then calls are
# refused. Nothing is lost once there is room again.
. "$(dirname "$0")/../lib.bash"
. "$(dirname "$0")/../plain_call.bash"
. "$(dirname "$0")/../postgresql.bash"
CTL=$3
export CALLCONTROL_GATEWAY_SOCKET=$WORK/control
mkdir "$WORK/spool"
mount -t tmpfs -o size=8m callcontrol "$WORK/spool" 2>/dev/null || skip "no file system may be mounted here"
trap 'end_server; umount -l "$WORK/spool"; cleanup' EXIT

refused() { send_invite; expect 503; send_ack_of_failure; }
# expect_stat NAME VALUE
expect_stat() {
    local i
    for ((i = 0; i < 400; i++)); do
        "$CTL" stats | grep -qE "^$1 +$2\$" && return 0
        sleep 0.05
    done
    fail "$1 is not $2: $("$CTL" stats)"
}

make_server
write_configuration
cat >>"$WORK/gateway.toml" <<END
[control]
socket = "$WORK/control"
[records]
postgresql = "$POSTGRESQL"
spool = "$WORK/spool"
kept = 2
when-full = "refuse"
END

start_gateway
expect_call
expect_stat records-spooled 1
expect_log 'error records: postgresql takes none, they wait on the disk: Connection refused'
dd if=/dev/zero of="$WORK/spool/other" bs=1k 2>/dev/null && fail "the disk never is full"
calls=1
until grep -q 'error records: the disk takes none, they wait in memory, 2 at most' "$WORK/gateway.err"; do # its last page takes some
    ((calls < 20)) || fail "$calls records fit on a full disk"
    expect_call
    calls=$((calls + 1))
    for ((i = 0; i < 20; i++)); do # what waits for longer is stuck
        "$CTL" stats | grep -qE '^records-waiting +0$' && break
        sleep 0.05
    done
done
if ! "$CTL" stats | grep -qE '^records-waiting +2$'; then
    expect_call
    calls=$((calls + 1))
fi
expect_stat records-waiting 2
expect_caller refused 4989123
expect_stat refused 1

rm "$WORK/spool/other"
expect_stat records-waiting 0
expect_stat records-spooled $calls
expect_log 'info records: the disk takes them again'
start_server
expect_stat records-spooled 0
expect_call
calls=$((calls + 1))
expect_stat records-written $calls
stop_gateway "$calls calls placed, $calls answered, $calls cleared, 0 failed"
[[ $(sql "select count(*), count(distinct call), max(call) from call_record") == "$calls|$calls|$calls" ]] ||
    fail "the records in the server are $(sql "select process, call from call_record")"
finish
