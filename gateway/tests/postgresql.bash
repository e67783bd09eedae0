# A server of PostgreSQL, for one test: sourced behind lib.bash. What ends the test ends the server.
POSTGRESQL_PORT=$((PORT + 30))
POSTGRESQL_PASSWORD=sesame-of-the-test
POSTGRESQL_PROGRAMS=$(find /usr/lib/postgresql -name pg_ctl | sort -V | tail -n 1)
POSTGRESQL_PROGRAMS=${POSTGRESQL_PROGRAMS%/*}
# how a gateway is told of it
POSTGRESQL="host=$HOST port=$POSTGRESQL_PORT user=gateway password=$POSTGRESQL_PASSWORD dbname=postgres"

# as_server COMMAND...: it does not run as root
as_server() {
    if (($(id -u) == 0)); then
        (cd "$WORK" && setpriv --reuid postgres --regid postgres --clear-groups -- "$@")
    else
        "$@"
    fi
}
# server VERB [ARGUMENT]...
server() { as_server "$POSTGRESQL_PROGRAMS/pg_ctl" -D "$WORK/server" -w -t 60 "$@" >>"$WORK/server.log" 2>&1 || fail "server: $*"; }
start_server() { server -l "$WORK/server/log" -o "-c listen_addresses=$HOST -p $POSTGRESQL_PORT -k '' -c fsync=off" start; }
stop_server() { server -m "${1:-fast}" stop; }
# for the trap that is set on the test's end, before cleanup
end_server() { [[ ! -f $WORK/server/postmaster.pid ]] || stop_server immediate; }
# sql STATEMENT
sql() { PGPASSWORD=$POSTGRESQL_PASSWORD psql -h "$HOST" -p $POSTGRESQL_PORT -U gateway -d postgres -Atc "$1"; }

make_server() {
    echo "$POSTGRESQL_PASSWORD" >"$WORK/password"
    mkdir "$WORK/server"
    (($(id -u) == 0)) && chown postgres "$WORK/server" && chmod 711 "$WORK" && chmod 644 "$WORK/password"
    as_server "$POSTGRESQL_PROGRAMS/initdb" -D "$WORK/server" --no-sync -U gateway --pwfile="$WORK/password" -A scram-sha-256 -E UTF8 \
        --locale=C >"$WORK/initdb.log" 2>&1 || fail "no server"
}
