# Writes SIPp scenarios: each function prints one step. Steps are counted, since an ACK or a CANCEL names the INVITE's
# branch by how many steps ago it was sent; so a scenario is written by one function, in one shell.
#
#     write_scenario FILE caller_of_my_test
#     caller_of_my_test() { send_invite; expect 100; expect 200; send_ack; pause 500; send_bye; expect 200; }

SDP_OF_CALLER=$'v=0\no=caller 1 1 IN IP4 [local_ip]\ns=-\nc=IN IP4 [local_ip]\nt=0 0\nm=audio 40000 RTP/AVP 8\na=rtpmap:8 PCMA/8000'
SDP_OF_CALLEE=$'v=0\no=callee 1 1 IN IP4 [local_ip]\ns=-\nc=IN IP4 [local_ip]\nt=0 0\nm=audio 50000 RTP/AVP 8\na=rtpmap:8 PCMA/8000'
ALICE='"Alice \"A\"" <sip:4420@[local_ip]:[local_port]>'

# write_scenario FILE FUNCTION
write_scenario() {
    step=0 invite_step=0 variable=0
    local references=""
    {
        echo '<?xml version="1.0" encoding="ISO-8859-1" ?>'
        echo "<scenario name=\"$2\">"
        "$2"
        ((variable == 0)) || references+=",$(seq -s, 1 "$variable")"
        [[ -z $references ]] || echo "<Reference variables=\"${references#,}\"/>"
        echo '</scenario>'
    } >"$1"
}

# checks PART REGEXP...: that each part (a header's name with its colon, "body", or "msg" for all) of the received message
# matches; part "nowhere": that nothing in the message does.
checks() {
    (($# > 0)) || return 0
    echo '<action>'
    while (($# > 0)); do
        variable=$((variable + 1))
        if [[ $1 == body || $1 == msg ]]; then
            echo "<ereg regexp=\"$2\" search_in=\"$1\" check_it=\"true\" assign_to=\"$variable\"/>"
        elif [[ $1 == nowhere ]]; then
            echo "<ereg regexp=\"$2\" search_in=\"msg\" check_it_inverse=\"true\" assign_to=\"$variable\"/>"
        else
            echo "<ereg regexp=\"$2\" search_in=\"hdr\" header=\"$1\" check_it=\"true\" assign_to=\"$variable\"/>"
        fi
        shift 2
    done
    echo '</action>'
}

# expect STATUS [PART REGEXP]...; expect_optional STATUS; expect_request METHOD [PART REGEXP]...
expect() {
    echo "<recv response=\"$1\">"
    checks "${@:2}"
    echo '</recv>'
    step=$((step + 1))
}
expect_optional() {
    echo "<recv response=\"$1\" optional=\"true\"/>"
    step=$((step + 1))
}
expect_request() {
    echo "<recv request=\"$1\">"
    checks "${@:2}"
    echo '</recv>'
    step=$((step + 1))
}

pause() {
    echo "<pause milliseconds=\"$1\"/>"
    step=$((step + 1))
}

# send_text RETRANSMITS TEXT BODY: the body's type is application/sdp unless the text names another.
send_text() {
    echo "<send${1:+ retrans=\"500\"}><![CDATA["
    echo "$2"
    if [[ -n $3 ]]; then
        [[ $2 == *Content-Type:* ]] || echo 'Content-Type: application/sdp'
        echo "Content-Length: [len]"
        echo
        echo "$3"
    else
        echo "Content-Length: 0"
        echo
    fi
    echo ']]></send>'
    step=$((step + 1))
}

# request_text METHOD SEQUENCE BRANCH TO-PARAMETER [HEADER]...: from the address in FROM, if that is set
request_text() {
    echo "$1 sip:[service]@[remote_ip]:[remote_port] SIP/2.0
Via: SIP/2.0/[transport] [local_ip]:[local_port];branch=$3
From: ${FROM:-$ALICE};tag=[pid]caller[call_number]
To: <sip:[service]@[remote_ip]:[remote_port]>$4
Call-ID: [call_id]
CSeq: $2 $1
Contact: <sip:4420@[local_ip]:[local_port];transport=[transport]>"
    if [[ " ${*:5} " != *Max-Forwards:* ]]; then
        echo "Max-Forwards: 70"
    fi
    shift 4
    (($# == 0)) || printf '%s\n' "$@"
}

# --- the calling side -------------------------------------------------------------------------------------------------
# send_invite_with BODY [HEADER]...; send_invite [HEADER]...
send_invite_with() {
    invite_step=$step
    send_text retrans "$(request_text INVITE 1 '[branch]' '' "${@:2}")" "$1"
}
send_invite() { send_invite_with "$SDP_OF_CALLER" "$@"; }
send_ack() { send_text '' "$(request_text ACK "${2:-1}" '[branch]' '[peer_tag_param]')" "${1:-}"; }
# of an answer from 300 on: part of the INVITE's transaction
send_ack_of_failure() {
    send_text '' "$(request_text ACK "${1:-1}" "[branch-$((step - invite_step))]" '[peer_tag_param]')" ''
}
send_cancel() { send_text retrans "$(request_text CANCEL 1 "[branch-$((step - invite_step))]" '' "$@")" ''; }
send_bye() { send_text retrans "$(request_text BYE 3 '[branch]' '[peer_tag_param]' "$@")" ''; }
send_in_dialog() { send_text retrans "$(request_text "$1" 3 '[branch]' '[peer_tag_param]' "${@:2}")" ''; }
send_request() { send_text retrans "$(request_text "$1" 1 '[branch]' '' "${@:2}")" ''; }
# call_up [HEADER]...: from the INVITE to the ACK
call_up() {
    send_invite "$@"
    expect 100
    expect_optional 180
    expect 200 body "${RELAYED:-callee}"
    send_ack
}

# --- the called side --------------------------------------------------------------------------------------------------
# expect_invite [PART REGEXP]...: keeps what respond_487 and bye_from_here need
expect_invite() {
    echo '<recv request="INVITE">'
    checks "${@}" | sed '$d'
    (($# > 0)) || echo '<action>'
    variable=$((variable + $# / 2))
    references=",sequence,caller,path"
    echo '<ereg regexp="[0-9]+" search_in="hdr" header="CSeq:" assign_to="sequence"/>'
    echo '<ereg regexp=".*" search_in="hdr" header="From:" assign_to="caller"/>'
    echo '<ereg regexp=".*" search_in="hdr" header="Via:" assign_to="path"/></action></recv>'
    step=$((step + 1))
}
# respond_with BODY RETRANSMITS STATUS-AND-PHRASE [HEADER]...; respond STATUS-AND-PHRASE [HEADER]...
respond_with() {
    local text="SIP/2.0 $3
[last_Via:]
[last_From:]
[last_To:];tag=[pid]callee[call_number]
[last_Call-ID:]
[last_CSeq:]
Contact: <sip:callee@[local_ip]:[local_port];transport=[transport]>"
    local header
    for header in "${@:4}"; do
        text+=$'\n'"$header"
    done
    send_text "$2" "$text" "$1"
}
respond() { respond_with '' '' "$@"; }
respond_finally() { respond_with '' retrans "$@"; }
# to a request inside the dialog, whose To bears the tag already; or to a CANCEL
respond_in_dialog() {
    send_text '' "SIP/2.0 $1
[last_Via:]
[last_From:]
[last_To:]
[last_Call-ID:]
[last_CSeq:]" ''
}
# after a CANCEL and its 200: the end of the INVITE
respond_487() {
    send_text retrans "SIP/2.0 487 Request Terminated
[last_Via:]
[last_From:]
[last_To:];tag=[pid]callee[call_number]
[last_Call-ID:]
CSeq: [\$sequence] INVITE" ''
}
# answer_again TO-PARAMETER: a 200 to the INVITE although other requests came after it
answer_again() {
    send_text '' "SIP/2.0 200 OK
Via:[\$path]
[last_From:]
[last_To:]$1
[last_Call-ID:]
CSeq: [\$sequence] INVITE
Contact: <sip:callee@[local_ip]:[local_port];transport=[transport]>" "$SDP_OF_CALLEE"
}
# expect_and_keep METHOD, and after other messages answer_kept METHOD [BODY]: with 200
expect_and_keep() {
    echo "<recv request=\"$1\"><action><ereg regexp=\"[0-9]+\" search_in=\"hdr\" header=\"CSeq:\" assign_to=\"sequence\"/>"
    echo '<ereg regexp=".*" search_in="hdr" header="Via:" assign_to="path"/></action></recv>'
    step=$((step + 1))
}
answer_kept() {
    send_text '' "SIP/2.0 200 OK
Via:[\$path]
From:[\$caller]
To: <sip:callee@[local_ip]:[local_port]>;tag=[pid]callee[call_number]
[last_Call-ID:]
CSeq: [\$sequence] $1
Contact: <sip:callee@[local_ip]:[local_port]>" "${2:-}"
}
# bye_from_here [HEADER]...: the called side hangs up
bye_from_here() {
    send_text retrans "BYE sip:gateway@[remote_ip]:[remote_port] SIP/2.0
Via: SIP/2.0/[transport] [local_ip]:[local_port];branch=[branch]
From: <sip:callee@[local_ip]:[local_port]>;tag=[pid]callee[call_number]
To:[\$caller]
[last_Call-ID:]
CSeq: 1 BYE
Max-Forwards: 70$(printf '\n%s' "$@")" ''
}

# --- inside the dialog ------------------------------------------------------------------------------------------------
# session OWNER VERSION [DIRECTION [PAYLOAD-TYPE [ADDRESS]]]: another session description of a side
session() {
    local port=40000
    [[ $1 == callee ]] && port=50000
    echo "v=0
o=$1 1 $2 IN IP4 [local_ip]
s=-
c=IN IP4 ${5:-[local_ip]}
t=0 0
m=audio $port RTP/AVP ${4:-8}
a=${3:-sendrecv}"
}
# send_offer METHOD SEQUENCE BODY [HEADER]...: a re-INVITE or UPDATE of the calling side
send_offer() {
    [[ $1 == INVITE ]] && invite_step=$step
    send_text retrans "$(request_text "$1" "$2" '[branch]' '[peer_tag_param]' "${@:4}")" "$3"
}
# request_from_callee METHOD SEQUENCE BODY [HEADER]...: any request of the called side in its dialog; ACK as well
request_from_callee() {
    [[ $1 == INVITE ]] && invite_step=$step
    local retransmits=retrans branch='[branch]'
    [[ $1 == ACK ]] && retransmits=''
    [[ $1 == ACK-OF-FAILURE ]] && retransmits='' branch="[branch-$((step - invite_step))]" && set -- ACK "${@:2}"
    send_text "$retransmits" "$1 sip:gateway@[remote_ip]:[remote_port] SIP/2.0
Via: SIP/2.0/[transport] [local_ip]:[local_port];branch=$branch
From: <sip:callee@[local_ip]:[local_port]>;tag=[pid]callee[call_number]
To:[\$caller]
[last_Call-ID:]
CSeq: $2 $1
Contact: <sip:callee@[local_ip]:[local_port];transport=[transport]>
Max-Forwards: 70$(printf '\n%s' "${@:4}")" "$3"
}
# respond_again STATUS-AND-PHRASE [BODY [HEADER]...]: to a re-INVITE, repeated until its ACK; respond_once: to any other
# request inside the dialog
respond_again() { send_text retrans "$(response_text "$1" "${@:3}")" "${2:-}"; }
respond_once() { send_text '' "$(response_text "$1" "${@:3}")" "${2:-}"; }
response_text() { # STATUS-AND-PHRASE [HEADER]...
    printf '%s\n' "SIP/2.0 $1" '[last_Via:]' '[last_From:]' '[last_To:]' '[last_Call-ID:]' '[last_CSeq:]' \
        'Contact: <sip:callee@[local_ip]:[local_port];transport=[transport]>' "${@:2}"
}
