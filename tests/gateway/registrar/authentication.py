#!/usr/bin/python3
"""End to end: who may register at the gateway, with which digest, and that a
captured registration cannot be used again.

    authentication.py GATEWAY WORK-DIR [EMULATOR...]

The phone is sipphone.Phone (SIPp cannot do these cases: see there).
"""

import os
import re
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Failure, Gateway, Phone, StreamPhone, authorization, check, run  # noqa: E402

HERE = os.path.dirname(os.path.abspath(__file__))
SCRIPTS = [os.path.join(HERE, "subscribers.script"), os.path.join(HERE, "security.script")]
FILTERS = os.path.join(HERE, "filters.script")
PASSWORDS = ["secret", "welcome", "erin-password", "topsecret"]
# The README's fail2ban filter.
FAIL2BAN = re.compile(r'^location-gateway: authentication failed for ".*" from (?P<host>\S+) port \d+', re.M)


def register(phone, to, call_id, cseq, contact=None, auth=None, uri="sip:example.com", expires=300):
    headers = []
    if contact:
        headers += ["Contact: <%s>" % contact, "Expires: %d" % expires]
    if auth:
        headers.append(auth)
    return phone.build("REGISTER", uri, to, call_id, cseq, headers)


def sha256_registration_cannot_be_replayed(program, work, emulator):
    gateway = Gateway(program, emulator, work, "replay", SCRIPTS, ["--debug"])
    try:
        phone = Phone(gateway.port)
        alice = "sip:alice@example.com"
        call_id = phone.new_call_id()
        first = phone.send(register(phone, alice, call_id, 1, "sip:alice@192.0.2.1"))
        check(first.status == 401, "no challenge: %d" % first.status)
        challenges = first.challenges()
        check([c[2] for c in challenges] == ["SHA-256", "MD5"], "challenges offered: %r" % challenges)
        auth = authorization(challenges[0], "REGISTER", "sip:example.com", "alice", "secret")
        accepted = register(phone, alice, call_id, 2, "sip:alice@192.0.2.1", auth)
        check(phone.send(accepted).status == 200, "SHA-256 response refused")
        check(phone.send(accepted).status == 200, "a retransmission refused")
        # The captured header with the attacker's Contact: same CSeq, then a
        # higher one; and on another registration (Call-ID).
        for cseq in (2, 3):
            replay = phone.send(register(phone, alice, call_id, cseq, "sip:mallory@203.0.113.66", auth))
            check(replay.status == 401 and all(c[3] for c in replay.challenges()),
                  "replay with CSeq %d answered %d %r" % (cseq, replay.status, replay.challenges()))
        other = phone.send(register(phone, alice, phone.new_call_id(), 1, "sip:mallory@203.0.113.66", auth))
        check(other.status == 401, "nonce taken to another Call-ID: %d" % other.status)
        where = phone.send(phone.build("MESSAGE", alice, alice, phone.new_call_id(), 1))
        check(where.status == 302 and [c.split(">")[0] for c in where.all("Contact")] == ["<sip:alice@192.0.2.1"],
              "binding changed: %d %r" % (where.status, where.all("Contact")))
        # The phone's own next request: a higher nonce-count passes, and so
        # does MD5.
        auth2 = authorization(challenges[0], "REGISTER", "sip:example.com", "alice", "secret", nc=2)
        check(phone.send(register(phone, alice, call_id, 4, "sip:alice@192.0.2.1", auth2)).status == 200,
              "a higher nonce-count refused")
        carol = "sip:carol@example.com"
        carol_call = phone.new_call_id()
        md5 = phone.send(register(phone, carol, carol_call, 1, "sip:carol@192.0.2.3")).challenges()[1]
        auth = authorization(md5, "REGISTER", "sip:example.com", "carol", "welcome")
        check(phone.send(register(phone, carol, carol_call, 2, "sip:carol@192.0.2.3", auth)).status == 200,
              "MD5 response refused")
        # A password in a Request-URI, as RFC 3261 advises against.
        phone.send(phone.build("MESSAGE", "sip:alice:topsecret@example.com", alice, phone.new_call_id(), 1))
        phone.close()
        gateway.stop()
        printed = gateway.output() + gateway.errors()
        check("sip:alice:****@example.com" in printed, "the request log lost the masked URI")
        check("debug: " in printed, "--debug printed no debug line")
        for secret in PASSWORDS:
            check(secret not in printed, "the output shows the password " + secret)
        check("response=" not in printed, "the output shows an Authorization")
    finally:
        gateway.kill()


def digest_over_another_uri_refused_and_logged(program, work, emulator):
    gateway = Gateway(program, emulator, work, "uri", SCRIPTS)
    try:
        phone = Phone(gateway.port)
        alice = "sip:alice@example.com"
        call_id = phone.new_call_id()
        challenge = phone.send(register(phone, alice, call_id, 1, "sip:alice@192.0.2.1")).challenges()[0]
        auth = authorization(challenge, "REGISTER", "sip:other.example", "alice", "secret")
        answer = phone.send(register(phone, alice, call_id, 2, "sip:alice@192.0.2.1", auth))
        check(answer.status == 403, "a digest over another URI answered %d" % answer.status)
        phone.close()
        gateway.stop()
        lines = FAIL2BAN.findall(gateway.errors())
        check(lines == ["127.0.0.1"], "fail2ban's filter found %r in %r" % (lines, gateway.errors()))
        check('"alice"' in gateway.errors(), "the failure does not name the user")
    finally:
        gateway.kill()


def only_challenged_or_registering_identities_register(program, work, emulator):
    gateway = Gateway(program, emulator, work, "who", SCRIPTS)
    try:
        phone = Phone(gateway.port)
        trunk = phone.send(register(phone, "sip:trunk@example.com", phone.new_call_id(), 1, "sip:x@203.0.113.66"))
        check(trunk.status == 403, "a trunk-only identity answered REGISTER with %d" % trunk.status)
        # A known and an unknown user of a domain without a "DEFAULT" group.
        answers = {}
        for user in ("erin", "zed"):
            call_id = phone.new_call_id()
            to = "sip:%s@other.example" % user
            first = phone.send(register(phone, to, call_id, 1, "sip:x@192.0.2.5", uri="sip:other.example"))
            answers[user] = (first.status, [(c[0], c[2], c[3]) for c in first.challenges()])
            auth = authorization(first.challenges()[0], "REGISTER", "sip:other.example", user, "erin-password")
            second = phone.send(register(phone, to, call_id, 2, "sip:x@192.0.2.5", auth, uri="sip:other.example"))
            check(second.status == (200 if user == "erin" else 403),
                  "%s answered with credentials: %d" % (user, second.status))
        check(answers["erin"] == answers["zed"] and answers["erin"][0] == 401,
              "known and unknown users answered differently: %r" % answers)
        elsewhere = phone.send(register(phone, "sip:zed@elsewhere.org", phone.new_call_id(), 1,
                                        uri="sip:elsewhere.org"))
        check(elsewhere.status == 404, "a domain nobody serves answered %d" % elsewhere.status)
        phone.close()
        gateway.stop()
    finally:
        gateway.kill()


def repeated_failures_hold_the_source(program, work, emulator):
    gateway = Gateway(program, emulator, work, "failures", SCRIPTS)
    try:
        phone = Phone(gateway.port)
        alice = "sip:alice@example.com"
        for attempt in range(12):
            call_id = phone.new_call_id()
            first = phone.send(register(phone, alice, call_id, 1, "sip:alice@192.0.2.1"))
            if attempt >= 10:
                check(first.status == 403, "attempt %d after 10 failures answered %d" % (attempt, first.status))
                continue
            check(first.status == 401, "attempt %d: %d" % (attempt, first.status))
            auth = authorization(first.challenges()[0], "REGISTER", "sip:example.com", "alice", "guess%d" % attempt)
            check(phone.send(register(phone, alice, call_id, 2, "sip:alice@192.0.2.1", auth)).status == 403,
                  "a wrong password accepted")
        # Another source is still challenged.
        neighbour = Phone(gateway.port, "127.0.0.2")
        check(neighbour.send(register(neighbour, alice, neighbour.new_call_id(), 1)).status == 401,
              "another source was held too")
        neighbour.close()
        phone.close()
        gateway.stop()
        held = re.findall(r"127\.0\.0\.1 port \d+ refused for \d+ s after 10 failed", gateway.errors())
        check(len(held) == 1, "the hold was logged %d times" % len(held))
    finally:
        gateway.kill()


def contacts_of(phone, to):
    """The Contact URIs of the 302 for to (none when there is no 302)."""
    where = phone.send(phone.build("MESSAGE", to, to, phone.new_call_id(), 1))
    return [c.split(">")[0].lstrip("<") for c in where.all("Contact")] if where.status == 302 else []


def authenticated(phone, to, call_id, cseq, contact, password, expires=300):
    """A REGISTER answering the challenge of the one before it (CSeq - 1)."""
    first = phone.send(register(phone, to, call_id, cseq - 1, contact, expires=expires))
    check(first.status == 401, "no challenge but %d" % first.status)
    auth = authorization(first.challenges()[0], "REGISTER", "sip:example.com", to[4:].split("@")[0], password)
    return register(phone, to, call_id, cseq, contact, auth, expires=expires)


def resent(text, sender):
    """A captured request as sender sends it again: only its Via, which no
    digest covers, names sender, so that the answer comes back to it."""
    return re.sub(r"(Via: SIP/2\.0/UDP )[^;]+", r"\g<1>%s:%d" % (sender.address, sender.port), text, count=1)


def a_registration_is_applied_once(program, work, emulator):
    gateway = Gateway(program, emulator, work, "once", SCRIPTS)
    try:
        phone = Phone(gateway.port)
        alice = "sip:alice@example.com"
        contact = "sip:alice@127.0.0.1:40001"
        call_id = phone.new_call_id()
        first = authenticated(phone, alice, call_id, 2, contact, "secret")
        check(phone.send(first).status == 200, "registration refused")
        check(phone.send(authenticated(phone, alice, call_id, 4, contact, "secret", 0)).status == 200,
              "unregistration refused")
        # The first request again, byte for byte, from another port and then
        # from the phone's own: neither brings the binding back.
        attacker = Phone(gateway.port)
        replay = attacker.send(resent(first, attacker))
        check(replay.status != 200, "a replay from another port answered 200")
        found = contacts_of(phone, alice)
        check(not any(str(attacker.port) in c for c in found), "the replay bound alice to the attacker: %r" % found)
        again = phone.send(first)
        check(again.status in (200, 401) and not again.all("Contact"),
              "a late retransmission answered %d %r" % (again.status, again.all("Contact")))
        check(not any(str(phone.port) in c for c in contacts_of(phone, alice)),
              "a late retransmission brought the binding back")
        attacker.close()
        phone.close()
        gateway.stop()
    finally:
        gateway.kill()


def a_query_is_not_reflected(program, work, emulator):
    gateway = Gateway(program, emulator, work, "reflect", SCRIPTS)
    try:
        phone = Phone(gateway.port)
        alice = "sip:alice@example.com"
        call_id = phone.new_call_id()
        check(phone.send(authenticated(phone, alice, call_id, 2, "sip:alice@192.0.2.1", "secret")).status == 200,
              "registration refused")
        query = authenticated(phone, alice, call_id, 4, None, "secret")
        check(phone.send(query).all("Contact"), "the query listed no binding")
        for address in ("127.0.0.2", "127.0.0.3"):
            victim = Phone(gateway.port, address)
            copy = victim.send(resent(query, victim))
            check(copy.status != 200 and not copy.all("Contact"),
                  "a copy from %s answered %d %r" % (address, copy.status, copy.all("Contact")))
            victim.close()
        # A contact whose parameters would make every 200 large is refused.
        long = "Contact: <sip:alice@192.0.2.9>;x=" + "a" * 1100
        challenge = phone.send(register(phone, alice, call_id, 5)).challenges()[0]
        auth = authorization(challenge, "REGISTER", "sip:example.com", "alice", "secret")
        answer = phone.send(phone.build("REGISTER", "sip:example.com", alice, call_id, 6, [long, auth]))
        check(answer.status == 400, "a contact of 1100 bytes answered %d" % answer.status)
        phone.close()
        gateway.stop()
    finally:
        gateway.kill()


def spoofed_failures_do_not_hold_a_source(program, work, emulator):
    gateway = Gateway(program, emulator, work, "spoofed", SCRIPTS)
    try:
        alice = "sip:alice@example.com"
        # The attacker's own nonce, sent with wrong passwords "from" the
        # site's address (a socket bound there stands for the forged source).
        attacker = Phone(gateway.port, "127.0.0.2")
        call_id = attacker.new_call_id()
        challenge = attacker.send(register(attacker, alice, call_id, 1)).challenges()[0]
        site = Phone(gateway.port)
        for attempt in range(12):
            auth = authorization(challenge, "REGISTER", "sip:example.com", "alice", "guess%d" % attempt)
            check(site.send(register(site, alice, call_id, 2 + attempt, None, auth)).status != 200, "guess accepted")
        phone = Phone(gateway.port)
        answer = phone.send(authenticated(phone, alice, phone.new_call_id(), 2, "sip:alice@192.0.2.1", "secret"))
        check(answer.status == 200, "a phone behind the spoofed address answered %d" % answer.status)
        check("authentication failed" not in gateway.errors(), "a spoofed failure was counted")
        # Over TCP a nonce is its connection's, even from the same address.
        first, second = StreamPhone(gateway.port, "tcp"), StreamPhone(gateway.port, "tcp")
        call_id = first.new_call_id()
        challenge = first.send(register(first, alice, call_id, 1, "sip:alice@192.0.2.1")).challenges()[0]
        auth = authorization(challenge, "REGISTER", "sip:example.com", "alice", "secret")
        answer = second.send(register(second, alice, call_id, 2, "sip:alice@192.0.2.1", auth))
        check(answer.status == 401, "a nonce answered over another connection: %d" % answer.status)
        check(first.send(register(first, alice, call_id, 3, "sip:alice@192.0.2.1", auth)).status == 200,
              "the nonce refused over its own connection")
        for each in (attacker, site, phone, first, second):
            each.close()
        gateway.stop()
    finally:
        gateway.kill()


def a_nonce_of_another_gateway_is_stale(program, work, emulator):
    key = os.path.join(work, "nonce.key")
    if os.path.exists(key):
        os.remove(key)
    first = Gateway(program, emulator, work, "cluster-a", SCRIPTS, ["--nonce-key-file", key])
    second = None
    try:
        check(os.stat(key).st_mode & 0o777 == 0o600, "the key file is not the owner's only")
        second = Gateway(program, emulator, work, "cluster-b", SCRIPTS, ["--nonce-key-file", key])
        alice = "sip:alice@example.com"
        contact = "sip:alice@192.0.2.1"
        # The phone fails over from the first gateway to the second.
        phone = Phone(first.port)
        call_id = phone.new_call_id()
        challenge = phone.send(register(phone, alice, call_id, 1, contact)).challenges()[0]
        auth = authorization(challenge, "REGISTER", "sip:example.com", "alice", "secret")
        phone.target = ("127.0.0.1", second.port)
        answer = phone.send(register(phone, alice, call_id, 2, contact, auth))
        check(answer.status == 401 and answer.challenges() and all(c[3] for c in answer.challenges()),
              "a nonce of the other gateway answered %d %r" % (answer.status, answer.challenges()))
        auth = authorization(answer.challenges()[0], "REGISTER", "sip:example.com", "alice", "secret")
        check(phone.send(register(phone, alice, call_id, 3, contact, auth)).status == 200,
              "the fresh nonce refused")
        # A key that is no key stops the start.
        short = os.path.join(work, "short.key")
        with open(short, "w") as out:
            out.write("0123")
        try:
            Gateway(program, emulator, work, "short", SCRIPTS, ["--nonce-key-file", short]).kill()
            raise Failure("a gateway started with a 4-byte key")
        except Failure as failure:
            check("nonce key file" in str(failure), "the start failed otherwise: %s" % failure)
        phone.close()
        second.stop()
        first.stop()
    finally:
        first.kill()
        if second:
            second.kill()


SHA256_WARNING = re.compile(r'^location-gateway: "(\w+)" from .* registers again without answering a challenge '
                            r'that offered SHA-256 first.*PJSIP before 2\.12.*--digest MD5,SHA-256$', re.M)


def a_phone_giving_up_on_sha256_is_named(program, work, emulator):
    gateway = Gateway(program, emulator, work, "giving-up", SCRIPTS)
    try:
        phone = Phone(gateway.port)
        # A phone that reads both challenges: its refresh starts without
        # credentials, and its first challenge came again (a lost 401).
        alice = "sip:alice@example.com"
        call_id = phone.new_call_id()
        phone.send(register(phone, alice, call_id, 1, "sip:alice@192.0.2.1"))
        check(phone.send(authenticated(phone, alice, call_id, 2, "sip:alice@192.0.2.1", "secret")).status == 200,
              "registration refused")
        check(phone.send(authenticated(phone, alice, call_id, 4, "sip:alice@192.0.2.1", "secret")).status == 200,
              "refresh refused")
        # One that gives up on SHA-256 and starts over later.
        carol = "sip:carol@example.com"
        call_id = phone.new_call_id()
        for cseq in (1, 2):
            check(phone.send(register(phone, carol, call_id, cseq, "sip:carol@192.0.2.3")).status == 401,
                  "no challenge")
        phone.close()
        gateway.stop()
        check(SHA256_WARNING.findall(gateway.errors()) == ["carol"],
              "warnings: %r in %r" % (SHA256_WARNING.findall(gateway.errors()), gateway.errors()))
    finally:
        gateway.kill()


def filter_rules_refuse_a_source_before_any_challenge(program, work, emulator):
    gateway = Gateway(program, emulator, work, "filters", SCRIPTS + [FILTERS])
    try:
        phone = Phone(gateway.port)
        neighbour = Phone(gateway.port, "127.0.0.2")
        # First REGISTER of each, without credentials: 401 is a challenge.
        cases = [(phone, "sip:fred@example.com", 403), (phone, "sip:carol@example.com", 401),
                 (phone, "sip:gina@example.com", 401), (neighbour, "sip:gina@example.com", 403),
                 (phone, "sip:ivan@lab.example", 403), (neighbour, "sip:ivan@lab.example", 200),
                 (phone, "sip:zoe@lab.example", 403)]
        for sender, to, expected in cases:
            uri = "sip:" + to.split("@")[1]
            answer = sender.send(register(sender, to, sender.new_call_id(), 1, "sip:x@192.0.2.8", uri=uri))
            check(answer.status == expected, "%s from %s answered %d" % (to, sender.address, answer.status))
        for to in ("sip:carol@example.com", "sip:gina@example.com"):
            check(phone.send(authenticated(phone, to, phone.new_call_id(), 2, "sip:x@192.0.2.8", "welcome")).status
                  == 200, to + " did not register")
        neighbour.close()
        phone.close()
        gateway.stop()
        lines = [line for line in gateway.output().splitlines() if line.endswith(" 403")]
        check(lines == ['REGISTER sip:example.com example.com/fred denied by rule 0 "deny 127.0.0.0 255.0.0.0" 403',
                        'REGISTER sip:example.com example.com/gina denied by rule 1 "deny any" 403',
                        'REGISTER sip:lab.example lab.example/ivan denied by rule 0 '
                        '"deny 127.0.0.1 255.255.255.255" 403',
                        'REGISTER sip:lab.example lab.example/DEFAULT denied by rule 0 '
                        '"deny 127.0.0.1 255.255.255.255" 403'],
              "request lines: %r" % lines)
        check("authentication failed" not in gateway.errors(), "a denied source was counted as a failure")
    finally:
        gateway.kill()


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: authentication.py GATEWAY WORK-DIR [EMULATOR...]")
    sys.exit(run([("sha256_registration_cannot_be_replayed", sha256_registration_cannot_be_replayed),
                  ("digest_over_another_uri_refused_and_logged", digest_over_another_uri_refused_and_logged),
                  ("only_challenged_or_registering_identities_register",
                   only_challenged_or_registering_identities_register),
                  ("repeated_failures_hold_the_source", repeated_failures_hold_the_source),
                  ("a_registration_is_applied_once", a_registration_is_applied_once),
                  ("a_query_is_not_reflected", a_query_is_not_reflected),
                  ("spoofed_failures_do_not_hold_a_source", spoofed_failures_do_not_hold_a_source),
                  ("a_nonce_of_another_gateway_is_stale", a_nonce_of_another_gateway_is_stale),
                  ("a_phone_giving_up_on_sha256_is_named", a_phone_giving_up_on_sha256_is_named),
                  ("filter_rules_refuse_a_source_before_any_challenge",
                   filter_rules_refuse_a_source_before_any_challenge)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
