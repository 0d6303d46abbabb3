#!/usr/bin/python3
"""A phone for the store scenarios where SIPp falls short: a registration
over TCP with an outbound flow (+sip.instance and reg-id), a Call-ID that
holds bytes which are not UTF-8, and a query whose answer lists the
bindings the gateway holds.

    phone.py PORT TRANSPORT USER PASSWORD [EXPIRES CONTACT [CALL-ID]]

TRANSPORT is udp or tcp; without EXPIRES and CONTACT the REGISTER is a
query. A \\xNN in CALL-ID is sent as that byte. Prints the final answer's
status, then its Contact values one a line; exit status 1 when no answer.
"""

import os
import re
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Failure, Phone, Response, StreamPhone, authorization  # noqa: E402


def raw(text):
    """text with each \\xNN turned into the byte NN, for encoding with
    surrogateescape."""
    return re.sub(r"\\x([0-9a-fA-F]{2})", lambda found: chr(0xdc00 + int(found.group(1), 16)), text)


class RawPhone(Phone):
    def send(self, text, answer=True):
        self.socket.sendto(text.encode("utf-8", "surrogateescape"), self.target)
        if not answer:
            return None
        data, _ = self.socket.recvfrom(65535)
        return Response(data.decode(errors="replace"))


def main(arguments):
    port, transport, user, password = int(arguments[0]), arguments[1], arguments[2], arguments[3]
    phone = StreamPhone(port, "tcp") if transport == "tcp" else RawPhone(port)
    headers = []
    call_id = phone.new_call_id()
    if len(arguments) >= 6:
        contact = arguments[5].replace("PORT", str(phone.port))
        headers = ["Contact: " + contact, "Expires: " + arguments[4]]
    if len(arguments) >= 7:
        call_id = raw(arguments[6])
    uri = "sip:example.com"
    to = "sip:%s@example.com" % user
    first = phone.send(phone.build("REGISTER", uri, to, call_id, 1, headers))
    answer = first
    if first.status == 401:
        auth = authorization(first.challenges()[0], "REGISTER", uri, user, password)
        answer = phone.send(phone.build("REGISTER", uri, to, call_id, 2, headers + [auth]))
    print(answer.status)
    for value in answer.all("Contact"):
        print(value)
    phone.close()
    return 0


if __name__ == "__main__":
    try:
        sys.exit(main(sys.argv[1:]))
    except (Failure, OSError) as error:
        print("no answer: %s" % error, file=sys.stderr)
        sys.exit(1)
