#!/usr/bin/python3
"""End to end: who must authenticate a call the gateway relays, with which
challenge, and that captured credentials cannot place another.

    authentication.py GATEWAY WORK-DIR [EMULATOR...]

The caller is sipphone.Phone, which computes SHA-256 digests and sends a
captured request again (SIPp can do neither). Where a call must reach a
phone, the callee is SIPp's built-in UAS: the test registers bob from a
port, then starts SIPp on that port.
"""

import os
import re
import shutil
import subprocess
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Failure, Gateway, Phone, Response, await_bound, authorization, check, run  # noqa: E402

HERE = os.path.dirname(os.path.abspath(__file__))
SCRIPTS = [os.path.join(HERE, "callers.script")]
RELAY = ["--calls", "relay"]
SIPP_LIMIT_S = 30
# The README's fail2ban filter.
FAIL2BAN = re.compile(r'^location-gateway: authentication failed for "(?P<user>.*)" from (?P<host>\S+) port \d+: '
                      r'(?P<reason>.*)$', re.M)
OFFER = "v=0\r\no=- 1 1 IN IP4 127.0.0.1\r\ns=-\r\nc=IN IP4 127.0.0.1\r\nt=0 0\r\nm=audio 40000 RTP/AVP 0\r\n"


class Call:
    """The caller's side of one call from phone: its From and tag, Call-ID,
    CSeq and the branch of its last INVITE."""

    def __init__(self, phone, caller, callee="sip:bob@example.com"):
        self.phone = phone
        self.caller = caller
        self.callee = callee
        self.call_id = phone.new_call_id()
        self.tag = "caller-" + self.call_id.split("@")[0]
        self.cseq = 0
        self.branch = None

    def text(self, method, cseq, uri=None, to=None, headers=(), body="", branch=None):
        Phone.counter += 1
        branch = branch or "z9hG4bK-%d-%d" % (os.getpid(), Phone.counter)
        lines = ["%s %s SIP/2.0" % (method, uri or self.callee),
                 "Via: SIP/2.0/UDP %s:%d;branch=%s" % (self.phone.address, self.phone.port, branch),
                 "From: <%s>;tag=%s" % (self.caller, self.tag),
                 "To: " + (to or "<%s>" % self.callee),
                 "Call-ID: " + self.call_id,
                 "CSeq: %d %s" % (cseq, method),
                 "Contact: <sip:caller@%s:%d>" % (self.phone.address, self.phone.port),
                 "Max-Forwards: 70"] + list(headers)
        if body:
            lines.append("Content-Type: application/sdp")
        return "\r\n".join(lines + ["Content-Length: %d" % len(body), "", body]), branch

    def invite(self, headers=()):
        """Sends a new INVITE; its text and its answers, the final one last."""
        self.cseq += 1
        text, self.branch = self.text("INVITE", self.cseq, headers=headers, body=OFFER)
        return text, self.send(text)

    def send(self, text):
        self.phone.socket.sendto(text.encode(), self.phone.target)
        return answers(self.phone, self.cseq, text.split()[0])

    def ack(self, final):
        """The ACK of the final answer: in its transaction for a failure, to
        the callee's Contact for a 2xx."""
        to = final.all("To")[0]
        if final.status >= 300:
            text, _ = self.text("ACK", self.cseq, to=to, branch=self.branch)
        else:
            text, _ = self.text("ACK", self.cseq, uri=contact_of(final), to=to)
        self.phone.socket.sendto(text.encode(), self.phone.target)

    def hang_up(self, final):
        self.cseq += 1
        text, _ = self.text("BYE", self.cseq, uri=contact_of(final), to=final.all("To")[0])
        return self.send(text)[-1]


def answers(phone, cseq, method):
    """What the gateway answers to the request (cseq, method), the final answer
    last. Answers repeated for an earlier request are skipped; an answer to an
    ACK fails."""
    found = []
    while True:
        data, _ = phone.socket.recvfrom(65535)
        response = Response(data.decode(errors="replace"))
        number, name = response.all("CSeq")[0].split()
        check(name != "ACK", "an ACK was answered with %d" % response.status)
        if (int(number), name) != (cseq, method):
            continue
        found.append(response)
        if response.status >= 200:
            return found


def contact_of(response):
    return response.all("Contact")[0].split(">")[0].lstrip("<")


def proxy_authorization(challenge, uri, user, password, nc=1):
    return "Proxy-" + authorization(challenge, "INVITE", uri, user, password, nc)


def authenticated_invite(call, user, password, uri=None):
    """Sends the INVITE that answers the gateway's challenge to the one before
    it (acknowledged); its text, its answers, and the 407."""
    _, first = call.invite()
    challenged = first[-1]
    check(challenged.status == 407, "%s called without credentials: %d" % (call.caller, challenged.status))
    call.ack(challenged)
    challenge = challenged.challenges("Proxy-Authenticate")[0]
    text, answered = call.invite([proxy_authorization(challenge, uri or call.callee, user, password)])
    return text, answered, challenged


def register_callee(gateway):
    """Registers bob from a free port and returns the port."""
    phone = Phone(gateway.port)
    port = phone.port
    call_id = phone.new_call_id()
    contact = ["Contact: <sip:bob@127.0.0.1:%d>" % port, "Expires: 300"]
    first = phone.send(phone.build("REGISTER", "sip:example.com", "sip:bob@example.com", call_id, 1, contact))
    auth = authorization(first.challenges()[0], "REGISTER", "sip:example.com", "bob", "bob-secret")
    answer = phone.send(phone.build("REGISTER", "sip:example.com", "sip:bob@example.com", call_id, 2,
                                    contact + [auth]))
    check(answer.status == 200, "bob did not register: %d" % answer.status)
    phone.close()
    return port


def a_subscriber_authenticates_and_an_outsider_does_not(program, work, emulator):
    sipp = shutil.which("sipp")
    if not sipp:
        print("skipped: no sipp")
        return
    gateway = Gateway(program, emulator, work, "relayed", SCRIPTS, RELAY)
    callee = None
    try:
        port = register_callee(gateway)
        with open(os.path.join(work, "relayed.sipp.log"), "wb") as log:
            callee = subprocess.Popen([sipp, "-sn", "uas", "-i", "127.0.0.1", "-p", str(port), "-m", "2",
                                       "-timeout", "%ds" % SIPP_LIMIT_S, "-nostdin"],
                                      cwd=work, stdout=log, stderr=subprocess.STDOUT)
        # A call relayed before SIPp holds its port would find no phone there.
        if not await_bound(callee, port, SIPP_LIMIT_S):
            raise Failure("SIPp did not listen on port %d" % port)
        phone = Phone(gateway.port)
        # alice is challenged as a proxy challenges (407), with both
        # algorithms; the ACK of the 407 gets no answer of its own, and her
        # answer in Proxy-Authorization reaches bob.
        alice = Call(phone, "sip:alice@example.com")
        _, first = alice.invite()
        challenged = first[-1]
        check(challenged.status == 407, "alice called without credentials: %d" % challenged.status)
        offered = challenged.challenges("Proxy-Authenticate")
        check([(c[0], c[2]) for c in offered] == [("example.com", "SHA-256"), ("example.com", "MD5")]
              and not challenged.all("WWW-Authenticate"), "challenge: %r" % challenged.headers)
        alice.ack(challenged)
        _, second = alice.invite([proxy_authorization(offered[0], alice.callee, "alice", "secret")])
        check([r.status for r in second][-2:] == [180, 200], "alice's call: %r" % [r.status for r in second])
        alice.ack(second[-1])
        check(alice.hang_up(second[-1]).status == 200, "alice's BYE refused")
        # An outside caller reaches bob without a challenge.
        outsider = Call(phone, "sip:carrier@elsewhere.org")
        _, third = outsider.invite()
        check([r.status for r in third][-2:] == [180, 200], "outside call: %r" % [r.status for r in third])
        outsider.ack(third[-1])
        check(outsider.hang_up(third[-1]).status == 200, "the outsider's BYE refused")
        try:
            status = callee.wait(timeout=SIPP_LIMIT_S)
        except subprocess.TimeoutExpired:
            raise Failure("SIPp did not end its two calls")
        check(status == 0, "SIPp ended with %d" % status)
        phone.close()
        gateway.stop()
        lines = [line for line in gateway.output().splitlines() if line.startswith("INVITE")]
        check(lines == ["INVITE sip:bob@example.com - 407", "INVITE sip:bob@example.com example.com/bob 200",
                        "INVITE sip:bob@example.com example.com/bob 200"], "request lines: %r" % lines)
    finally:
        if callee and callee.poll() is None:
            callee.kill()
            callee.wait()
        gateway.kill()


def call_credentials_serve_once_and_failures_count(program, work, emulator):
    gateway = Gateway(program, emulator, work, "credentials", SCRIPTS, RELAY)
    try:
        phone = Phone(gateway.port)
        # Nobody is registered: a call that passes authentication gets 480.
        captured, answered, _ = authenticated_invite(Call(phone, "sip:alice@example.com"), "alice", "secret")
        check(answered[-1].status == 480, "alice's call answered %d" % answered[-1].status)
        phone.socket.sendto(captured.encode(), phone.target)
        check(answers(phone, 2, "INVITE")[-1].status == 480, "a retransmitted INVITE answered otherwise")
        # The captured INVITE from another address gets a fresh challenge,
        # and the nonce on another INVITE of the call a stale one.
        thief = Phone(gateway.port, "127.0.0.2")
        replayed = re.sub(r"(Via: SIP/2\.0/UDP )[^;]+", r"\g<1>%s:%d" % (thief.address, thief.port), captured)
        thief.socket.sendto(replayed.encode(), thief.target)
        check(answers(thief, 2, "INVITE")[-1].status == 407, "a nonce answered from another address")
        again = re.sub(r"CSeq: 2 INVITE", "CSeq: 3 INVITE", captured)
        phone.socket.sendto(again.encode(), phone.target)
        stale = answers(phone, 3, "INVITE")[-1]
        check(stale.status == 407 and all(c[3] for c in stale.challenges("Proxy-Authenticate")),
              "a used nonce answered %d %r" % (stale.status, stale.headers))
        # A wrong password and a digest over another URI fail, are logged
        # and count toward the hold that REGISTER shares.
        call = Call(phone, "sip:alice@example.com")
        check(authenticated_invite(call, "alice", "guess")[1][-1].status == 403, "a wrong password accepted")
        call = Call(phone, "sip:alice@example.com")
        check(authenticated_invite(call, "alice", "secret", "sip:carol@example.com")[1][-1].status == 403,
              "a digest over another URI accepted")
        for attempt in range(8):
            call = Call(phone, "sip:alice@example.com")
            check(authenticated_invite(call, "alice", "guess%d" % attempt)[1][-1].status == 403,
                  "a wrong password accepted")
        held = phone.send(phone.build("REGISTER", "sip:example.com", "sip:alice@example.com", phone.new_call_id(), 1))
        check(held.status == 403, "a REGISTER after 10 failed calls answered %d" % held.status)
        status = Call(phone, "sip:carrier@elsewhere.org").invite()[1][-1].status
        check(status == 403, "a held source called from another domain and got %d" % status)
        thief.close()
        phone.close()
        gateway.stop()
        failures = [(m.group("user"), m.group("host"), m.group("reason")) for m in FAIL2BAN.finditer(gateway.errors())]
        check(failures[:2] == [("alice", "127.0.0.1", "wrong user or password"),
                               ("alice", "127.0.0.1", "digest uri is not the request URI")] and len(failures) == 10,
              "failures logged: %r" % failures)
        check(len(re.findall(r"127\.0\.0\.1 port \d+ refused for \d+ s after 10 failed", gateway.errors())) == 1,
              "the hold was not logged once")
    finally:
        gateway.kill()


def who_must_authenticate(program, work, emulator):
    gateway = Gateway(program, emulator, work, "who", SCRIPTS, RELAY)
    try:
        phone = Phone(gateway.port)
        # No credentials to ask for: lobby, which may register without any,
        # calls (480: bob is not registered); trunk, which may not, gets 403.
        for caller, expected in (("sip:lobby@example.com", 480), ("sip:trunk@example.com", 403)):
            status = Call(phone, caller).invite()[1][-1].status
            check(status == expected, "%s called and got %d" % (caller, status))
        # A user nobody answers in a served domain is challenged as a known
        # one, and refused whatever the answer.
        offered = {}
        for user in ("erin", "zed"):
            call = Call(phone, "sip:%s@other.example" % user)
            _, answered, challenged = authenticated_invite(call, user, "erin-password")
            offered[user] = [(c[0], c[2], c[3]) for c in challenged.challenges("Proxy-Authenticate")]
            check(answered[-1].status == (480 if user == "erin" else 403),
                  "%s answered %d with credentials" % (user, answered[-1].status))
        expected = [("other.example", "SHA-256", False), ("other.example", "MD5", False)]
        check(offered["erin"] == offered["zed"] == expected,
              "known and unknown callers challenged differently: %r" % offered)
        phone.close()
        gateway.stop()
        check([m.group("user") for m in FAIL2BAN.finditer(gateway.errors())] == ["zed"],
              "failures logged: %r" % gateway.errors())
    finally:
        gateway.kill()


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: authentication.py GATEWAY WORK-DIR [EMULATOR...]")
    sys.exit(run([("a_subscriber_authenticates_and_an_outsider_does_not",
                   a_subscriber_authenticates_and_an_outsider_does_not),
                  ("call_credentials_serve_once_and_failures_count", call_credentials_serve_once_and_failures_count),
                  ("who_must_authenticate", who_must_authenticate)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
