#!/usr/bin/python3
"""End to end: what becomes of an identity's bindings at the binding limit,
and that only the phone itself keeps its NATed binding alive.

    bindings.py GATEWAY WORK-DIR [EMULATOR...]

The phone is sipphone.Phone against protocol.script, whose subscribers
register without a password.
"""

import os
import re
import socket
import sys
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Gateway, Phone, check, run  # noqa: E402

SCRIPT = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "sip", "protocol.script")
LIMIT = 32
# Long enough for a few NAT ping intervals of a second under an emulator.
DROP_LIMIT_S = 20


def register(phone, call_id, cseq, contacts):
    to = "sip:alice@example.com"
    headers = ["Contact: " + contact for contact in contacts] + ["Expires: 3600"]
    answer = phone.send(phone.build("REGISTER", "sip:example.com", to, call_id, cseq, headers))
    check(answer.status == 200, "REGISTER answered %d" % answer.status)
    return answer


def refreshed_binding_never_gives_way_to_a_newcomer_before_it(program, work, emulator):
    gateway = Gateway(program, emulator, work, "limit", [SCRIPT])
    try:
        phone = Phone(gateway.port)
        call_id = phone.new_call_id()
        # c1 runs out first and c2 next: the stalest two.
        contacts = ["<sip:c%d@192.0.2.1:5060>;expires=%d" % (n, {1: 120, 2: 240}.get(n, 3600))
                    for n in range(1, LIMIT + 1)]
        register(phone, call_id, 1, contacts[:16])
        register(phone, call_id, 2, contacts[16:])
        answer = register(phone, call_id, 3, ["<sip:newcomer@192.0.2.1:5060>", "<sip:c1@192.0.2.1:5060>"])
        bound = answer.all("Contact")
        check(len(bound) == LIMIT, "%d bindings" % len(bound))
        check(any(value.startswith("<sip:c1@") for value in bound), "the refreshed c1 is gone")
        # Only the stalest binding the request does not name made room.
        given = re.findall(r"<(\S+)> gives way to <(\S+)>", gateway.errors())
        check(given == [("sip:c2@192.0.2.1:5060", "sip:newcomer@192.0.2.1:5060")], "gave way: %s" % given)
        phone.close()
        gateway.stop()
    finally:
        gateway.kill()


def answer_to(ping):
    """A 200 for the request ping, as its recipient would write it."""
    lines = ping.split("\r\n")
    kept = [line for line in lines[1:] if line.split(":")[0].lower() in ("via", "from", "to", "call-id", "cseq")]
    return "\r\n".join(["SIP/2.0 200 OK"] + kept + ["Content-Length: 0", "", ""])


def nat_pings_answered_from_elsewhere_do_not_keep_a_binding(program, work, emulator):
    gateway = Gateway(program, emulator, work, "pings", [SCRIPT], ["--nat-ping", "1"])
    phone = Phone(gateway.port)
    stranger = Phone(gateway.port)
    try:
        register(phone, phone.new_call_id(), 1, ["<sip:alice@10.0.0.5:5060>"])

        def pings(count, answerer):
            for _ in range(count):
                data, sender = phone.socket.recvfrom(65535)
                ping = data.decode(errors="replace")
                check(ping.startswith("OPTIONS "), "not a ping: " + ping.split("\r\n")[0])
                answerer.socket.sendto(answer_to(ping).encode(), sender)

        # The phone answering itself keeps the binding past three pings.
        pings(4, phone)
        check("NAT pings unanswered" not in gateway.errors(), "dropped though answered")
        # Answers from another address, the true Call-ID and all, do not.
        deadline = time.monotonic() + DROP_LIMIT_S
        while "dropped, 3 NAT pings unanswered" not in gateway.errors():
            check(time.monotonic() < deadline, "a stranger's answers kept the binding")
            try:
                pings(1, stranger)
            except socket.timeout:
                pass
        gateway.stop()
    finally:
        phone.close()
        stranger.close()
        gateway.kill()


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: bindings.py GATEWAY WORK-DIR [EMULATOR...]")
    sys.exit(run([("refreshed_binding_never_gives_way_to_a_newcomer_before_it",
                   refreshed_binding_never_gives_way_to_a_newcomer_before_it),
                  ("nat_pings_answered_from_elsewhere_do_not_keep_a_binding",
                   nat_pings_answered_from_elsewhere_do_not_keep_a_binding)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
