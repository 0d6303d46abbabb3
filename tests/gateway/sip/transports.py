#!/usr/bin/python3
"""End to end: phones register over TLS, secure WebSocket and WebSocket with
digest and are then found like any other; a sips: URI over a plain
transport is refused.

    transports.py GATEWAY WORK-DIR [EMULATOR...]

A real phone, Debian's baresip, registers over TLS. The other cases use
sipphone.StreamPhone on Python's ssl module: Debian's SIPp has no TLS,
baresip 1.0 speaks no SIP over WebSocket and answers no SHA-256 challenge.
The server certificate is made here with the openssl command, and the
phones verify it.
"""

import os
import re
import shutil
import subprocess
import sys
import tempfile
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Failure, Gateway, Phone, StreamPhone, authorization, check, run  # noqa: E402

SCRIPT = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "registrar", "subscribers.script")


def make_certificate(directory):
    certificate = os.path.join(directory, "gateway.pem")
    key = os.path.join(directory, "gateway.key")
    subprocess.run(["openssl", "req", "-x509", "-newkey", "rsa:2048", "-nodes", "-keyout", key, "-out", certificate,
                    "-days", "1", "-subj", "/CN=localhost", "-addext", "subjectAltName=DNS:localhost,IP:127.0.0.1"],
                   check=True, capture_output=True, timeout=60)
    return certificate, key


def register(phone, user, uri, contact):
    to = "sip:%s@example.com" % user
    call_id = phone.new_call_id()
    headers = ["Contact: <%s>" % contact, "Expires: 300"]
    first = phone.send(phone.build("REGISTER", uri, to, call_id, 1, headers))
    check(first.status == 401, "%s: no challenge but %d" % (user, first.status))
    auth = authorization(first.challenges()[0], "REGISTER", uri, user, "secret" if user == "alice" else "welcome")
    return phone.send(phone.build("REGISTER", uri, to, call_id, 2, headers + [auth])).status


def websocket_refused_on_a_crashable_libre(program, work, emulator):
    gateway = None
    try:
        gateway = Gateway(program, emulator, work, "unsafe", [SCRIPT], ["--ws", "127.0.0.1:0"])
    except Failure as error:
        check("CVE-2026-50161" in str(error), "the gateway failed otherwise: %s" % error)
        return
    # Started: then its libre must be a fixed one.
    version = re.search(r"libre (\d+)\.(\d+)\.(\d+)", gateway.errors())
    gateway.stop()
    check(version is None, "started WebSocket on a crashable libre")


def phones_register_and_are_found_over_every_transport(program, work, emulator):
    directory = tempfile.mkdtemp(dir=work)
    certificate, key = make_certificate(directory)
    gateway = Gateway(program, emulator, work, "transports", [SCRIPT],
                      ["--tls", "127.0.0.1:0", "--ws", "127.0.0.1:0", "--wss", "127.0.0.1:0",
                       "--certificate", certificate, "--key", key, "--allow-vulnerable-websocket"])
    try:
        ports = {transport: gateway.listening(transport) for transport in ("tls", "ws", "wss")}
        caller = Phone(gateway.port)
        for transport, user in (("tls", "alice"), ("wss", "carol"), ("ws", "dave")):
            phone = StreamPhone(ports[transport], transport, certificate)
            contact = "sip:%s@192.0.2.9;transport=%s" % (user, transport)
            check(register(phone, user, "sip:example.com", contact) == 200, "%s did not register" % transport)
            found = caller.send(caller.build("INVITE", "sip:%s@example.com" % user, "sip:%s@example.com" % user,
                                             caller.new_call_id(), 1))
            check(found.status == 302 and [c.split(">")[0] for c in found.all("Contact")] == ["<" + contact],
                  "%s phone not found: %d %r" % (transport, found.status, found.all("Contact")))
            if transport == "tls":
                check(register(phone, "alice", "sips:example.com", contact) == 200, "sips: refused over TLS")
            phone.close()
        to = "sips:alice@example.com"
        plain = caller.send(caller.build("REGISTER", "sip:example.com", to, caller.new_call_id(), 1))
        check(plain.status == 416, "sips: To over UDP answered %d" % plain.status)
        caller.close()
        gateway.stop()
    finally:
        gateway.kill()


def baresip_registers_over_tls_and_is_found(program, work, emulator):
    baresip = shutil.which("baresip")
    if not baresip:
        print("skipped: no baresip (Debian's baresip-core)")
        return
    directory = tempfile.mkdtemp(dir=work)
    certificate, key = make_certificate(directory)
    # libre 1.x, under baresip 1.0, gives up on a SHA-256 challenge first.
    gateway = Gateway(program, emulator, work, "baresip", [SCRIPT],
                      ["--digest", "MD5", "--tls", "127.0.0.1:0", "--certificate", certificate, "--key", key])
    phone = None
    try:
        port = gateway.listening("tls")
        with open(os.path.join(directory, "config"), "w") as config:
            config.write("sip_listen 127.0.0.1:0\nsip_cafile %s\nmodule_path /usr/lib/baresip/modules\n"
                         "module g711.so\nmodule_app account.so\n" % certificate)
        with open(os.path.join(directory, "accounts"), "w") as accounts:
            accounts.write('<sip:alice@example.com;transport=tls>;auth_pass=secret;'
                           'outbound="sip:127.0.0.1:%s;transport=tls";regint=60\n' % port)
        with open(os.path.join(work, "baresip.log"), "wb") as log:
            phone = subprocess.Popen([baresip, "-f", directory, "-t", "30"], stdout=log, stderr=log)
        deadline = time.monotonic() + 20
        while "example.com/alice 200" not in gateway.output() and time.monotonic() < deadline:
            time.sleep(0.1)
        check("example.com/alice 200" in gateway.output(), "baresip did not register: " + gateway.output())
        caller = Phone(gateway.port)
        uri = "sip:alice@example.com"
        found = caller.send(caller.build("INVITE", uri, uri, caller.new_call_id(), 1))
        caller.close()
        check(found.status == 302 and any("transport=tls" in c for c in found.all("Contact")),
              "baresip not found over TLS: %d %r" % (found.status, found.all("Contact")))
        gateway.stop()
    finally:
        if phone:
            phone.terminate()
            try:
                phone.wait(timeout=10)
            except subprocess.TimeoutExpired:
                phone.kill()
                phone.wait()
        gateway.kill()


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: transports.py GATEWAY WORK-DIR [EMULATOR...]")
    sys.exit(run([("baresip_registers_over_tls_and_is_found", baresip_registers_over_tls_and_is_found),
                  ("websocket_refused_on_a_crashable_libre", websocket_refused_on_a_crashable_libre),
                  ("phones_register_and_are_found_over_every_transport",
                   phones_register_and_are_found_over_every_transport)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
