# A thousand users register, are still known after the gateway was killed, and each can speak only for himself.
# RFC 3261, 10.3.
. "$(dirname "$0")/../lib.bash"

USERS=1000
# register SEQUENCE STATUS [PART REGEXP]... -- HEADER...: with the password of the injected line's first user, for the second
register() {
    local sequence=$1 status=$2 checked=()
    shift 2
    while [[ $1 != -- ]]; do checked+=("$1"); shift; done
    shift
    local text="REGISTER sip:$HOST:$PORT_A SIP/2.0
Via: SIP/2.0/[transport] [local_ip]:[local_port];branch=[branch]
From: <sip:[field0]@$HOST>;tag=[pid]r[call_number]
To: <sip:[field1]@$HOST>
Call-ID: [call_id]
Max-Forwards: 70"
    send_text retrans "$text
CSeq: $sequence REGISTER
$(printf '%s\n' "$@")" ''
    echo '<recv response="401" auth="true"/>'
    step=$((step + 1))
    send_text retrans "$text
CSeq: $((sequence + 1)) REGISTER
[field2]
$(printf '%s\n' "$@")" ''
    expect_optional 401 # again, to a first one that was repeated
    expect "$status" ${checked[@]+"${checked[@]}"}
}
CONTACT='Contact: <sip:[field0]@'"$HOST:$PORT_CALLER>"
many() { register 1 200 Contact: "sip:u[0-9]+@$HOST:$PORT_CALLER.;expires=(600|599);q=1.000" -- "$CONTACT;expires=600"; }
one() {
    register 1 423 Min-Expires: "^ *60" -- "$CONTACT;expires=59"
    register 3 403 nowhere "^Contact" -- "Contact: <sip:x@192.0.2.1>" # nobody's that we serve
    register 5 403 nowhere "^Contact" -- "Contact: <sip:x@$HOST:$PORT_A>" # ourselves
    register 7 403 nowhere "^Contact" -- "Contact: <sip:x@example.net>"
    register 9 400 nowhere "^Contact" -- "Contact: *"
    register 21 200 Contact: "expires=3600;q=0.500" -- "$CONTACT;q=0.5" "Expires: 999999"
    register 23 200 Contact: "expires=" -- "Subject: who is there"
    register 15 500 nowhere "^Contact" -- "$CONTACT" # which has been overtaken
    register 25 200 nowhere "Contact" -- "Contact: *" "Expires: 0"
}
other() { register 1 403 nowhere "^Contact" -- "$CONTACT"; }
run_users() { # SCENARIO "USER;USER-THAT-IS-NAMED"... as lines [ARGUMENT]...
    { echo SEQUENTIAL; sed -E 's/^([^;]+);.*/&;[authentication username=\1 password=secret]/' <<<"$2"; } >"$WORK/users.csv"
    run_caller "$1" x -inf "$WORK/users.csv" "${@:3}" || fail "$1: exit status $?"
}
expect_contacts() {
    kill -USR1 $gateway_pid
    expect_trace "^interface a: $1 contacts, $2$"
}
in_file() { python3 -c 'import sqlite3, sys; print(sqlite3.connect(sys.argv[1]).execute("select count(*) from binding").fetchone()[0])' "$WORK/contacts"; }

for ((i = 0; i < USERS; i++)); do echo "u$i:office:secret"; done >"$WORK/passwords"
chmod 600 "$WORK/passwords"
write_configuration
sed -i -e "s,^name = \"a\",&\nauthenticate = true\nregistrar = true\nmax-requests-per-source = 0\nrealm = \"office\"\nalgorithms = [\"MD5\"]\npasswords = \"$WORK/passwords\"\nregistrations = \"$WORK/contacts\"\nallow = [\"$HOST\"]," \
    -e "/^peer = \"$HOST:$PORT_CALLER\"/d" "$WORK/gateway.toml"
start_gateway
run_users many "$(for ((i = 0; i < USERS; i++)); do echo "u$i;u$i"; done)" -m $USERS -r 1000 -l 200
expect_contacts $USERS "$USERS registrations taken, 0 refused, 0 failures to write"
for ((i = 0; i < 100; i++)); do [[ $(in_file) == "$USERS" ]] && break; sleep 0.05; done
kill -KILL $gateway_pid
wait $gateway_pid 2>/dev/null
start_gateway
expect_contacts $USERS "0 registrations taken, 0 refused, 0 failures to write"

run_users one "u1;u1"
expect_contacts $((USERS - 1)) "3 registrations taken, 6 refused, 0 failures to write"
run_users other "u1;u2"
stop_gateway "0 calls placed, 0 answered, 0 cleared, 0 failed"
finish
