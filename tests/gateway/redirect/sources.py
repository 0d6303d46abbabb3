#!/usr/bin/python3
"""End to end: with --redirect-from, only the given networks learn where a
subscriber is registered.

    sources.py GATEWAY WORK-DIR [EMULATOR...]
"""

import os
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Gateway, Phone, check, run  # noqa: E402

SCRIPT = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "registrar", "subscribers.script")


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


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: sources.py GATEWAY WORK-DIR [EMULATOR...]")
    sys.exit(run([("redirect_answered_to_the_given_networks_only", redirect_answered_to_the_given_networks_only)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
