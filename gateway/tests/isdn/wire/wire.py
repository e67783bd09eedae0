#!/usr/bin/env python3
"""What is said on one wire and what is heard on the other: the table beside this file, row by row.

    wire.py write TABLE FOLDER      SIPp's scenarios, the plans of the exchanges, how many calls
    wire.py judge TABLE FOLDER      by what SIPp has logged, and what tshark finds in the exchanges' packets

Every row is a call of its own, by a number that ends with that of the row. On wire S is SIPp, on B an exchange, the
gateway being its user, on C one that is the gateway's user; what is for - is refused before anybody is called.
"""
import re
import subprocess
import sys
import xml.etree.ElementTree as ElementTree

PREFIXES = {"S": "44", "B": "49", "C": "48", "-": "44"}
FIRST = 1001
AT_ONCE = 8  # calls of an exchange, so that the channels suffice
MESSAGES = {  # Q.931, table 4-2
    0x01: "ALERTING", 0x02: "CALL-PROCEEDING", 0x03: "PROGRESS", 0x05: "SETUP", 0x07: "CONNECT", 0x45: "DISCONNECT",
    0x4D: "RELEASE", 0x5A: "RELEASE-COMPLETE", 0x24: "HOLD", 0x28: "HOLD-ACKNOWLEDGE", 0x30: "HOLD-REJECT", 0x31: "RETRIEVE",
    0x33: "RETRIEVE-ACKNOWLEDGE", 0x37: "RETRIEVE-REJECT", 0x62: "FACILITY", 0x6E: "NOTIFY", 0x7B: "INFORMATION"}
SPEECH = "m=audio 40000 RTP/AVP 8\na=rtpmap:8 PCMA/8000"
BITS = "m=audio 40000 RTP/AVP 96\na=rtpmap:96 CLEARMODE/8000"


class Row:
    def __init__(self, number, line):
        self.number = number
        way, self.element, self.said, self.heard, self.source = (column.strip() for column in line.split("|"))
        self.caller, self.callee = way.split(">")
        self.said = [one.strip().replace("{n}", str(number)) for one in self.said.split("&")]
        self.heard = [one.strip().replace("{n}", str(number)) for one in self.heard.split("&")]

    def called(self):
        return self.word("dials") or PREFIXES[self.callee] + str(self.number)

    def word(self, key):
        """Of the caller of SIP: `S dials +49...`"""
        return next((one.split()[2] for one in self.said if one.startswith(f"S {key} ")), "")

    def headers(self, message):
        return [one.split(" ", 2)[2] for one in self.said if one.startswith(f"S {message} ")]

    def keys(self, wire):
        """What an exchange does for it: lines of TOML."""
        return [one[2:] for one in self.said if one.startswith(wire + " ")]

    def status(self):
        """With which a call from or to SIP is refused; empty: it is not."""
        texts = self.heard if self.caller == "S" else self.said
        return next((m[1] for m in (re.match(r"S ([3-6]\d\d)\b", one) for one in texts) if m), "")

    def has(self, texts, start):
        return any(one.startswith(start) for one in texts)


def rows_of(table):
    lines = [line for line in open(table) if line.strip() and not line.startswith("#")]
    return [Row(FIRST + i, line) for i, line in enumerate(lines)]


# --- scenarios and plans --------------------------------------------------------------------------------------------

ADVICE = "application/vnd.etsi.aoc+xml"


def send(text, body="", again=False, kind="application/sdp"):
    """`text`: the head; a line `body ...` of it is an advice of charge beside the body."""
    advice = next((one[5:] for one in text if one.startswith("body ")), "")
    text = [one for one in text if not one.startswith("body ")]
    if advice:
        aoc = f'<?xml version="1.0"?><aoc xmlns="http://uri.etsi.org/ngn/params/xml/simservs/aoc">{advice}</aoc>'.replace("]]>", "")
        parts = f"--x\nContent-Type: {kind}\n\n{body}\n--x\nContent-Type: {ADVICE}\n\n{aoc}\n--x--"
        body, kind = (parts, "multipart/mixed;boundary=x") if body else (aoc, ADVICE)
    head = text + ([f"Content-Type: {kind}"] if body else [])
    return f'<send{" retrans=%s500%s" % (chr(34), chr(34)) if again else ""}><![CDATA[\n' + "\n".join(head) + \
        f"\nContent-Length: [len]\n\n{body}\n]]></send>"


def session(media):
    return f"v=0\no=- 1 1 IN IP4 [local_ip]\ns=-\nc=IN IP4 [local_ip]\nt=0 0\n{media}"


def receive(what, optional=False):
    kind = "response" if what.isdigit() else "request"
    return f'<recv {kind}="{what}"{" optional=%strue%s" % (chr(34), chr(34)) if optional else ""}/>'


def request(row, method, sequence, tag, branch="[branch]"):
    origin = next(iter(row.headers("From:")), "<sip:4420@[local_ip]>")
    return [f"{method} sip:[field0]@[remote_ip]:[remote_port] SIP/2.0",
            f"Via: SIP/2.0/UDP [local_ip]:[local_port];branch={branch}", f"From: {origin};tag=[call_number]caller",
            f"To: <sip:[field0]@[remote_ip]:[remote_port]>{tag}", "Call-ID: [call_id]",
            f"CSeq: {sequence} {method}", "Contact: <sip:4420@[local_ip]:[local_port]>", "Max-Forwards: 70"]


def response(status, tagged=True):
    return [f"SIP/2.0 {status}", "[last_Via:]", "[last_From:]",
            "[last_To:]" + (";tag=[call_number]callee" if tagged else ""), "[last_Call-ID:]", "[last_CSeq:]",
            "Contact: <sip:callee@[local_ip]:[local_port]>"]


def calls_from(row):
    media = BITS if row.headers("bits") else SPEECH
    steps = [send(request(row, "INVITE", 1, "") + row.headers("INVITE"), session(media), True), receive("100")]
    steps += [receive(status, True) for status in ("180", "183")]
    if row.status():
        return steps + [receive(row.status()), send(request(row, "ACK", 1, "[peer_tag_param]", f"[branch-{len(steps) + 1}]"))]
    steps += [receive("200"), send(request(row, "ACK", 1, "[peer_tag_param]"))]
    if row.has(row.heard, "S INFO"):
        steps += [receive("INFO"), send(response("200 OK", False))]
    for sequence, direction in enumerate(("sendonly", "sendrecv") if row.word("holds") else (), 2):
        steps += [send(request(row, "INVITE", sequence, "[peer_tag_param]"), session(f"{media}\na={direction}"), True),
                  receive("100", True), receive("200"), send(request(row, "ACK", sequence, "[peer_tag_param]")),
                  '<pause milliseconds="100"/>']
    if row.has(row.heard, "S BYE"):
        return steps + [receive("BYE"), send(response("200 OK", False))]
    return steps + ['<pause milliseconds="100"/>',
                    send(request(row, "BYE", 9, "[peer_tag_param]") + row.headers("BYE"), "", True), receive("200")]


def callees(method, sequence):
    return [f"{method} sip:gateway@[remote_ip]:[remote_port] SIP/2.0",
            "Via: SIP/2.0/UDP [local_ip]:[local_port];branch=[branch]",
            "From: <sip:callee@[local_ip]:[local_port]>;tag=[call_number]callee", "To:[$caller]", "[last_Call-ID:]",
            f"CSeq: {sequence} {method}", "Max-Forwards: 70"]


def calls_to(row):
    steps = []
    if row.has(row.said, "S 183"):
        steps += [send(response("183 Session Progress"), session(SPEECH)), '<pause milliseconds="800"/>']
    elif not row.status():
        milliseconds = 800 if row.headers("180") else 100  # it is what the row is about
        steps += [send(response("180 Ringing") + row.headers("180")), f'<pause milliseconds="{milliseconds}"/>']
    if row.status():
        said = next(one for one in row.said if one.startswith(f"S {row.status()}"))
        return steps + [send(response(f"{row.status()} No") + [header for header in [said[6:].strip()] if header], "", True),
                        receive("ACK")]
    media = BITS if row.has(row.said, "S bits") else SPEECH
    steps += [send(response("200 OK") + row.headers("200"), session(media), True), receive("ACK")]
    for sequence, method in enumerate(("INFO", "BYE"), 1):
        if row.has(row.said, f"S {method}"):
            steps += ['<pause milliseconds="100"/>', send(callees(method, sequence) + row.headers(method), "", True),
                      receive("200")]
    if not row.has(row.said, "S BYE"):
        steps += [receive("BYE"), send(response("200 OK", False) + row.headers("OK"))]
    return steps


def scenario(first, chosen):
    """`chosen`: the steps of each row, by the value of the variable `row`, which the first step sets."""
    text = ['<?xml version="1.0" encoding="ISO-8859-1" ?>', '<scenario name="rows">', first, "<nop><action>",
            '<todouble assign_to="row" variable="text"/>']
    text += [f'<test assign_to="is{one}" variable="row" compare="equal" value="{one}"/>' for one in chosen]
    text += ["</action></nop>"] + [f'<nop next="row{one}" test="is{one}"/>' for one in chosen] + ['<nop next="end"/>']
    for one, steps in chosen.items():
        text += [f'<label id="row{one}"/>'] + steps + ['<nop next="end"/>']
    return "\n".join(text + ['<label id="end"/>', '<nop/>', '<Reference variables="caller"/>', "</scenario>"])


CHOOSE_BY_FIELD = '<nop><action><assignstr assign_to="text" value="[field1]"/><assignstr assign_to="caller" value=""/></action></nop>'
CHOOSE_BY_NUMBER = '<recv request="INVITE"><action><ereg regexp=".*" search_in="hdr" header="From:" assign_to="caller"/>' \
    '<ereg regexp="[0-9]{4}@" search_in="hdr" header="To:" check_it="true" assign_to="at"/>' \
    '<ereg regexp="[0-9]{4}" search_in="var" variable="at" check_it="true" assign_to="text"/></action></recv>'


def write(rows, folder):
    from_sip = [row for row in rows if row.caller == "S"]
    to_sip = [row for row in rows if row.callee == "S"]
    ways = []  # what differs by its number alone is written once: SIPp reads no more than 64 KB
    with open(f"{folder}/from_sip.csv", "w") as numbers:
        numbers.write("SEQUENTIAL\n")
        for row in from_sip:
            if calls_from(row) not in ways:
                ways.append(calls_from(row))
            numbers.write(f"{row.called()};{ways.index(calls_from(row))}\n")
    open(f"{folder}/from_sip.xml", "w").write(scenario(CHOOSE_BY_FIELD, dict(enumerate(ways))))
    open(f"{folder}/to_sip.xml", "w").write(scenario(CHOOSE_BY_NUMBER, {row.number: calls_to(row) for row in to_sip}))
    for wire in "BC":
        plan = [f"at-once = {AT_ONCE}"]
        for row in rows:
            if row.callee == wire:
                keys = row.keys(wire)
                usual = (f'number = "{row.called().lstrip("+")}"', "answers = 300")
                plan += ["[[number]]"] + [line for line in usual if not row.has(keys, line.split()[0] + " ")] + keys
            if row.caller == wire:
                keys = row.keys(wire)
                usual = (f'to = "{row.called()}"', f'from = "30{row.number}"', "length = 100")
                plan += ["[[call]]"] + [line for line in usual if not row.has(keys, line.split()[0] + " ")] + keys
        open(f"{folder}/plan_{wire.lower()}.toml", "w").write("\n".join(plan) + "\n")
    print(sum(row.callee != "-" for row in rows), len(from_sip), len(to_sip))


# --- what was heard -------------------------------------------------------------------------------------------------

def heard_by_sip(file, rows):
    """By row, each message that SIPp received."""
    by_call, number_of = {}, {}
    for block in open(file, errors="replace").read().split("-" * 47 + " ")[1:]:
        head, _, text = block.partition("\n\n")
        call = re.search(r"^Call-ID: *(.*)$", text, re.M | re.I)[1].strip()
        if number := re.match(r"INVITE sips?:\S*?(\d{4})@", text):
            number_of[call] = int(number[1])
        if "received" in head:
            by_call.setdefault(call, []).append(text)
    heard = {}
    for call, messages in by_call.items():
        heard.setdefault(number_of.get(call), []).extend(messages)
    return heard


def is_heard_by_sip(messages, expected):
    what, _, check = expected.partition(" ")
    start = f"SIP/2.0 {what} " if what.isdigit() else f"{what} "
    for message in (one for one in messages if one.startswith(start)):
        lines = message.replace("\r", "").split("\n")
        if not check:
            return True
        if check.startswith("no "):
            return not any(line.lower().startswith(check[3:].lower()) for line in lines)
        if any(re.search("^" + check, line, re.I) for line in lines):
            return True
    return False


def field_of(packet, name):
    found = packet.find(f".//field[@name='{name}']")
    return found.get("show") if found is not None else None


def heard_by_exchange(file, wire, known):
    """By row, each message that the gateway sent: its name and its elements, as tshark reads them."""
    xml = subprocess.run(["tshark", "-r", file, "-Y", "q931", "-T", "pdml"], capture_output=True, check=True).stdout
    row_of, heard = {}, {}
    for packet in ElementTree.fromstring(xml).iter("packet"):
        body = packet.find("proto[@name='q931']")
        is_network = field_of(packet, "frame.p2p_dir") == "0"
        is_caller = field_of(body, "q931.call_ref_flag") == "0"
        call = (field_of(body, "q931.call_ref"), is_network == is_caller)
        message = MESSAGES.get(int(field_of(body, "q931.message_type"), 16))
        if message == "SETUP":
            for number in ("q931.called_party_number.digits", "q931.calling_party_number.digits"):
                digits = re.search(r"\d{4}$", field_of(body, number) or "")
                if digits and int(digits[0]) in known:
                    row_of.setdefault(call, int(digits[0]))
        if is_network == (wire == "C"):
            heard.setdefault(row_of.get(call), []).append((message, packet))
    return heard


def diversion(packet):
    """DivertingLegInformation2 of EN 300 207-1, of which tshark has no name but that of another protocol's operation"""
    octets = field_of(packet, "q932.ros.argument") or ""
    if field_of(packet, "q932.ros.local") != "15":
        return {}
    found = re.match(r"30:..:02:01:(..):0a:01:(..):a1:..:(..):..:(?:a1:..:)?0a:01:(..):12:..:([0-9a-f:]*)", octets)
    if not found:
        return {"other": octets}
    names = ("counter", "reason", "presentation", "type")
    presentations = {"a0": "0", "a3": "1"}
    values = [str(int(one, 16)) if i != 2 else presentations.get(one, one) for i, one in enumerate(found.groups()[:4])]
    return dict(zip(names, values), digits=bytes.fromhex(found[5].replace(":", "")).decode())


def operation(packet):
    """An operation of the facility element: its number (of EN 300 182-1 and others), and its argument's octets"""
    argument = field_of(packet, "q932.ros.argument") or ""
    return {"local": field_of(packet, "q932.ros.local") or "", "octets": argument.replace(":", "")}


def same(text, wanted):
    try:
        return int(text, 0) == int(wanted, 0)
    except ValueError:
        return text == wanted


def is_heard_by_exchange(messages, expected):
    """`SETUP Calling party number digits=30 number_type=1`: an element that has all of these; `no ...`: there is none"""
    message, _, rest = expected.partition(" ")
    wanted = [word.split("=", 1) for word in rest.split() if "=" in word]
    element = " ".join(word for word in rest.split() if "=" not in word)
    is_absent = element.startswith("no ")
    candidates = [packet for name, packet in messages if name == message]
    found = False
    if element in ("diversion", "operation"):
        read = diversion if element == "diversion" else operation
        return any(dict(wanted).items() <= read(packet).items() for packet in candidates)
    for packet in candidates:
        for one in packet.iter("field"):
            if not ((one.get("show") or "") + (one.get("showname") or "")).startswith(element.removeprefix("no ")):
                continue
            found = found or all(any(field.get("name").endswith(name) and same(field.get("show"), value)
                                     for field in one.iter("field")) for name, value in wanted)
    return bool(candidates) and found != is_absent


def tell(messages):
    """For whoever mends a row."""
    for one in messages:
        if isinstance(one, str):
            print("    " + one.replace("\r", "").strip().replace("\n", "\n    "))
            continue
        print("    " + str(one[0]), diversion(one[1]), operation(one[1]))
        for field in one[1].find("proto[@name='q931']").iter("field"):
            print("        ", field.get("name"), field.get("show"))


def judge(rows, folder):
    known = {row.number for row in rows}
    heard = {wire: heard_by_exchange(f"{folder}/{wire.lower()}.pcap", wire, known) for wire in "BC"} | {"S": {}}
    for file in (one for one, ours in (("from_sip", "caller"), ("to_sip", "callee")) if any(getattr(row, ours) == "S" for row in rows)):
        heard["S"].update(heard_by_sip(f"{folder}/{file}.messages", rows))
    failures = 0
    for row in rows:
        for expected in row.heard:
            messages = heard[expected[0]].get(row.number, [])
            judges = {"S": is_heard_by_sip}.get(expected[0], is_heard_by_exchange)
            if judges(messages, expected[2:]):
                continue
            failures += 1
            print(f"row {row.number}, {row.caller} to {row.callee}, {row.element}: {' & '.join(row.said)}, but not {expected}")
            tell(messages)
    print(f"{len(rows)} rows, {failures} of whose expectations failed")
    return failures == 0


def main():
    verb, table, folder = sys.argv[1:]
    rows = rows_of(table)
    return write(rows, folder) if verb == "write" else sys.exit(0 if judge(rows, folder) else 1)


main()
