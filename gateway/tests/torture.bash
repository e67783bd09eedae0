# Messages that are odd, sent as datagrams and as connections of their own; sourced after lib.bash and plain_call.bash.

# A message is told by what is odd about it: torture NAME ANSWER START-LINE [HEADER]... A header takes the place of the
# ordinary one of its name; "-Name" leaves that out; "body:TEXT" is the body. Escapes are printf's. ANSWER is a regular
# expression over the statuses that come back ("" for silence). No route leads anywhere, so a call that is understood gets
# 404. What RFC 4475 calls invalid may be refused in whatever way; what it calls valid must be understood, but for a
# method with characters that the SIP stack does not take for such (intmeth): that is dropped.
URI_HOST=$HOST # an address of version 6 has brackets there
names=()
declare -A answer_of
torture() {
    local name=$1 method=${3%% *} header field body=
    names+=("$name")
    answer_of[$name]=$2
    local -A fields=([Via]="SIP/2.0/TRANSPORT $URI_HOST:9;rport;branch=z9hG4bK$name" [From]="<sip:a@$URI_HOST>;tag=$name"
        [To]="<sip:b@$URI_HOST>" [Call-ID]="$name" [CSeq]="1 $method" [Max-Forwards]=70 [Contact]="<sip:a@$URI_HOST>" [Content-Length]=AUTO)
    local order=(Via From To Call-ID CSeq Max-Forwards Contact) more=()
    for header in "${@:4}"; do
        field=${header%%:*}
        case $header in
        -*) unset "fields[${header#-}]" ;;
        body:*) body=${header#body:} ;;
        *) if [[ -n ${fields[$field]+x} ]]; then fields[$field]=${header#*: }; else more+=("$header"); fi ;;
        esac
    done
    [[ ${fields[Content-Length]-} != AUTO ]] || fields[Content-Length]=$(printf '%b' "$body" | wc -c)
    {
        printf '%b\r\n' "$3"
        for field in "${order[@]}"; do
            [[ -z ${fields[$field]+x} ]] || printf '%b\r\n' "$field: ${fields[$field]}"
        done
        (($# < 4)) || for header in ${more[@]+"${more[@]}"}; do printf '%b\r\n' "$header"; done
        [[ -z ${fields[Content-Length]+x} ]] || printf 'Content-Length: %b\r\n' "${fields[Content-Length]}"
        printf '\r\n'
        printf '%b' "$body"
    } >"$WORK/$name.message"
}
message() { sed "s|SIP/2.0/TRANSPORT|SIP/2.0/$2|" "$WORK/$1.message"; }
# expect_answers TRANSPORT FILE: the statuses that came for each message, provisional ones before the final one
expect_answers() {
    local name got
    for name in "${names[@]}"; do
        got=$(tr -d '\r' <"$2" | awk -v id="$name" '/^SIP\/2.0 / { status = $2 } $1 == "Call-ID:" && $2 == id { print status }' |
            uniq | tr '\n' ' ')
        [[ ${got% } =~ ^(${answer_of[$name]})$ ]] || fail "$name over $1: answers '${got% }' instead of '${answer_of[$name]}'"
    done
}

# send_datagrams: all of them, and the answers of a second
send_datagrams() {
    exec 3<>"/dev/udp/$HOST/$PORT_A"
    for name in "${names[@]}"; do
        message "$name" UDP >"$WORK/datagram"
        cat "$WORK/datagram" >&3
    done
    timeout 1 cat <&3 >"$WORK/udp.answers"
    exec 3>&-
    kill -0 $gateway_pid 2>/dev/null || fail "the gateway is gone"
    expect_answers UDP "$WORK/udp.answers"
}
# send_streams COMMAND...: each over a connection of its own, and meanwhile the command
send_streams() {
    local readers=() name
    for name in "${names[@]}"; do
        (
            exec 3<>"/dev/tcp/$HOST/$PORT_A" || exit
            message "$name" TCP >&3
            timeout 1 cat <&3 >"$WORK/$name.tcp"
        ) 2>/dev/null &
        readers+=($!)
    done
    "$@"
    wait "${readers[@]}"
    kill -0 $gateway_pid 2>/dev/null || fail "the gateway is gone"
    cat "$WORK"/*.tcp >"$WORK/tcp.answers"
    expect_answers TCP "$WORK/tcp.answers"
}
