#!/usr/bin/python3
"""End to end: calls relayed through the gateway between SIPp phones.

    relay.py GATEWAY WORK-DIR [EMULATOR...]

Each subscriber's phone registers with one SIPp run and is then played on
the same port by another; callers come from outside the served domain.
"""

import os
import socket
import subprocess
import sys
import time
import urllib.request

HERE = os.path.dirname(os.path.abspath(__file__))
sys.path.insert(0, os.path.join(HERE, ".."))
from sipphone import Gateway, ask_control, await_bound, check, free_port, run  # noqa: E402

SCRIPT = os.path.join(HERE, "calls.script")
SIPP = os.environ.get("SIPP", "sipp")
# Bounds for one SIPp phone; a call here takes a second or two.
PHONE_LIMIT_S = 60


def sipp(work, scenario, port, arguments=(), contact=None):
    """A SIPp phone playing scenario on port, started in the background; its
    Contact names port contact (its own by default)."""
    log = open(os.path.join(work, "%s-%d.sipp.log" % (scenario, port)), "wb")
    process = subprocess.Popen(
        ["timeout", str(PHONE_LIMIT_S), SIPP, "-sf", os.path.join(HERE, scenario + ".xml"), "-i", "127.0.0.1",
         "-p", str(port), "-m", "1", "-nostdin", "-trace_err", "-timeout", "%ds" % (PHONE_LIMIT_S - 5),
         "-timeout_error", "-key", "contact", str(contact or port)] + list(arguments),
        stdout=log, stderr=subprocess.STDOUT, cwd=work)
    log.close()
    return process


def finished(process, what):
    check(process.wait(PHONE_LIMIT_S) == 0, "%s: SIPp exit status %d" % (what, process.returncode))


def register(work, gateway, user, q="1", contact=None):
    """A port whose phone is registered as user, nobody playing it yet."""
    port = free_port()
    finished(sipp(work, "register", port, ["-s", user, "-key", "q", q, "127.0.0.1:%d" % gateway.port], contact),
             "registering " + user)
    return port


def phone(work, user, scenario, port, arguments=(), contact=None):
    process = sipp(work, scenario, port, arguments, contact)
    # A call to the phone before SIPp holds its port would fail at once.
    await_bound(process, port, PHONE_LIMIT_S / 2)
    return process


def call(work, gateway, user, scenario="call"):
    return sipp(work, scenario, free_port(), ["-s", user, "127.0.0.1:%d" % gateway.port])


def final_answer(gateway, user, socket_=None, caller="caller@outside.example"):
    """What a bare INVITE to user gets at last, from a socket of its own."""
    sock = socket_ or socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
    if not socket_:
        sock.bind(("127.0.0.1", 0))
    sock.settimeout(PHONE_LIMIT_S / 2)
    address, port = sock.getsockname()
    body = "v=0\r\no=caller 1 1 IN IP4 127.0.0.1\r\ns=caller\r\nc=IN IP4 127.0.0.1\r\nt=0 0\r\nm=audio 6000 RTP/AVP 0\r\n"
    request = "\r\n".join([
        "INVITE sip:%s@127.0.0.1:%d SIP/2.0" % (user, gateway.port),
        "Via: SIP/2.0/UDP %s:%d;branch=z9hG4bK-%s-%d" % (address, port, user, port),
        "From: <sip:%s>;tag=%d" % (caller, port),
        "To: <sip:%s@127.0.0.1:%d>" % (user, gateway.port),
        "Call-ID: %s-%d@outside.example" % (user, port),
        "CSeq: 1 INVITE",
        "Contact: <sip:caller@%s:%d>" % (address, port),
        "Max-Forwards: 70",
        "Content-Type: application/sdp",
        "Content-Length: %d" % len(body), "", body])
    sock.sendto(request.encode(), ("127.0.0.1", gateway.port))
    while True:
        text = sock.recvfrom(65535)[0].decode(errors="replace")
        status = int(text.split(" ", 2)[1])
        if status >= 200:
            return status, text, request


def ringing_logged(work):
    """Whether a ring phone traced with -trace_msg has sent its 180."""
    for name in os.listdir(work):
        if name.startswith("ring_") and name.endswith("_messages.log"):
            with open(os.path.join(work, name), errors="replace") as log:
                if "SIP/2.0 180 Ringing" in log.read():
                    return True
    return False


def logged(gateway, line):
    deadline = time.monotonic() + 10
    while time.monotonic() < deadline:
        if line in gateway.output():
            return True
        time.sleep(0.2)
    return False


def held_resumed_and_hung_up(program, work, emulator):
    gateway = Gateway(program, emulator, work, "relay", [SCRIPT], ["--calls", "relay"])
    try:
        callee = phone(work, "u3", "answer", register(work, gateway, "u3"))
        finished(call(work, gateway, "u3"), "caller")
        finished(callee, "callee")
        check(logged(gateway, "INVITE sip:u3@127.0.0.1:%d example.com/u3 inbound-profiles voip=wideband sip=trunking 200"
                     % gateway.port), "no 200 with u3's profiles in the request log")
        # A phone behind NAT names a port nobody listens on: every request
        # of the call (the ACK, the hold, the BYE) must take the way its
        # REGISTER came.
        unreachable = free_port()
        callee = phone(work, "u6", "answer", register(work, gateway, "u6", contact=unreachable),
                       contact=unreachable)
        finished(call(work, gateway, "u6"), "caller of a phone behind NAT")
        finished(callee, "phone behind NAT")
        gateway.stop()
    finally:
        gateway.kill()


def cancelled_while_ringing(program, work, emulator):
    gateway = Gateway(program, emulator, work, "cancel", [SCRIPT], ["--calls", "relay"])
    try:
        callee = phone(work, "u3", "ring", register(work, gateway, "u3"))
        finished(call(work, gateway, "u3", "cancel"), "caller")
        finished(callee, "callee")
        check(logged(gateway, " 487"), "no 487 in the request log")
        # Nobody answers: the caller's face gives up after 2 s, the phone
        # is told.
        callee = phone(work, "u3", "ring", register(work, gateway, "u3"))
        started = time.monotonic()
        status, _, _ = final_answer(gateway, "u3", caller="desk@127.0.0.1")
        check(status == 408 and time.monotonic() - started < PHONE_LIMIT_S / 2, "unanswered: %d" % status)
        finished(callee, "unanswered callee")
        gateway.stop()
    finally:
        gateway.kill()


def forked_by_q(program, work, emulator):
    gateway = Gateway(program, emulator, work, "fork", [SCRIPT], ["--calls", "relay"])
    try:
        # Equal q ring together: the first answer wins, the other is cancelled.
        answering = phone(work, "u4", "answer", register(work, gateway, "u4"))
        ringing = phone(work, "u4", "ring", register(work, gateway, "u4"))
        finished(call(work, gateway, "u4"), "caller of u4")
        finished(answering, "u4's answering phone")
        finished(ringing, "u4's ringing phone")
        # A lower q rings only once the higher failed, and no lower still.
        busy = phone(work, "u5", "busy", register(work, gateway, "u5", "1"))
        answering = phone(work, "u5", "answer", register(work, gateway, "u5", "0.5"))
        last = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
        last.bind(("127.0.0.1", register(work, gateway, "u5", "0.1")))
        finished(call(work, gateway, "u5"), "caller of u5")
        finished(busy, "u5's busy phone")
        finished(answering, "u5's answering phone")
        last.settimeout(1)
        try:
            check(False, "the lowest q rang too: %r" % last.recvfrom(65535)[0][:40])
        except socket.timeout:
            pass
        last.close()
        gateway.stop()
    finally:
        gateway.kill()


def refused_calls(program, work, emulator):
    port = free_port()
    # A static contact naming the gateway itself.
    script = os.path.join(work, "loop.script")
    with open(script, "w") as target:
        target.write("identity example.com loop create identity DEFAULT\n"
                     "identity example.com loop face registration-inbound create\n"
                     "face example.com loop registration-inbound contact add <sip:loop@127.0.0.1:%d> \"\" \"\" 0\n"
                     % port)
    control = os.path.join(work, "refused.sock")
    metrics = free_port()
    gateway = Gateway(program, emulator, work, "refused", [SCRIPT, script],
                      ["--calls", "relay", "--max-calls", "1", "--listen", "127.0.0.1:%d" % port,
                       "--control", control, "--metrics", "127.0.0.1:%d" % metrics])
    try:
        busy = phone(work, "u3", "busy", register(work, gateway, "u3"))
        status, _, _ = final_answer(gateway, "u3")
        check(status == 486, "busy phone: %d" % status)
        finished(busy, "busy phone")
        for user, expected in (("u6", 480), ("u7", 403), ("loop", 482)):
            status, _, _ = final_answer(gateway, user)
            check(status == expected, "%s: %d, not %d" % (user, status, expected))
        check(logged(gateway, "example.com/u7 denied by rule 0"), "no rule in the request log")
        # One call rings; the next is turned away until it ends.
        for name in os.listdir(work):
            if name.startswith("ring_") and name.endswith("_messages.log"):
                os.remove(os.path.join(work, name))
        ringing = phone(work, "u3", "ring", register(work, gateway, "u3"), ["-trace_msg"])
        first = call(work, gateway, "u3", "cancel")
        deadline = time.monotonic() + PHONE_LIMIT_S / 2
        while time.monotonic() < deadline and not ringing_logged(work):
            time.sleep(0.2)
        status, answer, _ = final_answer(gateway, "u6")
        check(status == 503 and "Retry-After: " in answer, "beyond --max-calls: %d" % status)
        listed = ask_control(control, "calls")
        check("<sip:caller@outside.example> -> sip:u3@" in listed or "caller@outside.example -> sip:u3@" in listed,
              "the call in progress: %r" % listed)
        check(" early" in listed, "the ringing call's state: %r" % listed)
        finished(first, "first caller")
        finished(ringing, "ringing phone")
        deadline = time.monotonic() + 10
        while ask_control(control, "calls") != "no calls\n" and time.monotonic() < deadline:
            time.sleep(0.2)
        check(ask_control(control, "calls") == "no calls\n", "a call left over")
        exposition = urllib.request.urlopen("http://127.0.0.1:%d/metrics" % metrics, timeout=10).read().decode()
        for sample in ('location_gateway_calls_active 0', 'location_gateway_calls_failed_total{code="486"} 1',
                       'location_gateway_calls_failed_total{code="487"} 1',
                       'location_gateway_call_setup_seconds_count 0'):
            check(sample + "\n" in exposition, "metrics lack %r" % sample)
        gateway.stop()
    finally:
        gateway.kill()


if __name__ == "__main__":
    sys.exit(run([(case.__name__, case) for case in (held_resumed_and_hung_up, cancelled_while_ringing, forked_by_q,
                                                     refused_calls)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
