#!/usr/bin/python3
"""End to end, with the gateway relaying calls: calls to numbers outside its
domains leave through the caller's call-outbound face (a trunk's own to its
registrar), and calls from a carrier reach the subscriber they are for.

    trunk.py GATEWAY WORK-DIR [EMULATOR...]     (SIPP in the environment)

SIPp plays the carrier (carrier.xml: it challenges with 407 and logs the
credentials, which are checked here against the account's password), an
overloaded proxy (overloaded.xml), the calling phones (caller.xml) and the
subscriber (subscriber.xml, then SIPp's own uas). A proxy that never answers is a UDP socket here that
reads and keeps quiet, noting the calls it was offered. Every process is
bounded in time and stopped by its PID.
"""

import os
import re
import socket
import sys
import threading

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Gateway, Phone, Sipp, check, free_port, logged_digest_is_right, run  # noqa: E402

HERE = os.path.dirname(os.path.abspath(__file__))
CALL_LIMIT_S = 30
# How long a proxy may stay silent before the gateway tries the next one:
# far above a carrier's answer on loopback, the gateway under an emulator
# included.
INVITE_TIMEOUT_S = 3
CARRIER_ACCOUNT = ("gateway-7", "carrier.example", "s3cret")
CARRIER = "127.0.0.2"

BASE_SCRIPT = """location-service example.com create
location-service example.com domain insert 0 example.com
authentication-service carrier create
authentication-service carrier realm insert 0 carrier.example
authentication-service carrier credentials set gateway-7 s3cret
"""



def call(work, name, gateway, source, from_uri, number, domain):
    """One call from SIPp at source through the gateway, which must be
    answered and torn down."""
    caller = Sipp(work, name, os.path.join(HERE, "caller.xml"),
                  ["-i", source, "-p", str(free_port(source)), "-key", "from", from_uri, "-key", "domain", domain, "-s", number, "-m", "1",
                   "127.0.0.1:%d" % gateway.port], CALL_LIMIT_S)
    answered = caller.succeeded()
    check(answered, "call %s failed: %s" % (name, caller.errors()))


class SilentProxy(threading.Thread):
    """A proxy that reads and never answers: the Call-IDs of the INVITEs it
    was offered, retransmissions counted once."""

    def __init__(self):
        super().__init__(daemon=True)
        self.socket = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
        self.socket.bind(("127.0.0.1", 0))
        self.socket.settimeout(0.2)
        self.port = self.socket.getsockname()[1]
        self.calls = set()
        self.stopping = False

    def run(self):
        while not self.stopping:
            try:
                data = self.socket.recv(65535).decode(errors="replace")
            except socket.timeout:
                continue
            found = re.search(r"^Call-ID: *(\S+)", data, re.M | re.I)
            if data.startswith("INVITE ") and found:
                self.calls.add(found.group(1))

    def stop(self):
        self.stopping = True
        self.join(5)
        self.socket.close()


def invite(source, gateway, from_uri, uri):
    """An INVITE with an offer from a phone at source; the final status."""
    phone = Phone(gateway.port, address=source)
    try:
        body = "v=0\r\no=phone 1 1 IN IP4 %s\r\ns=-\r\nc=IN IP4 %s\r\nt=0 0\r\nm=audio 4000 RTP/AVP 0\r\n" % (
            source, source)
        text = phone.build("INVITE", uri, uri, phone.new_call_id(), 1,
                           ["Contact: <sip:phone@%s:%d>" % (source, phone.port), "Content-Type: application/sdp"])
        text = text.replace("From: <sip:phone@example.com>", "From: <%s>" % from_uri)
        text = text.replace("Content-Length: 0\r\n\r\n", "Content-Length: %d\r\n\r\n%s" % (len(body), body))
        phone.socket.settimeout(CALL_LIMIT_S)
        status = phone.send(text).status
        while status < 200:
            data, _ = phone.socket.recvfrom(65535)
            status = int(data.decode(errors="replace").split()[1])
        return status
    finally:
        phone.close()



def calls_out_through_the_callers_proxies(program, work, emulator):
    silent = SilentProxy()
    silent.start()
    carrier_port = free_port()
    tcp_carrier_port = free_port(kind=socket.SOCK_STREAM)
    overloaded_port = free_port()
    script = os.path.join(work, "outbound.script")
    with open(script, "w") as file:
        file.write(BASE_SCRIPT)
        for name, lines in [
                # The first proxy is silent: alice's calls fail over to the
                # carrier, and with the penalty box on skip the silent one.
                ("alice", ["proxy insert 0 127.0.0.1:%d loose" % silent.port,
                           "proxy insert 1 127.0.0.1:%d loose" % carrier_port,
                           "penalty-box set on",
                           "invite-transaction-timeout set %d" % INVITE_TIMEOUT_S]),
                # The forced destination wins over the silent proxy, and
                # is reached over the transport the face asks for.
                ("dave", ["proxy insert 0 127.0.0.1:%d loose" % silent.port,
                          "forced-destination set manual 127.0.0.1:%d" % tcp_carrier_port,
                          "preferred-protocol set forced-tcp",
                          "invite-transaction-timeout set %d" % INVITE_TIMEOUT_S]),
                # An overloaded proxy's 503 moves on too.
                ("frank", ["proxy insert 0 127.0.0.1:%d loose" % overloaded_port,
                           "proxy insert 1 127.0.0.1:%d loose" % carrier_port]),
                # No credentials for the carrier.
                ("carol", ["proxy insert 0 127.0.0.1:%d loose" % carrier_port]),
                # Every proxy boxed: tried all the same.
                ("erin", ["proxy insert 0 127.0.0.1:%d loose" % silent.port,
                          "penalty-box set on",
                          "invite-transaction-timeout set %d" % INVITE_TIMEOUT_S])]:
            # Callers the configuration lets call without credentials (they
            # could register without): what is checked here is the way out.
            file.write("identity example.com %s create identity\n" % name)
            file.write("identity example.com %s face registration-inbound create\n" % name)
            file.write("identity example.com %s face call-outbound create\n" % name)
            for line in lines:
                file.write("face example.com %s call-outbound %s\n" % (name, line))
            if name in ("alice", "dave", "frank"):
                file.write("identity example.com %s face authentication-outbound create\n" % name)
                file.write("face example.com %s authentication-outbound authenticate insert 0 carrier gateway-7\n"
                           % name)
    carrier = Sipp(work, "outbound-carrier", os.path.join(HERE, "carrier.xml"),
                   ["-i", "127.0.0.1", "-p", str(carrier_port), "-m", "4"])
    tcp_carrier = Sipp(work, "outbound-tcp-carrier", os.path.join(HERE, "carrier.xml"),
                       ["-t", "t1", "-i", "127.0.0.1", "-p", str(tcp_carrier_port), "-m", "1"])
    overloaded = Sipp(work, "outbound-overloaded", os.path.join(HERE, "overloaded.xml"),
                      ["-i", "127.0.0.1", "-p", str(overloaded_port), "-m", "1"])
    gateway = Gateway(program, emulator, work, "outbound", [script], ["--calls", "relay"])
    try:
        check(invite("127.0.0.1", gateway, "sip:mallory@elsewhere.example", "sip:4930123@pstn.example") == 403,
              "a caller who is no identity was not refused")
        call(work, "outbound-alice-1", gateway, "127.0.0.1", "alice@example.com", "4930123", "pstn.example")
        check(len(silent.calls) == 1, "the first proxy was offered %d calls, not 1" % len(silent.calls))
        call(work, "outbound-alice-2", gateway, "127.0.0.1", "alice@example.com", "4930124", "pstn.example")
        check(len(silent.calls) == 1, "the penalty box did not keep the silent proxy out")
        call(work, "outbound-dave", gateway, "127.0.0.1", "dave@example.com", "4930125", "pstn.example")
        check(len(silent.calls) == 1, "the forced destination did not replace the proxies")
        check(tcp_carrier.succeeded(), "the call over TCP failed at the carrier: " + tcp_carrier.errors())
        call(work, "outbound-frank", gateway, "127.0.0.1", "frank@example.com", "4930128", "pstn.example")
        check(overloaded.succeeded(), "the overloaded proxy was not tried first: " + overloaded.errors())
        # The carrier waits for a second INVITE that does not come.
        check(invite("127.0.0.1", gateway, "sip:carol@example.com", "sip:4930126@pstn.example") == 403,
              "the challenge the gateway had no credentials for was not the call's end as 403")
        for attempt in (1, 2):
            check(invite("127.0.0.1", gateway, "sip:erin@example.com", "sip:4930127@pstn.example") == 408,
                  "a call through a silent proxy did not time out")
        check(len(silent.calls) == 3, "a boxed proxy was skipped when no other was left")
        credentials = carrier.logged()
        credentials += tcp_carrier.logged()
        check(len(credentials) == 4 and
              all(logged_digest_is_right(line, "INVITE", CARRIER_ACCOUNT) for line in credentials),
              "the carrier did not get the account's credentials: %s" % credentials)
        check(re.search(r"^INVITE sip:4930123@pstn\.example example\.com/alice 200$", gateway.output(), re.M),
              "no request line for alice's call: " + gateway.output())
        gateway.stop()
    finally:
        gateway.kill()
        carrier.kill()
        tcp_carrier.kill()
        overloaded.kill()
        silent.stop()


def trunk_calls_come_in_unchallenged_and_go_out_to_its_registrar(program, work, emulator):
    silent = SilentProxy()
    silent.start()
    registrar_port = free_port(CARRIER)
    bob_port = free_port()
    script = os.path.join(work, "inbound.script")
    with open(script, "w") as file:
        file.write(BASE_SCRIPT)
        file.write("identity example.com trunk create identity\n"
                   "identity example.com trunk face registration-outbound create\n"
                   "face example.com trunk registration-outbound registrar set %s:%d\n"
                   "face example.com trunk registration-outbound lifetime set 300\n"
                   "face example.com trunk registration-outbound retry-timeout-on-system-error set 1\n"
                   # The trunk's own calls go to its registrar, not its proxy.
                   "identity example.com trunk face registration-inbound create\n"
                   "identity example.com trunk face call-outbound create\n"
                   "face example.com trunk call-outbound proxy insert 0 127.0.0.1:%d loose\n"
                   "face example.com trunk call-outbound forced-destination set registrar-address\n"
                   "face example.com trunk call-outbound invite-transaction-timeout set %d\n"
                   "identity example.com trunk face authentication-outbound create\n"
                   "face example.com trunk authentication-outbound authenticate insert 0 carrier gateway-7\n"
                   "identity example.com bob create identity\n"
                   "identity example.com bob face registration-inbound create\n"
                   # A subscriber whose calls out would reach the silent proxy.
                   "identity example.com alice create identity\n"
                   "identity example.com alice face registration-inbound create\n"
                   "identity example.com alice face call-outbound create\n"
                   "face example.com alice call-outbound proxy insert 0 127.0.0.1:%d loose\n"
                   "face example.com alice call-outbound invite-transaction-timeout set %d\n"
                   % (CARRIER, registrar_port, silent.port, INVITE_TIMEOUT_S, silent.port, INVITE_TIMEOUT_S))
    registrar = Sipp(work, "inbound-registrar", os.path.join(HERE, "registrar.xml"),
                     ["-i", CARRIER, "-p", str(registrar_port), "-m", "1"])
    gateway = Gateway(program, emulator, work, "inbound", [script], ["--calls", "relay"])
    bob = None
    carrier = None
    try:
        check(registrar.succeeded(), "the trunk did not register: " + registrar.errors() + gateway.errors())
        subscriber = Sipp(work, "inbound-subscriber", os.path.join(HERE, "subscriber.xml"),
                          ["-i", "127.0.0.1", "-p", str(bob_port), "-s", "bob", "-m", "1",
                           "127.0.0.1:%d" % gateway.port], CALL_LIMIT_S)
        check(subscriber.succeeded(), "bob did not register: " + subscriber.errors())
        bob = Sipp(work, "inbound-bob", "uas", ["-i", "127.0.0.1", "-p", str(bob_port), "-m", "1"])
        # SIPp's caller fails on a 407: the carrier is not challenged.
        call(work, "inbound-carrier", gateway, CARRIER, "4930555@carrier.example", "bob", "example.com")
        check(bob.succeeded(), "bob's phone did not take the call: " + bob.errors())
        # A carrier's call is its trunk's, whatever its From says: it never
        # leaves through a subscriber's proxies.
        check(invite(CARRIER, gateway, "sip:alice@example.com", "sip:4930999@pstn.example") == 404,
              "a carrier's call to a number outside was not refused as not found")
        check(not silent.calls, "a carrier's call went back out")
        carrier = Sipp(work, "inbound-registrar-calls", os.path.join(HERE, "carrier.xml"),
                       ["-i", CARRIER, "-p", str(registrar_port), "-m", "1"])
        call(work, "inbound-trunk-out", gateway, "127.0.0.1", "trunk@example.com", "4930777", "pstn.example")
        check(carrier.succeeded(), "the trunk's call did not reach its registrar: " + carrier.errors())
        check(all(logged_digest_is_right(line, "INVITE", CARRIER_ACCOUNT) for line in carrier.logged()),
              "the trunk's credentials were wrong")
        check(not silent.calls, "the trunk's call went to its proxy, not its registrar")
        gateway.stop()
    finally:
        gateway.kill()
        registrar.kill()
        for process in (bob, carrier):
            if process:
                process.kill()
        silent.stop()


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: trunk.py GATEWAY WORK-DIR [EMULATOR...]")
    sys.exit(run([("calls_out_through_the_callers_proxies", calls_out_through_the_callers_proxies),
                  ("trunk_calls_come_in_unchallenged_and_go_out_to_its_registrar",
                   trunk_calls_come_in_unchallenged_and_go_out_to_its_registrar)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
