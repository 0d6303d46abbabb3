#!/usr/bin/python3
"""End to end: with --redirect-from, only the given networks learn where a
subscriber is registered, or whether one exists.

    sources.py GATEWAY WORK-DIR [EMULATOR...]
"""

import os
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Gateway, Phone, check, run  # noqa: E402

SCRIPT = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "registrar", "subscribers.script")
FILTERS = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "registrar", "filters.script")
# Without a "DEFAULT" group: a user it does not know is nobody.
PROTOCOL_SCRIPT = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "sip", "protocol.script")


def redirect_answered_to_the_given_networks_only(program, work, emulator):
    gateway = Gateway(program, emulator, work, "sources", [SCRIPT], ["--redirect-from", "127.0.0.2/32"])
    try:
        for address, expected in (("127.0.0.1", 403), ("127.0.0.2", 302)):
            phone = Phone(gateway.port, address)
            # 999 is answered by the "DEFAULT" group, whose contact is static.
            uri = "sip:999@example.com"
            answer = phone.send(phone.build("INVITE", uri, uri, phone.new_call_id(), 1))
            check(answer.status == expected, "INVITE from %s answered %d" % (address, answer.status))
            phone.close()
        gateway.stop()
    finally:
        gateway.kill()


def options_at_the_gateway_address_tell_strangers_nobody_exists(program, work, emulator):
    gateway = Gateway(program, emulator, work, "options", [PROTOCOL_SCRIPT], ["--redirect-from", "127.0.0.2/32"])
    try:
        for address in ("127.0.0.1", "127.0.0.2"):
            phone = Phone(gateway.port, address)
            answers = {}
            for user in ("alice", "nobody"):
                uri = "sip:%s@127.0.0.1:%d" % (user, gateway.port)
                answers[user] = phone.send(phone.build("OPTIONS", uri, uri, phone.new_call_id(), 1)).status
            phone.close()
            if address == "127.0.0.1":
                check(answers["alice"] == answers["nobody"], "a stranger told who exists: %s" % answers)
            else:
                # alice has no binding: the redirect server's answer.
                check(answers == {"alice": 480, "nobody": 200}, "a trusted source answered %s" % answers)
        gateway.stop()
    finally:
        gateway.kill()


def call_filter_rules_refuse_a_caller_before_any_lookup(program, work, emulator):
    gateway = Gateway(program, emulator, work, "call-filters", [SCRIPT, FILTERS])
    try:
        phone = Phone(gateway.port)
        neighbour = Phone(gateway.port, "127.0.0.2")
        # None of them has a binding: 480 is an answer from the contacts.
        cases = [(phone, "INVITE", "fred", 403), (phone, "MESSAGE", "fred", 403), (phone, "INVITE", "gina", 480),
                 (phone, "INVITE", "kate", 403), (neighbour, "INVITE", "kate", 480)]
        for sender, method, user, expected in cases:
            uri = "sip:%s@example.com" % user
            answer = sender.send(sender.build(method, uri, uri, sender.new_call_id(), 1))
            check(answer.status == expected, "%s to %s from %s answered %d" % (method, user, sender.address,
                                                                             answer.status))
        neighbour.close()
        phone.close()
        gateway.stop()
        lines = [line for line in gateway.output().splitlines() if line.endswith(" 403")]
        check(lines == ['INVITE sip:fred@example.com example.com/fred denied by rule 0 "deny 127.0.0.0 255.0.0.0" 403',
                        'MESSAGE sip:fred@example.com example.com/fred denied by rule 0 "deny 127.0.0.0 255.0.0.0" 403',
                        "INVITE sip:kate@example.com example.com/kate denied, no rule of 1 matches 403"],
              "request lines: %r" % lines)
    finally:
        gateway.kill()


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: sources.py GATEWAY WORK-DIR [EMULATOR...]")
    sys.exit(run([("redirect_answered_to_the_given_networks_only", redirect_answered_to_the_given_networks_only),
                  ("options_at_the_gateway_address_tell_strangers_nobody_exists",
                   options_at_the_gateway_address_tell_strangers_nobody_exists),
                  ("call_filter_rules_refuse_a_caller_before_any_lookup",
                   call_filter_rules_refuse_a_caller_before_any_lookup)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
