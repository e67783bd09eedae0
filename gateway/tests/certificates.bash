# Certificates for tests, beside lib.bash, in $WORK/tls: each NAME.pem has its key in NAME.key.
TLS="$WORK/tls"
mkdir -p "$TLS"

# make_certificate NAME ISSUER [SUBJECT-ALTERNATIVE-NAME [DAYS]]: the issuer is a name too, its own one for one that it
# signs itself; DAYS below 0: it has expired
make_certificate() {
    openssl ecparam -name prime256v1 -genkey -noout -out "$TLS/$1.key" 2>/dev/null || fail "no key"
    chmod 600 "$TLS/$1.key"
    openssl req -new -key "$TLS/$1.key" -subj "/CN=$1" -out "$TLS/$1.csr" 2>/dev/null || fail "no request"
    local lines="subjectAltName = ${3:-DNS:$1.example}" issuer=(-CA "$TLS/$2.pem" -CAkey "$TLS/$2.key" -CAcreateserial)
    [[ $1 == "$2" ]] && issuer=(-signkey "$TLS/$1.key") && lines+=$'\nbasicConstraints = critical, CA:true'
    openssl x509 -req -in "$TLS/$1.csr" "${issuer[@]}" -days "${4:-30}" -extfile <(echo "$lines") -out "$TLS/$1.pem" \
        2>/dev/null || fail "no certificate"
}
