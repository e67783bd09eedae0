# The torture messages of RFC 4475, each as a datagram and as a connection of its own: the answer that the RFC asks for, or
# silence, and a call between two ordinary peers works in the middle of it and after it.
. "$(dirname "$0")/../lib.bash"
. "$HERE/plain_call.bash"
. "$HERE/torture.bash"
. "$HERE/turns.bash"

LONG=$(printf '%300s' '' | tr ' ' l)
SDP='v=0\r\no=a 1 1 IN IP4 192.0.2.1\r\ns=-\r\nc=IN IP4 192.0.2.1\r\nt=0 0\r\nm=audio 49217 RTP/AVP 0\r\n'
TYPE='Content-Type: application/sdp'

# 3.1.1 valid
torture wsinv '100 404|404' 'INVITE sip:vivekg@chair-dnrc.example.com;unknownparam SIP/2.0' \
    'To: \r\n sip:vivekg@chair-dnrc.example.com ;   tag-not = 1918181833n' 'From: "J Rosenberg \\\\\\""       <sip:jdrosen@example.com>\r\n  ;\r\n  tag = 98asjd8' \
    'Max-Forwards: 0068' 'CSeq: 0009\r\n  INVITE' 'NewFangledHeader:   newfangled value\r\n continued newfangled value' \
    'UnknownHeaderWithUnusualValue: ;;,,;;,;' 'Route:\r\n <sip:services.example.com;lr;unknownwith=value;unknown-no-value>' \
    'Contact: "Quoted string \\"\\"" <sip:jdrosen@example.com> ; newparam =\r\n      newvalue ;\r\n  secondparam ; q = 0.33' "$TYPE" "body:$SDP"
torture intmeth '501|' "!interesting-Method0123456789_*+\`.%indeed'~ sip:1_unusual.URI~(to-be!sure)&isn't+it\$/crazy?,/;;*:&it+has=1,weird!*pas\$wo~d_too.(doesn't-it)@example.com SIP/2.0"
torture esc01 '100 404|404' 'INVITE sip:sips%3Auser%40example.com@example.net SIP/2.0' 'To: sip:%75se%72@example.com' "$TYPE" "body:$SDP"
torture escnull '405' 'REGISTER sip:example.com SIP/2.0' 'To: sip:null-%00-null@example.com' 'Contact: <sip:%00@host5.example.com>'
torture esc02 '501' 'RE%47IST%45R sip:registrar.example.com SIP/2.0' 'To: "%Z%45" <sip:resource@example.com>'
torture lwsdisp '200' 'OPTIONS sip:user@example.com SIP/2.0' "From: caller<sip:caller@example.com>;tag=323"
torture longreq '100 404|404' 'INVITE sip:user@example.com SIP/2.0' "To: \"$LONG\" <sip:amanwitha$LONG@example.com>" "From: sip:$LONG@example.net;tag=12$LONG;u=$LONG" "X-$LONG: $LONG" "$TYPE" "body:$SDP"
torture semiuri '200' 'OPTIONS sip:user;par=u%40example.net@example.com SIP/2.0'
torture transports '200' 'OPTIONS sip:user@example.com SIP/2.0' "Via: SIP/2.0/TRANSPORT $HOST:9;rport;branch=z9hG4bKtransports, SIP/2.0/SCTP t2.example.com;branch=z9hG4bKkdj, SIP/2.0/UNKNOWN t5.example.com;branch=z9hG4bKkdk"
torture mpart01 '405|501' 'MESSAGE sip:kumiko@example.org SIP/2.0' 'Content-Type: multipart/mixed;boundary=7a9' 'body:--7a9\r\n\r\nHello\r\n--7a9\r\nContent-Type: application/octet-stream\r\n\r\n\0\x82\xff\r\n--7a9--\r\n'
torture unreason '' 'SIP/2.0 200 = 2**3 * 5**2 \xd0\xbd\xd0\xbe' "Via: SIP/2.0/TRANSPORT $HOST:$PORT_A;branch=z9hG4bKunreason" 'CSeq: 1 INVITE'
torture noreason '' 'SIP/2.0 100 ' "Via: SIP/2.0/TRANSPORT $HOST:$PORT_A;branch=z9hG4bKnoreason" 'CSeq: 1 INVITE'
# 3.1.2 invalid
torture badinv01 '400' 'INVITE sip:user@example.com SIP/2.0' 'To: ;;;;' 'Contact: "" <> ;,"'
torture clerr '400|' 'INVITE sip:user@example.com SIP/2.0' 'Content-Length: 9999' "$TYPE" "body:$SDP"
torture ncl '400|' 'INVITE sip:user@example.com SIP/2.0' 'Content-Length: -999' "$TYPE" "body:$SDP"
torture scalar02 '400|' 'REGISTER sip:example.com SIP/2.0' 'CSeq: 36893488147419103232 REGISTER' 'Max-Forwards: 300' 'Expires: 10000000000000000000000000000000'
torture scalarlg '' 'SIP/2.0 503 Service Unavailable' "Via: SIP/2.0/TRANSPORT $HOST:$PORT_A;branch=z9hG4bKscalarlg" 'CSeq: 9292394834772304023312 OPTIONS' 'Retry-After: 949302838503028349304023988'
torture quotbal '400|100 404|404' 'INVITE sip:user@example.com SIP/2.0' 'To: "Mr. J. User <sip:j.user@example.com>'
torture ltgtruri '400|416|100 404|404|' 'INVITE <sip:user@example.com> SIP/2.0'
torture lwsruri '400|416|100 404|404|' 'INVITE sip:user@example.com; lr SIP/2.0'
torture lwsstart '400|416|100 404|404|' 'INVITE  sip:user@example.com  SIP/2.0'
torture trws '200|400|505' 'OPTIONS sip:remote-target@example.com SIP/2.0  '
torture escruri '100 404|404|400|416' 'INVITE sip:user@example.com?Route=%3Csip:example.com%3E SIP/2.0'
torture baddate '100 404|404|400' 'INVITE sip:user@example.com SIP/2.0' 'Date: Fri, 01 Jan 2010 16:00:00 EST'
torture regbadct '405|400' 'REGISTER sip:example.com SIP/2.0' 'Contact: sip:user@example.com?Route=%3Csip:sip.example.com%3E'
torture badaspec '200|400' 'OPTIONS sip:user@example.org SIP/2.0' 'To: "Watson, Thomas" < sip:t.watson@example.org >'
torture baddn '200|400' 'OPTIONS sip:t.watson@example.org SIP/2.0' 'From: Bell, Alexander <sip:a.g.bell@example.com>;tag=43'
torture badvers '505|' 'OPTIONS sip:t.watson@example.org SIP/7.0'
torture mismatch01 '400|' 'OPTIONS sip:user@example.com SIP/2.0' 'CSeq: 8 INVITE'
torture mismatch02 '400|501|' 'NEWMETHOD sip:user@example.com SIP/2.0' 'CSeq: 8 INVITE'
torture bigcode '' 'SIP/2.0 4294967301 better not break the receiver' "Via: SIP/2.0/TRANSPORT $HOST:$PORT_A;branch=z9hG4bKbigcode" 'CSeq: 1 INVITE'
# 3.2 and 3.3
torture badbranch '200' 'OPTIONS sip:user@example.com SIP/2.0' "Via: SIP/2.0/TRANSPORT $HOST:9;rport;branch=z9hG4bK"
torture insuf '400|' 'INVITE sip:user@example.com SIP/2.0' -From -To -Contact
torture unkscm '416' 'OPTIONS nobodyKnowsThisScheme:totallyopaquecontent SIP/2.0'
torture novelsc '416' 'OPTIONS soap.beep://192.0.2.103:3002 SIP/2.0'
torture unksm2 '405|400' 'REGISTER sip:example.com SIP/2.0' 'To: isbn:2983792873' 'From: <http://www.example.com>;tag=32' 'Contact: <name:John_Smith>'
torture bext01 '420' 'OPTIONS sip:user@example.com SIP/2.0' 'Proxy-Require: priv' 'Require: nothingSupportsThis, nothingSupportsThisEither'
torture invut '415' 'INVITE sip:user@example.com SIP/2.0' 'Content-Type: application/unknownformat' 'body:<audio>\r\n'
torture regaut01 '405' 'REGISTER sip:example.com SIP/2.0' 'Authorization: NoOneKnowsThisScheme opaque-data=here'
torture multi01 '400|' 'INVITE sip:user@example.com SIP/2.0' 'CSeq: 5 INVITE\r\nCSeq: 59 INVITE' 'Max-Forwards: 70\r\nMax-Forwards: 5' 'To: <sip:c@h>\r\nTo: <sip:d@h>' 'From: <sip:e@h>;tag=1\r\nFrom: <sip:f@h>;tag=2'
torture mcl01 '400|200|' 'OPTIONS sip:user@example.com SIP/2.0' "$TYPE" 'Content-Length: 13' 'l: 5' 'body:There is no way to know'
torture bcast '' 'SIP/2.0 200 OK' 'Via: SIP/2.0/TRANSPORT 192.0.2.198;branch=z9hG4bK1324' 'Via: SIP/2.0/TRANSPORT 255.255.255.255;branch=z9hG4bK1saber23' 'CSeq: 1 INVITE'
torture zeromf '200|483' 'OPTIONS sip:user@example.com SIP/2.0' 'Max-Forwards: 0'
torture cparam01 '405' 'REGISTER sip:example.com SIP/2.0' 'Contact: sip:+19725552222@gw1.example.net;unknownparam'
torture cparam02 '405' 'REGISTER sip:example.com SIP/2.0' 'Contact: <sip:+19725552222@gw1.example.net;unknownparam>'
torture regescrt '405' 'REGISTER sip:example.com SIP/2.0' 'Contact: <sip:user@example.com?Route=%3Csip:sip.example.com%3E>'
torture sdp01 '100 404|404|406' 'INVITE sip:user@example.com SIP/2.0' 'Accept: text/nobodyKnowsThis' "$TYPE" "body:$SDP"
# 3.4
torture inv2543 '100 404|404|400' 'INVITE sip:UserB@example.com SIP/2.0' "Via: SIP/2.0/TRANSPORT $HOST:9;rport" -Max-Forwards 'From: <sip:iamalegal2543@h>' -Contact

write_configuration 'max-calls-per-second = 0' $'transports = ["udp", "tcp"]\nmax-connections-per-source = 200\ntcp-idle = 2' 4989
watch_turns
start_gateway
send_datagrams
expect_call
send_streams expect_call -t t1
expect_call -t t1
expect_short_turns
kill -TERM $gateway_pid
status=0
wait $gateway_pid || status=$?
gateway_pid=0
((status == 0)) || fail "gateway: exit status $status"
grep -qE '^gateway: [0-9]+ calls placed, 3 answered, 3 cleared, [0-9]+ failed, 0 left over$' "$WORK/gateway.out" || fail "the last line"
finish
