#!/usr/bin/python3
"""Writes the gateway tests' requests as seeds of sip_message_fuzzer.

Each SIPp client scenario in tests/gateway/ becomes seeds of up to eight
requests each (the fuzzer's limit), its keywords filled in as a phone at
127.0.0.1:5062 would send them; a few requests of the scripted phone's
security cases (tests/gateway/registrar/authentication.py) follow, built here.
An [authentication ...] keyword becomes an Authorization header that the
fuzzer's registrar accepts: the harness fixes the nonce key (twenty zero
bytes) and the clock (GatewayHarness::kStartMs), so the nonce the gateway
would have made for the realm and Call-ID is computed here as it makes it
(registrar/NonceGenerator.h). When that format changes, the fuzzer aborts
at start (its nonce self-check) and this script is run again:

    /usr/bin/python3 fuzz/sip_message_seeds.py

(`--self-check` prints the nonce the fuzzer compares its gateway's with.)

It rewrites the seeds whose names start with "test-" and leaves the others.
"""

import hashlib
import hmac
import os
import re
import sys

HERE = os.path.dirname(os.path.abspath(__file__))
TESTS = os.path.join(HERE, "..", "tests", "gateway")
CORPUS = os.path.join(HERE, "corpus", "sip_message")
START_MS = 1764000000000
NONCE_KEY = bytes(20)
MAXIMUM_MESSAGES = 8
SCENARIOS = ["registrar/phone.xml", "registrar/retransmission.xml", "sip/protocol.xml",
             "store/register.xml", "store/moved.xml", "control/phone.xml"]
PASSWORDS = {"alice": "secret", "erin": "erin-password"}


def nonce_source(via):
    """The source a nonce is bound to, as the fuzzer's request arrives from
    its Via: the address over UDP, address and port over the others."""
    transport, address = via.split(" ")
    if transport.upper() == "UDP":
        return "udp " + address.rsplit(":", 1)[0]
    return "%s %s" % (transport.upper(), address)


def nonce(realm, call_id, source, made_ms=START_MS, sequence=1):
    # Time, issuer (zero: the harness's random numbers) and sequence.
    fields = "%016x%016x%016x" % (made_ms, 0, sequence)
    data = "%s:%d:%s:%d:%s%s" % (fields, len(realm.encode()), realm, len(call_id.encode()), call_id, source)
    return fields + hmac.new(NONCE_KEY, data.encode(), hashlib.sha1).hexdigest()


def hash_hex(algorithm, text):
    return hashlib.new({"MD5": "md5", "SHA-256": "sha256"}[algorithm], text.encode()).hexdigest()


class Nonces:
    """The nonce-count of each nonce used so far in one corpus input."""

    def __init__(self):
        self.counts = {}

    def authorization(self, method, uri, call_id, user, password, realm, algorithm="MD5",
                      made_ms=START_MS, via="UDP 127.0.0.1:5062"):
        value = nonce(realm, call_id, nonce_source(via), made_ms)
        self.counts[value] = self.counts.get(value, 0) + 1
        count = "%08x" % self.counts[value]
        cnonce = "0a4f113b"
        ha1 = hash_hex(algorithm, "%s:%s:%s" % (user, realm, password))
        ha2 = hash_hex(algorithm, "%s:%s" % (method, uri))
        response = hash_hex(algorithm, ":".join([ha1, value, count, cnonce, "auth", ha2]))
        return ('Authorization: Digest username="%s", realm="%s", nonce="%s", uri="%s", algorithm=%s, '
                'qop=auth, nc=%s, cnonce="%s", response="%s"'
                % (user, realm, value, uri, algorithm, count, cnonce, response))


def realm_of(message):
    to = re.search(r"^To:.*?@([^>;:\s]+)", message, re.M)
    return to.group(1) if to else "example.com"


def fill(text, call_number, nonces):
    """One SIPp request as the phone sends it, or None when it needs an answer's fields."""
    if "[last_" in text or "[$" in text:
        return None
    lines = [line.strip() for line in text.split("\n")]
    while lines and not lines[0]:
        lines.pop(0)
    while lines and not lines[-1]:
        lines.pop()
    message = "\r\n".join(lines) + "\r\n\r\n"
    values = {"transport": "UDP", "local_ip": "127.0.0.1", "local_port": "5062", "remote_ip": "127.0.0.1",
              "remote_port": "5060", "pid": "4242", "call_number": str(call_number),
              "call_id": "%d-4242@127.0.0.1" % call_number, "service": "alice", "contact_port": "5064",
              "expires": "120"}
    message = message.replace("[branch]", "z9hG4bK-4242-%d-%d" % (call_number, len(nonces.counts)))
    for key, value in values.items():
        message = message.replace("[%s]" % key, value)
    found = re.search(r"\[authentication(?: username=(\S+) password=([^\]]+))?\]", message)
    if found:
        user = found.group(1) or "alice"
        password = found.group(2) or PASSWORDS.get(user, "welcome")
        method, uri = message.split(" ", 2)[:2]
        call_id = re.search(r"^Call-ID: (.*)\r$", message, re.M).group(1)
        message = message.replace(found.group(0),
                                  nonces.authorization(method, uri, call_id, user, password, realm_of(message)))
    return message


def scenario_seeds():
    for scenario in SCENARIOS:
        path = os.path.join(TESTS, scenario)
        if not os.path.exists(path):
            continue
        sends = re.findall(r"<send[^>]*><!\[CDATA\[(.*?)\]\]></send>", open(path).read(), re.S)
        nonces = Nonces()
        requests = [request for request in (fill(send, 1, nonces) for send in sends) if request]
        name = "test-" + scenario.replace("/", "-").replace(".xml", "")
        for first in range(0, len(requests), MAXIMUM_MESSAGES):
            part = requests[first:first + MAXIMUM_MESSAGES]
            yield "%s-%d" % (name, first // MAXIMUM_MESSAGES + 1), "".join(part)


def request(method, uri, to, call_id, cseq, headers=(), via="UDP 127.0.0.1:5062"):
    lines = ["%s %s SIP/2.0" % (method, uri),
             "Via: SIP/2.0/%s;branch=z9hG4bK-%s-%d" % (via, call_id, cseq),
             "From: <sip:phone@example.com>;tag=%d" % cseq,
             "To: <%s>" % to,
             "Call-ID: " + call_id,
             "CSeq: %d %s" % (cseq, method),
             "Max-Forwards: 70"] + list(headers) + ["Content-Length: 0", "", ""]
    return "\r\n".join(lines)


def register(nonces, user, password, call_id, cseq, contacts, expires=None, realm="example.com",
             via="UDP 127.0.0.1:5062", algorithm="MD5", made_ms=START_MS, digest_uri=None, extra=()):
    uri = "sip:" + realm
    headers = ["Contact: " + contact for contact in contacts] + list(extra)
    if expires is not None:
        headers.append("Expires: %d" % expires)
    headers.append(nonces.authorization("REGISTER", digest_uri or uri, call_id, user, password, realm,
                                        algorithm, made_ms, via))
    return request("REGISTER", uri, "sip:%s@%s" % (user, realm), call_id, cseq, headers, via)


def phone_seeds():
    n = Nonces()
    yield "test-phone-dynamic-user-registers-is-called-and-leaves", "".join([
        register(n, "dave", "welcome", "dyn-1", 1, ["<sip:dave@127.0.0.1:5062>"], 120),
        request("INVITE", "sip:dave@example.com", "sip:dave@example.com", "call-1", 1),
        register(n, "dave", "welcome", "dyn-1", 2, ["<sip:dave@127.0.0.1:5062>"], 0),
        request("INVITE", "sip:dave@example.com", "sip:dave@example.com", "call-2", 1)])
    n = Nonces()
    yield "test-phone-nated-contacts-over-udp-and-tcp", "".join([
        register(n, "alice", "secret", "nat-1", 1, ["<sip:alice@192.168.1.20:5062>;q=0.5"], 300,
                 via="UDP 198.51.100.7:40000"),
        register(n, "alice", "secret", "nat-2", 1,
                 ['<sip:alice@10.0.0.9:5062;transport=tcp>;+sip.instance="<urn:uuid:00000000-0000-1000-8000-'
                  '000a95a0e128>";reg-id=1'], 300, via="TCP 198.51.100.8:40001", algorithm="SHA-256"),
        request("INVITE", "sip:alice@example.com", "sip:alice@example.com", "call-3", 1),
        request("INVITE", "sip:250@example.com", "sip:250@example.com", "call-4", 1),
        request("MESSAGE", "sip:7123@example.com", "sip:7123@example.com", "call-5", 1)])
    n = Nonces()
    contacts = ["<sip:alice@127.0.0.1:%d>" % (6000 + i) for i in range(16)]
    yield "test-phone-more-bindings-than-an-identity-holds", "".join([
        register(n, "alice", "secret", "many-1", 1, contacts, 600),
        register(n, "alice", "secret", "many-2", 1, [c.replace(":6", ":7") for c in contacts], 900),
        register(n, "alice", "secret", "many-3", 1, [c.replace(":6", ":8") for c in contacts], 300),
        request("INVITE", "sip:alice@example.com", "sip:alice@example.com", "call-6", 1)])
    n = Nonces()
    yield "test-phone-refresh-retransmission-out-of-order-and-wildcard", "".join([
        register(n, "carol", "welcome", "carol-1", 5, ["<sip:carol@127.0.0.1:5062>;expires=1"]),
        register(n, "carol", "welcome", "carol-1", 6, ["<sip:carol@127.0.0.1:5062>"], 60),
        register(n, "carol", "welcome", "carol-1", 6, ["<sip:carol@127.0.0.1:5062>"], 60),
        register(n, "carol", "welcome", "carol-1", 4, ["<sip:carol@127.0.0.1:5062>"], 60),
        register(n, "carol", "welcome", "carol-1", 7, ["*"], 0)])
    n = Nonces()
    yield "test-phone-refused-credentials", "".join([
        register(n, "alice", "welcome", "bad-1", 1, ["<sip:alice@127.0.0.1:5062>"], 120),
        register(n, "alice", "secret", "bad-2", 1, ["<sip:alice@127.0.0.1:5062>"], 120,
                 digest_uri="sip:other.example"),
        register(n, "alice", "secret", "bad-3", 1, ["<sip:alice@127.0.0.1:5062>"], 120,
                 made_ms=START_MS - 6 * 60 * 1000),
        register(n, "erin", "erin-password", "erin-1", 1, ["<sip:erin@127.0.0.1:5062>"], 120,
                 realm="other.example"),
        register(n, "nobody", "welcome", "nobody-1", 1, ["<sip:nobody@127.0.0.1:5062>"], 120,
                 realm="other.example"),
        register(n, "trunk", "welcome", "trunk-1", 1, ["<sip:trunk@127.0.0.1:5062>"], 120),
        register(n, "DEFAULT", "welcome", "group-1", 1, ["<sip:x@127.0.0.1:5062>"], 120)])


def main():
    if len(sys.argv) > 1 and sys.argv[1] == "--self-check":
        # The nonce the fuzzer compares with its gateway's at start.
        print(nonce("example.com", "fuzz-self-check", "udp 127.0.0.1"))
        return 0
    os.makedirs(CORPUS, exist_ok=True)
    for name in os.listdir(CORPUS):
        if name.startswith("test-"):
            os.remove(os.path.join(CORPUS, name))
    count = 0
    for name, text in list(scenario_seeds()) + list(phone_seeds()):
        with open(os.path.join(CORPUS, name), "wb") as written:
            written.write(text.encode())
        count += 1
    print("%d seeds written to %s" % (count, CORPUS))


if __name__ == "__main__":
    sys.exit(main())
