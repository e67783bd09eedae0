# A phone registers through kamailio, the proxy at the edge of a network whose addresses the gateway does not serve, and is
# called through it, also by a gateway that was killed meanwhile: what the phone itself sends never gets past the guard.
# RFC 3327.
. "$(dirname "$0")/../lib.bash"
. "$HERE/phones.bash"
PORT_EDGE=$((PORT + 6))
INSIDE=127.0.2.$((PORT / 40 % 250 + 1)) # where the phone is
CONTACT="Contact: <sip:x@192.0.2.1>"

start_edge() {
    cat >"$WORK/kamailio.cfg" <<END
#!KAMAILIO
debug=0
log_stderror=yes
children=1
auto_aliases=no
listen=udp:$HOST:$PORT_EDGE
listen=udp:$INSIDE:$PORT_EDGE
disable_tcp=yes
mhomed=1
mpath="$(dirname "$(find /usr/lib -path '*/kamailio/modules/path.so' | head -n 1)")/"
loadmodule "sl.so"
loadmodule "tm.so"
loadmodule "rr.so"
loadmodule "pv.so"
loadmodule "siputils.so"
loadmodule "textops.so"
loadmodule "path.so"
modparam("rr", "enable_double_rr", 0)
modparam("path", "use_received", 0)
request_route {
    if (is_method("REGISTER")) {
        add_path();
        \$fs = "udp:$HOST:$PORT_EDGE";
        \$du = "sip:$HOST:$PORT_A";
        t_relay();
        exit;
    }
    if (is_method("INVITE")) record_route();
    loose_route();
    if (src_ip == $HOST) \$fs = "udp:$INSIDE:$PORT_EDGE"; else \$fs = "udp:$HOST:$PORT_EDGE";
    t_relay();
}
END
    kamailio -DD -E -f "$WORK/kamailio.cfg" -Y "$WORK" -m 16 -M 4 >"$WORK/kamailio.log" 2>&1 &
    kamailio_pid=$!
    trap 'kill -TERM $kamailio_pid 2>/dev/null; wait $kamailio_pid; cleanup' EXIT # its processes end with it
    local i
    for ((i = 0; i < 200; i++)); do
        grep -q "$(printf ':%04X' "$PORT_EDGE")" /proc/net/udp && return 0
        kill -0 $kamailio_pid 2>/dev/null || fail "kamailio does not start"
        sleep 0.05
    done
    fail "kamailio does not listen"
}
# register SEQUENCE STATUS [PART REGEXP]... -- HEADER...: as alice, who shows no phone
register() {
    local sequence=$1 status=$2 checked=()
    shift 2
    while [[ $1 != -- ]]; do checked+=("$1"); shift; done
    shift
    local text="REGISTER sip:$HOST:$PORT_A SIP/2.0
Via: SIP/2.0/[transport] [local_ip]:[local_port];branch=[branch]
From: <sip:alice@$HOST>;tag=[pid]r[call_number]
To: <sip:alice@$HOST>
Call-ID: [call_id]
Max-Forwards: 70"
    send_text retrans "$text
CSeq: $sequence REGISTER
$(printf '%s\n' "$@")" ''
    echo '<recv response="401" auth="true"/>'
    step=$((step + 1))
    send_text retrans "$text
CSeq: $((sequence + 1)) REGISTER
[authentication username=alice password=secret]
$(printf '%s\n' "$@")" ''
    expect_optional 401 # again, to a first one that was repeated
    expect "$status" ${checked[@]+"${checked[@]}"}
}
proxies() {
    register 1 403 -- "$CONTACT" "Path: <sip:192.0.2.2;lr>" # which is not served
    register 3 403 -- "$CONTACT" "Path: <sip:edge.example;lr>"
    register 5 403 -- "$CONTACT" "Path: <sip:$HOST:$PORT_A;lr>" # ourselves
    register 7 400 -- "$CONTACT" "Path: <sip:$HOST:$PORT_EDGE>" # without loose routing
    register 9 403 -- "$CONTACT"                                # nobody on the way
    register 11 200 nowhere "^Path" -- "$CONTACT" "Path: <sip:$HOST:$PORT_EDGE;lr>"
    register 13 200 Path: "sip:$HOST:$PORT_EDGE;lr" msg "Path: .sip:192.0.2.3;lr" -- "$CONTACT" "Supported: path" "Require: path" \
        "Path: <sip:$HOST:$PORT_EDGE;lr>" "Path: <sip:192.0.2.3;lr>"
    register 15 200 -- "Contact: *" "Expires: 0"
}
caller() { call_up; pause 300; send_bye; expect 200; }
not_understood() { send_request OPTIONS "Require: path"; expect 420 Unsupported: path; }
expect_contacts() {
    kill -USR1 $gateway_pid
    expect_trace "^interface a: $1 contacts, "
}
in_file() { python3 -c 'import sqlite3, sys; print(sqlite3.connect(sys.argv[1]).execute("select count(*) from binding where route like ?", (sys.argv[2],)).fetchone()[0])' "$WORK/contacts" "%<sip:$HOST:$PORT_EDGE;lr%"; }
call_bob() {
    PORT_A=$PORT_B PORT_CALLER=$PORT_CALLEE RELAYED=. expect_caller caller bob
    expect_log 'call 1 b \(calling side\) released: cause 16 '
    expect_log 'call 1 a \(called side\) released: cause 16 '
    expect_trace "-> INVITE sip:bob[^ ]*@$INSIDE:$PORT_CALLER[^ ]* by <sip:$HOST:$PORT_EDGE;lr"
}

printf 'alice:office:secret\nbob:office:secret\n' >"$WORK/passwords"
chmod 600 "$WORK/passwords"
write_configuration
sed -i -e "s,^name = \"a\",&\nauthenticate = true\nregistrar = true\nrealm = \"office\"\nalgorithms = [\"MD5\"]\npasswords = \"$WORK/passwords\"\nregistrations = \"$WORK/contacts\"\nallow = [\"$HOST\"]," \
    -e "/^peer = \"$HOST:$PORT_CALLER\"/d" "$WORK/gateway.toml"
start_gateway
expect_caller proxies x
PORT_A=$PORT_B expect_caller not_understood x

start_edge
HOST=$INSIDE CODECS=PCMA REGINT=600 start_phone bob "$PORT_CALLER" "$PORT_EDGE" $((PORT + 16)) "answermode=auto;auth_user=bob;auth_pass=secret"
for ((i = 0; i < 100; i++)); do [[ $(in_file) == 1 ]] && break; sleep 0.05; done
[[ $(in_file) == 1 ]] || fail "the phone has not registered"
call_bob
kill -KILL $gateway_pid
wait $gateway_pid 2>/dev/null
start_gateway
call_bob
stop_gateway "1 calls placed, 1 answered, 1 cleared, 0 failed"

# the file of a gateway that knew nothing of this
python3 -c 'import sqlite3, sys; sqlite3.connect(sys.argv[1]).execute("alter table binding drop column route")' "$WORK/contacts"
start_gateway
expect_contacts 1
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"
finish
