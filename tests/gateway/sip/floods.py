#!/usr/bin/python3
"""End to end: a flood of unauthenticated REGISTERs from one source costs the
gateway no memory, and --source-rate throttles it as Kamailio's pike does.

    floods.py GATEWAY WORK-DIR [EMULATOR...]
"""

import os
import re
import sys
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Gateway, Phone, Response, check, run  # noqa: E402

SCRIPT = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "registrar", "subscribers.script")
WARM_UP = 2000
FLOOD = 10000
# Per request kept, 100 bytes would show as a megabyte here.
GROWTH_LIMIT_KIB = 1024


def challenge(phone, call_id):
    return phone.build("REGISTER", "sip:example.com", "sip:alice@example.com", call_id, 1,
                       ["Contact: <sip:alice@192.0.2.1>", "Expires: 300"])


def unauthenticated_flood_leaves_memory_flat(program, work, emulator):
    if emulator:
        # Under qemu-user the resident memory is the emulator's, whose code
        # cache grows with what it runs, not with what the gateway keeps.
        print("skipped under an emulator")
        return
    gateway = Gateway(program, emulator, work, "flood", [SCRIPT])
    try:
        phone = Phone(gateway.port)
        before = 0
        for i in range(WARM_UP + FLOOD):
            if i == WARM_UP:
                before = gateway.resident_kib()
            answer = phone.send(challenge(phone, phone.new_call_id()))
            check(answer.status == 401, "request %d answered %d" % (i, answer.status))
        growth = gateway.resident_kib() - before
        check(growth < GROWTH_LIMIT_KIB, "%d challenges grew the gateway by %d KiB" % (FLOOD, growth))
        phone.close()
        gateway.stop()
    finally:
        gateway.kill()


def source_over_its_rate_answered_once_then_dropped(program, work, emulator):
    rate = 20
    gateway = Gateway(program, emulator, work, "rate", [SCRIPT], ["--source-rate", str(rate)])
    try:
        phone = Phone(gateway.port)
        sent = 5 * rate
        for _ in range(sent):
            phone.send(challenge(phone, phone.new_call_id()), answer=False)
        answers = []
        deadline = time.monotonic() + 3
        phone.socket.settimeout(0.5)
        while time.monotonic() < deadline:
            try:
                data, _ = phone.socket.recvfrom(65535)
            except OSError:
                break
            answers.append(Response(data.decode(errors="replace")))
        codes = [answer.status for answer in answers]
        # The burst may straddle two one-second windows.
        check(rate <= codes.count(401) <= 2 * rate, "challenges answered: %r" % codes)
        refused = [answer for answer in answers if answer.status == 503]
        check(len(refused) == 1 and refused[0].all("Retry-After"), "503s: %r" % codes)
        check(len(codes) < sent, "nothing was dropped")
        phone.close()
        gateway.stop()
        lines = re.findall(r"127\.0\.0\.1 sends too many requests", gateway.errors())
        check(len(lines) == 1, "the hold was logged %d times" % len(lines))
    finally:
        gateway.kill()


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: floods.py GATEWAY WORK-DIR [EMULATOR...]")
    sys.exit(run([("unauthenticated_flood_leaves_memory_flat", unauthenticated_flood_leaves_memory_flat),
                  ("source_over_its_rate_answered_once_then_dropped",
                   source_over_its_rate_answered_once_then_dropped)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
