#!/usr/bin/python3
"""The registration storm over TLS beside UDP, at one fixed rate, with the
same client for both, so that the gateway's CPU per request can be set side
by side. Debian's SIPp has no TLS, and run.sh's SIPp figures over UDP come
from another client; this one is the scripted phone of the gateway's tests.

    tls-storm.py GATEWAY DIRECTORY COUNT RATE CONNECTIONS

DIRECTORY holds generate.sh's subscribers.script for at least 2 x COUNT
users. Users 1..COUNT register over UDP (each REGISTER, 401, REGISTER with
a SHA-256 digest, 200), then users COUNT+1..2 x COUNT over TLS, spread over
CONNECTIONS connections opened before the phase (their handshakes are not
counted), both at RATE registrations a second. Prints the
rate achieved and the gateway's CPU (user and system, from /proc) per
request of each phase.
"""

import os
import re
import subprocess
import sys
import tempfile
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "..", "tests", "gateway"))
from sipphone import Gateway, Phone, StreamPhone, authorization, check  # noqa: E402

TICKS = os.sysconf("SC_CLK_TCK")


def cpu_ticks(pid):
    with open("/proc/%d/stat" % pid) as stat:
        fields = stat.read().rsplit(")", 1)[1].split()
    return int(fields[11]) + int(fields[12])


def register(phone, number):
    user = "user%06d" % number
    to = "sip:%s@example.com" % user
    call_id = phone.new_call_id()
    contact = ["Contact: <sip:%s@192.0.2.1:5060>" % user, "Expires: 3600"]
    first = phone.send(phone.build("REGISTER", "sip:example.com", to, call_id, 1, contact))
    check(first.status == 401, "%s: %d" % (user, first.status))
    auth = authorization(first.challenges()[0], "REGISTER", "sip:example.com", user, "pw%06d" % number)
    second = phone.send(phone.build("REGISTER", "sip:example.com", to, call_id, 2, contact + [auth]))
    check(second.status == 200, "%s: %d" % (user, second.status))


def storm(gateway, phones, first, count, rate):
    before = cpu_ticks(gateway.process.pid)
    start = time.monotonic()
    for i in range(count):
        delay = start + i / rate - time.monotonic()
        if delay > 0:
            time.sleep(delay)
        register(phones[i % len(phones)], first + i)
    elapsed = time.monotonic() - start
    ticks = cpu_ticks(gateway.process.pid) - before
    return count / elapsed, 1e6 * ticks / TICKS / (2 * count)


def main():
    if len(sys.argv) != 6:
        sys.exit("usage: tls-storm.py GATEWAY DIRECTORY COUNT RATE CONNECTIONS")
    program, directory = sys.argv[1], sys.argv[2]
    count, rate, connections = int(sys.argv[3]), float(sys.argv[4]), int(sys.argv[5])
    work = tempfile.mkdtemp(prefix="tls-storm-")
    certificate, key = os.path.join(work, "gateway.pem"), os.path.join(work, "gateway.key")
    subprocess.run(["openssl", "req", "-x509", "-newkey", "rsa:2048", "-nodes", "-keyout", key, "-out", certificate,
                    "-days", "1", "-subj", "/CN=localhost", "-addext", "subjectAltName=DNS:localhost"],
                   check=True, capture_output=True, timeout=60)
    gateway = Gateway(program, [], work, "storm", [os.path.join(directory, "subscribers.script")],
                      ["--tls", "127.0.0.1:0", "--certificate", certificate, "--key", key])
    try:
        port = int(re.search(r"listening on tls:127\.0\.0\.1:(\d+)", gateway.errors()).group(1))
        udp = [Phone(gateway.port)]
        achieved, udp_us = storm(gateway, udp, 1, count, rate)
        print("UDP: %d registrations at %.0f/s, %.1f µs CPU per request" % (count, achieved, udp_us))
        tls = [StreamPhone(port, "tls", certificate) for _ in range(connections)]
        achieved, tls_us = storm(gateway, tls, count + 1, count, rate)
        print("TLS: %d registrations at %.0f/s over %d connections, %.1f µs CPU per request (%.2fx UDP)"
              % (count, achieved, connections, tls_us, tls_us / udp_us))
        for phone in udp + tls:
            phone.close()
        gateway.stop()
    finally:
        gateway.kill()


if __name__ == "__main__":
    main()
