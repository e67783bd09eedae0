# kamailio as the provider that is the peer of interface b, beside lib.bash: registers who knows the password "secret" of the
# realm provider.example, and asks who calls; calls for others go on to SIPp at a port of its own.
PROVIDER=provider.example
PORT_BEHIND=$((PORT + 6))
kamailio_pid=0

# start_kamailio [ALGORITHM]
start_kamailio() {
    cat >"$WORK/kamailio.cfg" <<END
#!KAMAILIO
debug=0
log_stderror=yes
children=1
auto_aliases=no
alias="$PROVIDER"
listen=udp:$HOST:$PORT_CALLEE
disable_tcp=yes
mpath="$(dirname "$(find /usr/lib -path '*/kamailio/modules/registrar.so' | head -n 1)")/"
loadmodule "sl.so"
loadmodule "tm.so"
loadmodule "rr.so"
loadmodule "pv.so"
loadmodule "textops.so"
loadmodule "siputils.so"
loadmodule "usrloc.so"
loadmodule "registrar.so"
loadmodule "auth.so"
modparam("auth", "algorithm", "${1:-MD5}")
modparam("auth", "nonce_expire", 300)
modparam("auth", "nonce_count", 1)
modparam("auth", "qop", "auth")
modparam("registrar", "min_expires", 60)
request_route {
    if (is_method("REGISTER")) {
        if (!pv_www_authenticate("$PROVIDER", "secret", "0")) {
            www_challenge("$PROVIDER", "1");
            exit;
        }
        save("location");
        exit;
    }
    if (is_method("ACK|CANCEL") || (has_totag() && loose_route())) {
        loose_route();
        t_relay();
        exit;
    }
    if (src_port == $PORT_BEHIND) {
        record_route();
        if (!lookup("location")) {
            sl_send_reply("404", "Not Found");
            exit;
        }
        t_relay();
        exit;
    }
    if (!pv_proxy_authenticate("$PROVIDER", "secret", "0")) {
        proxy_challenge("$PROVIDER", "1");
        exit;
    }
    consume_credentials();
    record_route();
    \$du = "sip:$HOST:$PORT_BEHIND";
    t_relay();
}
END
    kamailio -DD -E -f "$WORK/kamailio.cfg" -Y "$WORK" -m 16 -M 4 >"$WORK/kamailio.log" 2>&1 &
    kamailio_pid=$!
    trap 'stop_kamailio; cleanup' EXIT # its processes end with it, unless it is killed
    local i
    for ((i = 0; i < 200; i++)); do
        grep -q "$(printf ':%04X' "$PORT_CALLEE")" /proc/net/udp && return 0
        kill -0 $kamailio_pid 2>/dev/null || fail "kamailio does not start"
        sleep 0.05
    done
    fail "kamailio does not listen"
}

stop_kamailio() {
    ((kamailio_pid > 0)) || return 0
    kill -TERM $kamailio_pid 2>/dev/null
    wait $kamailio_pid 2>/dev/null
    kamailio_pid=0
}
