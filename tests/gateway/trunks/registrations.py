#!/usr/bin/python3
"""End to end: the gateway's own registrations upstream, as the identity's
outbound-registration face says: when (the registration mode, the priority
among trunks of one account), where (a forced destination, the penalty box
and the non-INVITE transaction timeout) and what the registrar's answers
teach (a 3xx's dynamic registrar, a 200's Service-Route).

    registrations.py GATEWAY WORK-DIR [EMULATOR...]

The upstream registrars and proxies are UDP sockets on 127.0.0.2 served by
threads here (Upstream): they answer as each case scripts and keep every
request in order of arrival, which is what these cases look at (whether a
REGISTER came, when, where, with which Route). Every wait is bounded, and
the gateway is stopped by its PID.
"""

import os
import re
import socket
import sys
import threading
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Gateway, Phone, ask_control, check, run, write_script  # noqa: E402

UPSTREAM = "127.0.0.2"
# Far above anything on loopback, the gateway under an emulator included.
WAIT_LIMIT_S = 25
# How long a REGISTER that should not come is waited for: the gateway sends
# one as soon as it decides to, so on loopback it would be there long before.
QUIET_S = 1.0


def header(text, name):
    found = re.search(r"^%s *: *(.*?)\r?$" % re.escape(name), text, re.M | re.I)
    return found.group(1) if found else None


def expires(text):
    """The lifetime a REGISTER asks for, from its Contact or Expires."""
    contact = header(text, "Contact") or ""
    found = re.search(r"expires=(\d+)", contact)
    if found:
        return int(found.group(1))
    value = header(text, "Expires")
    return int(value) if value else None


def reply(request, status, reason, extra=()):
    """The response to request as text, its Vias, From, To (tagged),
    Call-ID and CSeq copied."""
    lines = ["SIP/2.0 %d %s" % (status, reason)]
    for line in request.split("\r\n")[1:]:
        if not line:
            break
        name = line.split(":", 1)[0].strip().lower()
        if name in ("via", "v", "from", "f", "call-id", "i", "cseq"):
            lines.append(line)
        elif name in ("to", "t"):
            lines.append(line if ";tag=" in line else line + ";tag=up%d" % status)
    return "\r\n".join(lines + list(extra) + ["Content-Length: 0", "", ""])


class Upstream(threading.Thread):
    """A registrar or proxy at UPSTREAM over UDP. answer(request, count)
    gives (status, reason, extra header lines) or None to keep quiet;
    count is the number of requests before this one. A 200 to a REGISTER
    repeats its Contact, as a registrar's does."""

    def __init__(self, answer):
        super().__init__(daemon=True)
        self.answer = answer
        self.socket = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
        self.socket.bind((UPSTREAM, 0))
        self.socket.settimeout(0.2)
        self.port = self.socket.getsockname()[1]
        self.requests = []
        self.condition = threading.Condition()
        self.stopping = False
        self.start()

    def run(self):
        while not self.stopping:
            try:
                data, source = self.socket.recvfrom(65535)
            except socket.timeout:
                continue
            text = data.decode(errors="replace")
            if text.startswith("SIP/2.0"):
                continue
            with self.condition:
                count = len(self.requests)
                self.requests.append(text)
                self.condition.notify_all()
            if text.startswith("ACK "):
                continue
            answer = self.answer(text, count)
            if answer is None:
                continue
            status, reason, extra = answer
            if status == 200 and text.startswith("REGISTER ") and header(text, "Contact"):
                extra = list(extra) + ["Contact: " + header(text, "Contact")]
            self.socket.sendto(reply(text, status, reason, extra).encode(), source)

    def registers(self):
        """The REGISTERs received, a retransmission counted once."""
        with self.condition:
            seen = set()
            found = []
            for text in self.requests:
                key = (header(text, "Call-ID"), header(text, "CSeq"))
                if text.startswith("REGISTER ") and key not in seen:
                    seen.add(key)
                    found.append(text)
            return found

    def await_request(self, predicate, what, limit_s=WAIT_LIMIT_S):
        """The first request since the start that satisfies predicate."""
        deadline = time.monotonic() + limit_s
        with self.condition:
            while True:
                for text in self.requests:
                    if predicate(text):
                        return text
                left = deadline - time.monotonic()
                check(left > 0, "no %s came within %d s; came: %s" % (what, limit_s, self.requests))
                self.condition.wait(left)

    def stop(self):
        self.stopping = True
        self.join(5)
        self.socket.close()


def registering(text):
    return text.startswith("REGISTER ") and expires(text) != 0


def unregistering(text):
    return text.startswith("REGISTER ") and expires(text) == 0


def answer_all(status, reason="OK", extra=()):
    return lambda request, count: (status, reason, list(extra))


def base_script(work, name, lines):
    return write_script(work, name, "location-service example.com create\n"
                        "location-service example.com domain insert 0 example.com\n" +
                        "".join(line + "\n" for line in lines))


def trunk_lines(identity, registrar, settings=(), service="example.com"):
    lines = ["identity %s %s create identity" % (service, identity),
             "identity %s %s face registration-outbound create" % (service, identity),
             "face %s %s registration-outbound registrar set %s" % (service, identity, registrar),
             "face %s %s registration-outbound lifetime set 300" % (service, identity)]
    return lines + ["face %s %s registration-outbound %s" % (service, identity, line) for line in settings]


def register_phone(gateway, phone, call_id, cseq, lifetime):
    text = phone.build("REGISTER", "sip:example.com", "sip:alice@example.com", call_id, cseq,
                       ["Contact: <sip:alice@127.0.0.1:%d>" % phone.port, "Expires: %d" % lifetime])
    answer = phone.send(text)
    check(answer.status == 200, "the phone's REGISTER was answered %d" % answer.status)


def carrier_call_reaches(gateway, phone):
    """A carrier's INVITE from UPSTREAM for alice reaches her phone, which
    answers 486; the final status the carrier got."""
    carrier = Phone(gateway.port, address=UPSTREAM)
    try:
        body = "v=0\r\no=c 1 1 IN IP4 %s\r\ns=-\r\nc=IN IP4 %s\r\nt=0 0\r\nm=audio 4000 RTP/AVP 0\r\n" % (
            UPSTREAM, UPSTREAM)
        uri = "sip:alice@127.0.0.1:%d" % gateway.port
        text = carrier.build("INVITE", uri, uri, carrier.new_call_id(), 1,
                             ["Contact: <sip:carrier@%s:%d>" % (UPSTREAM, carrier.port),
                              "Content-Type: application/sdp"])
        text = text.replace("Content-Length: 0\r\n\r\n", "Content-Length: %d\r\n\r\n%s" % (len(body), body))
        carrier.send(text, answer=False)
        invite, source = phone.socket.recvfrom(65535)
        invite = invite.decode(errors="replace")
        check(invite.startswith("INVITE sip:alice@127.0.0.1:%d" % phone.port),
              "the phone got no INVITE but: " + invite)
        phone.socket.sendto(reply(invite, 486, "Busy Here").encode(), source)
        # The gateway's ACK, before the phone's next REGISTER reads answers.
        ack = ""
        while not ack.startswith("ACK "):
            ack = phone.socket.recvfrom(65535)[0].decode(errors="replace")
        status = 100
        while status < 200:
            data, _ = carrier.socket.recvfrom(65535)
            status = int(data.decode(errors="replace").split()[1])
        return status
    finally:
        carrier.close()


def back_to_back_registration_follows_the_subscribers_phone(program, work, emulator):
    upstream = Upstream(answer_all(200))
    script = base_script(work, "back-to-back", [
        "identity example.com alice create identity",
        "identity example.com alice face registration-inbound create",
        "identity example.com alice face registration-outbound create",
        "face example.com alice registration-outbound registrar set %s:%d" % (UPSTREAM, upstream.port),
        "face example.com alice registration-outbound lifetime set 300",
        "face example.com alice registration-outbound registration-mode set back-to-back"])
    gateway = Gateway(program, emulator, work, "back-to-back", [script], ["--calls", "relay"])
    phone = Phone(gateway.port)
    try:
        time.sleep(QUIET_S)
        check(not upstream.registers(), "registered upstream before any phone did: %s" % upstream.registers())
        call_id = phone.new_call_id()
        register_phone(gateway, phone, call_id, 1, 300)
        registered = upstream.await_request(registering, "REGISTER upstream after the phone's")
        check(header(registered, "To").startswith("<sip:alice@%s" % UPSTREAM),
              "the REGISTER upstream is not alice's: " + registered)
        # A refresh of the phone's binding is no new registration upstream.
        register_phone(gateway, phone, call_id, 2, 300)
        # The identity is a subscriber and a trunk: its carrier's call
        # reaches the phone.
        check(carrier_call_reaches(gateway, phone) == 486, "the carrier did not get the phone's answer")
        check(len([text for text in upstream.registers() if registering(text)]) == 1,
              "the phone's refresh registered upstream again: %s" % upstream.registers())
        register_phone(gateway, phone, call_id, 3, 0)
        upstream.await_request(unregistering, "unregistration upstream after the phone's")
        # And again, for a phone that comes back.
        register_phone(gateway, phone, call_id, 4, 300)
        upstream.await_request(lambda text: len([each for each in upstream.registers() if registering(each)]) > 1,
                               "REGISTER upstream for the phone back")
        gateway.stop()
    finally:
        phone.close()
        gateway.kill()
        upstream.stop()


def dynamic_registrar_and_service_route_are_learnt_and_forgotten(program, work, emulator):
    service_proxy = Upstream(lambda request, count: (486, "Busy Here", []))
    routed = []

    def registrar_with_service_route(request, count):
        """A Service-Route in the 200 to trunk's first REGISTER only."""
        if header(request, "To").startswith("<sip:trunk@") and not routed:
            routed.append(request)
            return 200, "OK", ["Service-Route: <sip:%s:%d;lr>" % (UPSTREAM, service_proxy.port)]
        return 200, "OK", []

    moved = Upstream(registrar_with_service_route)
    redirecting = Upstream(answer_all(302, "Moved Temporarily", ["Contact: <sip:%s:%d>" % (UPSTREAM, moved.port)]))
    control = os.path.join(work, "learnt.control")
    configured = "%s:%d" % (UPSTREAM, redirecting.port)
    script = base_script(work, "learnt", trunk_lines("trunk", configured) + [
        "identity example.com trunk face registration-inbound create",
        "identity example.com trunk face call-outbound create"] +
        # The same redirection with the dynamic registrar as Request-URI.
        trunk_lines("switched", configured, ["request-uri-dynamic-registrar set on"]))
    gateway = Gateway(program, emulator, work, "learnt", [script], ["--calls", "relay", "--control", control])
    phone = Phone(gateway.port)
    try:
        kept = moved.await_request(lambda text: registering(text) and "To: <sip:trunk@" in text,
                                   "REGISTER at the registrar the 3xx named")
        check(kept.startswith("REGISTER sip:%s " % configured) and
              header(kept, "Route") == "<sip:%s:%d;lr>" % (UPSTREAM, moved.port),
              "not the configured Request-URI routed to the learnt registrar: " + kept)
        switched = moved.await_request(lambda text: registering(text) and "To: <sip:switched@" in text,
                                       "REGISTER at the registrar the 3xx named, as Request-URI")
        check(switched.startswith("REGISTER sip:%s:%d " % (UPSTREAM, moved.port)) and not header(switched, "Route"),
              "the learnt registrar is not the Request-URI: " + switched)
        deadline = time.monotonic() + WAIT_LIMIT_S
        while not re.search(r"^example\.com/trunk registered", ask_control(control, "trunks"), re.M) and \
                time.monotonic() < deadline:
            time.sleep(0.1)
        trunks = ask_control(control, "trunks")
        check(re.search(r"^example\.com/trunk registered at sip:%s:%d \(learnt\)" % (re.escape(UPSTREAM), moved.port),
                        trunks, re.M), "the learnt registrar is not shown: " + trunks)
        face = ask_control(control, "dump face example.com trunk registration-outbound")
        check(re.search(r"Proxy.*%s:%d" % (re.escape(UPSTREAM), service_proxy.port), face),
              "the Service-Route is not the face's dynamic proxy: " + face)
        # The trunk's call out goes by its Service-Route.
        text = phone.build("INVITE", "sip:4930@pstn.example", "sip:4930@pstn.example", phone.new_call_id(), 1,
                           ["Contact: <sip:trunk@127.0.0.1:%d>" % phone.port, "Content-Type: application/sdp"])
        body = "v=0\r\no=p 1 1 IN IP4 127.0.0.1\r\ns=-\r\nc=IN IP4 127.0.0.1\r\nt=0 0\r\nm=audio 4000 RTP/AVP 0\r\n"
        text = text.replace("From: <sip:phone@example.com>", "From: <sip:trunk@example.com>")
        text = text.replace("Content-Length: 0\r\n\r\n", "Content-Length: %d\r\n\r\n%s" % (len(body), body))
        status = phone.send(text).status
        while status < 200:
            data, _ = phone.socket.recvfrom(65535)
            status = int(data.decode(errors="replace").split()[1])
        invite = service_proxy.await_request(lambda text: text.startswith("INVITE "), "call out by the Service-Route")
        check(re.match(r"<sip:%s:%d;lr>" % (re.escape(UPSTREAM), service_proxy.port), header(invite, "Route") or ""),
              "the call out was not routed by the Service-Route: " + invite)
        # A change ends the registration: what it taught is forgotten, and
        # the next REGISTER goes to the configured registrar again.
        ask_control(control, "face example.com trunk registration-outbound lifetime set 301")
        moved.await_request(unregistering, "unregistration at the learnt registrar")
        redirecting.await_request(lambda text: len([each for each in redirecting.registers()
                                                    if "To: <sip:trunk@" in each]) > 1,
                                  "REGISTER at the configured registrar after the change")
        moved.await_request(lambda text: len([each for each in moved.registers()
                                              if registering(each) and "To: <sip:trunk@" in each]) > 1,
                            "REGISTER at the learnt registrar after the change")
        deadline = time.monotonic() + WAIT_LIMIT_S
        face = ask_control(control, "dump face example.com trunk registration-outbound")
        while "Proxy" in face and time.monotonic() < deadline:
            time.sleep(0.1)
            face = ask_control(control, "dump face example.com trunk registration-outbound")
        check("Proxy" not in face, "the Service-Route outlived its registration: " + face)
        gateway.stop()
    finally:
        phone.close()
        gateway.kill()
        for upstream in (service_proxy, moved, redirecting):
            upstream.stop()


def register_goes_where_the_outbound_face_says(program, work, emulator):
    forced = Upstream(answer_all(200))
    silent = Upstream(lambda request, count: None)
    registrar = Upstream(answer_all(200))
    script = base_script(work, "outbound-face", trunk_lines("forced", "carrier.invalid", [
        # A name that never resolves: the forced destination needs no DNS.
        "forced-destination set manual %s:%d" % (UPSTREAM, forced.port)]) +
        trunk_lines("boxed", "%s:%d" % (UPSTREAM, registrar.port), [
            "proxy insert 0 %s:%d loose" % (UPSTREAM, silent.port),
            "proxy insert 1 %s:%d loose" % (UPSTREAM, registrar.port),
            "penalty-box set on",
            # Far below libre's own 32 s, so that the wait shows it applied.
            "non-invite-transaction-timeout set 2",
            "retry-timeout-on-system-error set 1"]))
    gateway = Gateway(program, emulator, work, "outbound-face", [script])
    try:
        register = forced.await_request(registering, "REGISTER at the forced destination")
        check(register.startswith("REGISTER sip:carrier.invalid "), "not the registrar's Request-URI: " + register)
        silent.await_request(registering, "REGISTER through the first proxy")
        # libre's own timeout and the retry would take over 32 s.
        registrar.await_request(registering, "REGISTER through the second proxy within 20 s", limit_s=20)
        check(len(silent.registers()) == 1, "the boxed proxy was tried again: %d" % len(silent.registers()))
        gateway.stop()
    finally:
        gateway.kill()
        for upstream in (forced, silent, registrar):
            upstream.stop()


def trunks_of_one_account_are_tried_by_priority(program, work, emulator):
    # The better carrier refuses the first REGISTER and takes the second.
    better = Upstream(lambda request, count: (503, "Service Unavailable", []) if count == 0 else (200, "OK", []))
    worse = Upstream(answer_all(200))
    lines = []
    for service, upstream, priority in (("carrier-a", better, 1), ("carrier-b", worse, 2)):
        lines += ["location-service %s create" % service, "location-service %s domain insert 0 %s.example" % (service, service)]
        lines += trunk_lines("gateway-7", "%s:%d" % (UPSTREAM, upstream.port),
                             ["priority set %d" % priority, "retry-timeout-on-server-error set 3"], service)
    script = base_script(work, "priority", lines)
    gateway = Gateway(program, emulator, work, "priority", [script])
    try:
        better.await_request(registering, "REGISTER at the better trunk")
        worse.await_request(registering, "REGISTER at the worse trunk once the better failed")
        check(len(better.registers()) == 1, "the better trunk was tried again before the worse one")
        better.await_request(lambda text: len(better.registers()) > 1, "REGISTER at the better trunk again")
        worse.await_request(unregistering, "unregistration of the worse trunk once the better one recovered")
        gateway.stop()
    finally:
        gateway.kill()
        better.stop()
        worse.stop()


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: registrations.py GATEWAY WORK-DIR [EMULATOR...]")
    sys.exit(run([("back_to_back_registration_follows_the_subscribers_phone",
                   back_to_back_registration_follows_the_subscribers_phone),
                  ("dynamic_registrar_and_service_route_are_learnt_and_forgotten",
                   dynamic_registrar_and_service_route_are_learnt_and_forgotten),
                  ("register_goes_where_the_outbound_face_says", register_goes_where_the_outbound_face_says),
                  ("trunks_of_one_account_are_tried_by_priority", trunks_of_one_account_are_tried_by_priority)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
