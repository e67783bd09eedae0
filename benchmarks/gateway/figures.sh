# What a gateway needs, by what the kernel tells of its process: memory from smaps_rollup (Pss), processor time from the schedstat of
# its threads. SIPp is the peers, whose time is not counted.
#
#     bash benchmarks/gateway/figures.sh GATEWAY PORT [CALLS [CONTACTS]]
. "$(dirname "${BASH_SOURCE[0]}")/../../gateway/tests/lib.bash"
. "$(dirname "${BASH_SOURCE[0]}")/measure.bash"
CALLS=${3:-1000}
CONTACTS=${4:-2000}
PORT_METRICS=$((PORT + 30))
SIPP_TIMEOUT=300s
LOG_LEVEL=info

probe() { send_request OPTIONS; expect 200; }
register() {
    local text="REGISTER sip:$HOST:$PORT_A SIP/2.0
Via: SIP/2.0/[transport] [local_ip]:[local_port];branch=[branch]
From: <sip:[field0]@$HOST>;tag=[pid]r[call_number]
To: <sip:[field0]@$HOST>
Call-ID: [call_id]
Contact: <sip:[field0]@$HOST:$PORT_CALLER>;expires=3600
Max-Forwards: 70"
    send_text retrans "$text"$'\nCSeq: 1 REGISTER' ''
    echo '<recv response="401" auth="true"/>'
    step=$((step + 1))
    send_text retrans "$text"$'\nCSeq: 2 REGISTER\n[field1]' ''
    expect 200
}

load() { # CALLS PER-SECOND MILLISECONDS
    HELD=$3
    start_callee callee -m "$1"
    run_caller caller 4989123 -m "$1" -r "$2" -l 10000 || fail "caller: exit status $?"
    expect_callee
}
# calls_up HOW: memory of a call while it is up, at first with the transactions that began it, which last 64 times T1
calls_up() {
    local before
    before=$(memory)
    HELD=$((CALLS * 10 + 45000))
    start_callee callee -m "$CALLS"
    run_caller caller 4989123 -m "$CALLS" -r 100 -l 10000 &
    background=($!)
    until (($(scrape 1 | awk '$1 == "callcontrol_gateway_calls_answered_total" { print $2 }') == CALLS)); do sleep 0.1; done
    tell "memory of a call in its first half minute, $1" "$(divided $((($(memory) - before) * 1024)) "$CALLS")" octets
    sleep 36
    tell "memory of a call from then on, $1" "$(divided $((($(memory) - before) * 1024)) "$CALLS")" octets
    wait "${background[0]}" || fail "caller: exit status $?"
    background=()
    expect_callee
}

configure 'max-requests-per-source = 0'
start_gateway_as_shipped
tell "memory, no call yet" "$(memory)" KiB
before=$(processor)
sleep 10
tell "processor time, idle" "$(divided $(($(processor) - before)) 10000)" "ms a second"
calls_up "speech between the peers"
before=$(processor)
load "$CALLS" 100 100
tell "processor time of a call" "$(divided $(($(processor) - before)) "$CALLS")" us
tell "record of a call" "$(divided "$(stat -c %s "$WORK/calls.jsonl")" $((2 * CALLS)))" octets
before=$(processor)
run_caller probe x -m "$CALLS" -r 400 || fail "probes: exit status $?"
tell "processor time of a probe (OPTIONS)" "$(divided $(($(processor) - before)) "$CALLS")" us
before=$(processor)
scrape 200 >"$WORK/page"
tell "processor time of a scrape" "$(divided $(($(processor) - before)) 200)" us
tell "a scrape" "$(stat -c %s "$WORK/page")" octets
tell "figures in a scrape" "$(grep -vc '^#' "$WORK/page")" ''
end_gateway

RELAYED=gateway # what session descriptions have then
configure "codecs = [\"PCMA\"]" $'\n[media]\nmode = "relay"\nfirst-port = 40000\nlast-port = 59999'
start_gateway_as_shipped
tell "memory, no call yet, speech through the gateway" "$(memory)" KiB
calls_up "speech through the gateway"
before=$(processor)
load "$CALLS" 100 100
tell "processor time of a call, speech through the gateway" "$(divided $(($(processor) - before)) "$CALLS")" "us, without its packets"
end_gateway

for ((i = 0; i < CONTACTS; i++)); do echo "u$i:office:secret"; done >"$WORK/passwords"
chmod 600 "$WORK/passwords"
RELAYED=
{ echo SEQUENTIAL; for ((i = 0; i < CONTACTS; i++)); do echo "u$i;[authentication username=u$i password=secret]"; done; } >"$WORK/users.csv"
configure 'max-requests-per-source = 0'
sed -i -e "s,^name = \"a\",&\nauthenticate = true\nregistrar = true\nrealm = \"office\"\nalgorithms = [\"MD5\"]\npasswords = \"$WORK/passwords\"\nregistrations = \"$WORK/contacts\"\nallow = [\"$HOST\"]," \
    -e "/^peer = \"$HOST:$PORT_CALLER\"/d" "$WORK/gateway.toml"
start_gateway_as_shipped
before=$(memory)
run_caller register x -inf "$WORK/users.csv" -m "$CONTACTS" -r 200 || fail "registrations: exit status $?"
tell "memory of a contact, with its transactions" "$(divided $((($(memory) - before) * 1024)) "$CONTACTS")" octets
before=$(processor)
run_caller register x -inf "$WORK/users.csv" -m "$CONTACTS" -r 200 || fail "registrations: exit status $?"
tell "processor time of a registration (401, then 200)" "$(divided $(($(processor) - before)) "$CONTACTS")" us
end_gateway
