# What cannot be served: one line on the standard error stream, exit status 2, nothing left running.
. "$(dirname "$0")/../lib.bash"

# refused REGEXP [ARGUMENT]...
refused() {
    local status=0
    timeout 10 "$GATEWAY" "${@:2}" >"$WORK/gateway.out" 2>"$WORK/gateway.err" || status=$?
    ((status == 2)) || fail "exit status $status instead of 2 for: $1"
    (($(wc -l <"$WORK/gateway.err") == 1)) || fail "not one line"
    grep -qE -- "^callcontrol-gateway: $1" "$WORK/gateway.err" || fail "the line does not match: $1"
    [[ ! -s $WORK/gateway.out ]] || fail "something on the standard output"
}
# bad REGEXP SED-COMMAND: the good configuration, changed
bad() {
    write_configuration
    sed -i -e "$2" "$WORK/gateway.toml"
    refused "$WORK/gateway.toml: $1" --config "$WORK/gateway.toml" --check
    refused "$WORK/gateway.toml: $1" --config "$WORK/gateway.toml"
}

refused ".*--config" --check
refused ".*--nonsense" --config x --nonsense
refused "$WORK/none.toml: file: cannot be read" --config "$WORK/none.toml"
refused "$WORK: file: cannot be read" --config "$WORK"
bad "gateway.max-cals: is not a key" 's/^call-control-log-level.*/max-cals = 3/'
bad "gateway.max-calls: expected a whole number" 's/^call-control-log-level.*/max-calls = "3"/'
bad "gateway.max-calls: must be from 0 to " 's/^call-control-log-level.*/max-calls = -1/'
bad "sip\[1\].listen: 'localhost' is not an address" "s/listen = \"$HOST:$PORT_B\"/listen = \"localhost:5060\"/"
bad "sip\[0\].peer: is missing" "/peer = \"$HOST:$PORT_CALLER\"/d"
# what is shown to a peer that asks
passwords() { # KEYS [MODE]
    echo "s/name = \"b\"/name = \"b\"\n$1/"
    printf 'alice:office:secret\n%s' "${3:-}" >"$WORK/passwords"
    chmod "${2:-600}" "$WORK/passwords"
}
FILE=${WORK//\//\\\/}\\\/passwords
bad "sip\[1\].user: has no password: passwords is needed" "$(passwords 'user = "alice"')"
bad "sip\[1\].passwords: are of no use without user or authenticate" "$(passwords "passwords = \"$FILE\"")"
bad "sip\[1\].user: 'bob' is not in the file of passwords" "$(passwords "user = \"bob\"\npasswords = \"$FILE\"")"
bad "sip\[1\].passwords: $WORK/passwords: everybody may read or change it" \
    "$(passwords "user = \"alice\"\npasswords = \"$FILE\"" 644)"
bad "sip\[1\].passwords: $WORK/passwords: line 2 is not of the form user:realm:password" \
    "$(passwords "user = \"alice\"\npasswords = \"$FILE\"" 600 secret)"
bad "sip\[1\].passwords: $WORK/no: cannot be read" "$(passwords "user = \"alice\"\npasswords = \"${FILE%passwords}no\"")"
bad "sip\[1\].authenticate: by what\? passwords is needed" 's/name = "b"/name = "b"\nauthenticate = true/'
bad "sip\[1\].authenticate: nobody of the realm 'b' is in the file of passwords" \
    "$(passwords "authenticate = true\npasswords = \"$FILE\"")"
bad "sip\[1\].algorithms: of 'bob' there is no hash by SHA-256" \
    "$(passwords "authenticate = true\nrealm = \"office\"\npasswords = \"$FILE\"" 600 'bob:office:{MD5}00112233445566778899aabbccddeeff')"
bad "sip\[1\].algorithms: must be some of SHA-256, SHA-512-256, MD5" 's/name = "b"/name = "b"\nalgorithms = ["MD4"]/'
bad "sip\[1\].realm: is empty, or has a quote, a backslash or a colon" "s/name = \"b\"/name = \"b\"\nrealm = \"a:b\"/"
bad "sip\[1\].registrar: of whom\? authenticate is needed" 's/name = "b"/name = "b"\nregistrar = true/'
bad "sip\[1\].max-expires: must not be below min-expires" 's/name = "b"/name = "b"\nmax-expires = 59/'
bad "sip\[1\].allow: is needed where there is no peer" \
    "/^peer = \"$HOST:$PORT_CALLEE\"/d; $(passwords "registrar = true\nauthenticate = true\nrealm = \"office\"\npasswords = \"$FILE\"")"
bad "sip\[1\].register: as whom\? user is needed" 's/name = "b"/name = "b"\nregister = true/'
bad "sip\[1\].domain: is no name of a host" 's/name = "b"/name = "b"\ndomain = "me@home"/'
bad "sip\[1\].register-expires: must be from 1 to 86400" 's/name = "b"/name = "b"\nregister-expires = 0/'
bad "sip\[1\].name: 'a' is taken by another interface" 's/name = "b"/name = "a"/'
bad "route\[0\].to: there is no interface 'c'" 's/to = "b"/to = "c"/'
bad "line 2: " '2s/.*/call = = 3/'
bad "interfaces: are missing" '/^\[\[sip/,$d'

# a port in use; the first interface is given back, too
write_configuration
start_gateway
sed "s/:$PORT_A\"/:$((PORT + 30))\"/" "$WORK/gateway.toml" >"$WORK/second.toml"
mv "$WORK/gateway.err" "$WORK/first.err"
mv "$WORK/gateway.out" "$WORK/first.out"
refused "$WORK/second.toml: sip\[1\].listen: cannot listen on $HOST:$PORT_B \(udp\): Address already in use" \
    --config "$WORK/second.toml"
kill -TERM $gateway_pid
wait $gateway_pid || fail "the first gateway: exit status $?"
gateway_pid=0
grep -qx "gateway: 0 calls placed, 0 answered, 0 cleared, 0 failed, 0 left over" "$WORK/first.out" || fail "the last line"
"$GATEWAY" --config "$WORK/second.toml" --check | grep -qx "$WORK/second.toml: all right" || fail "--check"

# certificates and keys that cannot be used
. "$HERE/certificates.bash"
make_certificate ca ca
make_certificate gateway ca "IP:$HOST"
make_certificate other ca
tls() { # CERTIFICATE KEY AUTHORITIES
    echo "s,name = \"b\",&\ntransport = \"tls\"\ntls-certificate = \"$TLS/$1\"\ntls-key = \"$TLS/$2\"\ntls-authorities = \"$TLS/$3\","
}
bad "sip\[1\].tls-certificate: $TLS/no.pem: cannot be read" "$(tls no.pem gateway.key ca.pem)"
bad "sip\[1\].tls-certificate: $TLS/gateway.key: has no certificate that can be used: no start line" \
    "$(tls gateway.key gateway.key ca.pem)"
bad "sip\[1\].tls-key: $TLS/other.key: has no key for the certificate: key values mismatch" \
    "$(tls gateway.pem other.key ca.pem)"
bad "sip\[1\].tls-authorities: $TLS/ca.csr: has no certificates that can be used" "$(tls gateway.pem gateway.key ca.csr)"
openssl ec -in "$TLS/gateway.key" -aes128 -passout pass:secret -out "$TLS/locked.key" 2>/dev/null
bad "sip\[1\].tls-key: $TLS/locked.key: has no key for the certificate" "$(tls gateway.pem locked.key ca.pem)"
chmod 644 "$TLS/gateway.key"
bad "sip\[1\].tls-key: $TLS/gateway.key: everybody may read or change it" "$(tls gateway.pem gateway.key ca.pem)"

# contacts in what is no file of contacts
write_configuration
sed -i -e "$(passwords "registrar = true\nregistrations = \"$FILE\"\nauthenticate = true\nrealm = \"office\"\npasswords = \"$FILE\"")" \
    "$WORK/gateway.toml"
refused "$WORK/gateway.toml: sip\[1\].registrations: $WORK/passwords: file is not a database" --config "$WORK/gateway.toml"
finish
