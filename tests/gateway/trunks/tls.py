#!/usr/bin/python3
"""End to end: a trunk whose face names a TLS registrar registers over TLS,
and only with a carrier whose certificate verifies; a refused certificate
fails the registration with the reason on standard error.

    tls.py GATEWAY WORK-DIR [EMULATOR...]

The carrier's registrar is a few lines of Python's ssl module answering 200
(Debian's SIPp has no TLS); its certificate, and the CA that signs it, are
made here with the openssl command.
"""

import os
import re
import socket
import ssl
import subprocess
import sys
import tempfile
import threading
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Gateway, check, run  # noqa: E402

HERE = os.path.dirname(os.path.abspath(__file__))
WAIT_S = 20


def openssl(*arguments):
    subprocess.run(["openssl"] + list(arguments), check=True, capture_output=True, timeout=60)


def make_ca(directory):
    ca_key, ca = os.path.join(directory, "ca.key"), os.path.join(directory, "ca.pem")
    openssl("req", "-x509", "-newkey", "rsa:2048", "-nodes", "-keyout", ca_key, "-out", ca, "-days", "1",
            "-subj", "/CN=Test Carrier CA")
    return ca, ca_key


def make_carrier_certificate(directory, ca, ca_key, address):
    """The carrier's certificate for address, signed by the CA."""
    key, request = os.path.join(directory, address + ".key"), os.path.join(directory, address + ".csr")
    certificate, extensions = os.path.join(directory, address + ".pem"), os.path.join(directory, address + ".cnf")
    openssl("req", "-newkey", "rsa:2048", "-nodes", "-keyout", key, "-out", request, "-subj", "/CN=carrier")
    with open(extensions, "w") as file:
        file.write("subjectAltName=IP:%s\n" % address)
    openssl("x509", "-req", "-in", request, "-CA", ca, "-CAkey", ca_key, "-CAcreateserial", "-out", certificate,
            "-days", "1", "-extfile", extensions)
    return certificate, key


class Carrier(threading.Thread):
    """Answers every REGISTER on its TLS port with 200 until stopped."""

    def __init__(self, certificate, key):
        super().__init__(daemon=True)
        self.context = ssl.SSLContext(ssl.PROTOCOL_TLS_SERVER)
        self.context.load_cert_chain(certificate, key)
        self.listener = socket.socket()
        self.listener.bind(("127.0.0.1", 0))
        self.listener.listen(4)
        self.listener.settimeout(0.2)
        self.port = self.listener.getsockname()[1]
        self.stopping = False
        self.registered = 0

    def run(self):
        while not self.stopping:
            try:
                connection, _ = self.listener.accept()
            except socket.timeout:
                continue
            try:
                with self.context.wrap_socket(connection, server_side=True) as tls:
                    tls.settimeout(5)
                    self.serve(tls)
            except (ssl.SSLError, OSError):
                pass  # the gateway refused the certificate, or left

    def serve(self, tls):
        buffer = b""
        while not self.stopping:
            data = tls.recv(65535)
            if not data:
                return
            buffer += data
            while b"\r\n\r\n" in buffer:
                head, _, buffer = buffer.partition(b"\r\n\r\n")
                lines = head.decode().split("\r\n")
                if not lines[0].startswith("REGISTER"):
                    continue
                keep = [line for line in lines[1:]
                        if line.split(":")[0].strip().lower() in ("via", "from", "call-id", "cseq", "contact")]
                to = [line + ";tag=carrier" for line in lines[1:] if line.lower().startswith("to:")]
                tls.sendall(("SIP/2.0 200 OK\r\n" + "\r\n".join(keep + to) +
                             "\r\nExpires: 300\r\nContent-Length: 0\r\n\r\n").encode())
                self.registered += 1

    def stop(self):
        self.stopping = True
        self.join(5)
        self.listener.close()


def await_line(gateway, pattern):
    deadline = time.monotonic() + WAIT_S
    while time.monotonic() < deadline:
        if re.search(pattern, gateway.errors()):
            return True
        time.sleep(0.1)
    return False


def trunk_registers_over_tls_with_a_verified_carrier_only(program, work, emulator):
    directory = tempfile.mkdtemp(dir=work)
    ca, ca_key = make_ca(directory)
    certificate, key = make_carrier_certificate(directory, ca, ca_key, "127.0.0.1")
    carrier = Carrier(certificate, key)
    carrier.start()
    # The same CA's certificate for another address, on a second port.
    other = Carrier(*make_carrier_certificate(directory, ca, ca_key, "127.0.0.2"))
    other.start()
    script = os.path.join(directory, "trunk.script")
    with open(script, "w") as file:
        file.write("location-service example.com create\n"
                   "location-service example.com domain insert 0 example.com\n"
                   "identity example.com trunk create identity\n"
                   "identity example.com trunk face registration-outbound create\n"
                   "face example.com trunk registration-outbound registrar set 127.0.0.1:9 127.0.0.1:%d\n"
                   "face example.com trunk registration-outbound lifetime set 300\n"
                   "face example.com trunk registration-outbound retry-timeout-on-system-error set 60\n"
                   % carrier.port)
    try:
        trusted = Gateway(program, emulator, work, "tls-trusted", [script], ["--ca-file", ca])
        try:
            check(await_line(trusted, r"trunk example.com/trunk registered at tls:127\.0\.0\.1:%d" % carrier.port),
                  "the trunk did not register over TLS: " + trusted.errors())
            trusted.stop()
        finally:
            trusted.kill()
        # The system's store does not know the test CA.
        misnamed = os.path.join(directory, "misnamed.script")
        with open(script) as original, open(misnamed, "w") as file:
            file.write(original.read().replace("127.0.0.1:%d" % carrier.port, "127.0.0.1:%d" % other.port))
        wrong = Gateway(program, emulator, work, "tls-misnamed", [misnamed], ["--ca-file", ca])
        try:
            check(await_line(wrong, r"TLS certificate .*refused: it names none of the TLS trunks. hosts"),
                  "a certificate for another address was not refused: " + wrong.errors())
            check("registered at" not in wrong.errors(), "registered with a certificate for another address")
            wrong.stop()
        finally:
            wrong.kill()
        untrusted = Gateway(program, emulator, work, "tls-untrusted", [script])
        try:
            check(await_line(untrusted, r"TLS certificate .*CN ?= ?carrier refused: unable to get local issuer"),
                  "no reason for the refused certificate: " + untrusted.errors())
            check(await_line(untrusted, r"trunk example.com/trunk failed to register"),
                  "the registration did not fail: " + untrusted.errors())
            check("registered at" not in untrusted.errors(), "registered with an unverified carrier")
            untrusted.stop()
        finally:
            untrusted.kill()
    finally:
        carrier.stop()
        other.stop()


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: tls.py GATEWAY WORK-DIR [EMULATOR...]")
    sys.exit(run([("trunk_registers_over_tls_with_a_verified_carrier_only",
                   trunk_registers_over_tls_with_a_verified_carrier_only)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
