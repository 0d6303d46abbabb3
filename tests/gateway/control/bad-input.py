"""Feeds a gateway's control socket what no client should send, then checks
that it still answers, on the socket and, through ask(), on SIP.

    bad-input.py SOCKET

Random bytes, an unterminated quote, a 1 MiB line and a client that
vanishes mid-line: each must be refused (a failed answer) or ignored, the
vanished half line must change nothing, and a well-formed line on a fresh
connection must still get its answer.
"""
import os
import random
import socket
import sys

TERMINATOR_OK = b"\0ok\n"
TERMINATOR_FAILED = b"\0failed\n"


def connect(path):
    client = socket.socket(socket.AF_UNIX, socket.SOCK_STREAM)
    client.settimeout(20)
    client.connect(path)
    return client


def answer(client):
    """One answer: (printed, ok)."""
    data = b""
    while True:
        for terminator, ok in ((TERMINATOR_OK, True), (TERMINATOR_FAILED, False)):
            at = data.find(terminator)
            if at == 0 or (at > 0 and data[at - 1 : at] == b"\n"):
                return data[:at], ok
        chunk = client.recv(65536)
        if not chunk:
            sys.exit(f"connection closed before an answer; got {data[:200]!r}")
        data += chunk


def ask(client, line):
    client.sendall(line + b"\n")
    return answer(client)


def expect(condition, what):
    if not condition:
        sys.exit(f"FAIL: {what}")


def main():
    path = sys.argv[1]
    rng = random.Random(28)

    # Random bytes, line feeds among them: every line is answered and none
    # is applied; NUL bytes are refused before they run.
    client = connect(path)
    garbage = bytes(rng.randrange(256) for _ in range(4096)).replace(b"\n", b"") + b"\0x"
    printed, ok = ask(client, garbage)
    expect(not ok, "a line of random bytes was applied")
    for _ in range(20):
        line = bytes(rng.randrange(1, 256) for _ in range(rng.randrange(1, 200))).replace(b"\n", b"")
        printed, ok = ask(client, line)
        expect(not ok or printed == b"", f"random line {line!r} printed {printed!r} and succeeded")

    printed, ok = ask(client, b'echo "unterminated')
    expect(not ok and b"control:22:6: unterminated quote" in printed, f"unterminated quote: {printed!r}")

    # A 1 MiB line is refused whole, and the next line is answered as usual.
    client.sendall(b"echo " + b"x" * (1 << 20) + b"\n")
    printed, ok = answer(client)
    expect(not ok and b"longer than" in printed, f"1 MiB line: {printed!r}")
    printed, ok = ask(client, b"echo still here")
    expect(ok and printed == b"still here\n", f"after the long line: {printed!r}")
    client.close()

    # A client that vanishes mid-line: the half line never runs.
    client = connect(path)
    client.sendall(b"identity example.com mallory create identity subscribers")
    client.close()

    client = connect(path)
    printed, ok = ask(client, b"dump identity example.com mallory")
    expect(not ok and b'no identity "mallory"' in printed, f"the vanished half line ran: {printed!r}")
    printed, ok = ask(client, b"resolve sip:alice@example.com")
    expect(ok and printed == b"identity example.com/alice\n", f"resolve after bad input: {printed!r}")
    client.close()


main()
