#!/usr/bin/python3
"""End to end: a trunk's registration over an RFC 5626 flow, and the DNS
security check of the registrar's answers.

    nat.py GATEWAY WORK-DIR [EMULATOR...]     (DNSMASQ in the environment)

The carrier's registrar is a few lines of Python here, since what it must do
is beyond SIPp: close the flow's connection, watch for STUN, answer from an
address it was not reached at. dnsmasq is the only DNS server the gateway
asks, as in the dns scenario: it sends the trunk to the registrar over TCP
(NAPTR SIP+D2T) or UDP. Every process is bounded in time and stopped by its
PID; a machine without dnsmasq skips the test (77).
"""

import os
import re
import shutil
import socket
import subprocess
import sys
import threading
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Gateway, check, free_port, run, write_script  # noqa: E402

DNSMASQ = os.environ.get("DNSMASQ") or shutil.which("dnsmasq") or "/usr/sbin/dnsmasq"
# Long enough for the gateway under an emulator; on loopback it takes
# milliseconds.
WAIT_S = 20
INSTANCE = r'\+sip\.instance="<(urn:uuid:[0-9a-f]{8}-[0-9a-f]{4}-4[0-9a-f]{3}-[89ab][0-9a-f]{3}-[0-9a-f]{12})>"'

BASE_SCRIPT = """location-service example.com create
location-service example.com domain insert 0 example.com
"""


def trunk_script(name, settings):
    lines = ["identity example.com %s create identity" % name,
             "identity example.com %s face registration-outbound create" % name,
             "face example.com %s registration-outbound registrar set carrier.example" % name,
             "face example.com %s registration-outbound lifetime set 300" % name,
             "face example.com %s registration-outbound retry-timeout-on-system-error set 1" % name]
    lines += ["face example.com %s registration-outbound %s" % (name, setting) for setting in settings]
    return "\n".join(lines) + "\n"



class Dns:
    """dnsmasq on a free loopback port, knowing carrier.example only: the
    registrar at port over transport (udp or tcp), at address."""

    def __init__(self, work, name, transport, port, address="127.0.0.1"):
        service = "D2T" if transport == "tcp" else "D2U"
        for _ in range(5):
            self.port = free_port()
            with open(os.path.join(work, name + ".dns.log"), "wb") as log:
                self.process = subprocess.Popen(
                    [DNSMASQ, "--keep-in-foreground", "--conf-file=/dev/null", "--no-resolv", "--no-hosts",
                     "--pid-file=", "--user=", "--listen-address=127.0.0.1", "--bind-interfaces",
                     "--port=%d" % self.port, "--local=/example/",
                     "--naptr-record=carrier.example,10,10,S,SIP+%s,,_sip._%s.carrier.example" % (service, transport),
                     "--srv-host=_sip._%s.carrier.example,registrar.carrier.example,%d" % (transport, port),
                     "--host-record=registrar.carrier.example,%s" % address],
                    stdout=log, stderr=subprocess.STDOUT)
            time.sleep(0.5)
            if self.process.poll() is None:
                return
        raise OSError("dnsmasq found no free port")

    def stop(self):
        self.process.terminate()
        try:
            self.process.wait(5)
        except subprocess.TimeoutExpired:
            self.process.kill()
            self.process.wait()


def answer(request, extra="", via=None):
    """A 200 for request (its text), the Contact echoed with expires=300."""
    lines = request.split("\r\n")
    keep = [line for line in lines[1:] if line.split(":")[0].strip().lower() in ("via", "from", "call-id", "cseq")]
    if via is not None:
        keep = [via(line) if line.lower().startswith("via:") else line for line in keep]
    to = [line + ";tag=carrier" for line in lines[1:] if line.lower().startswith("to:")]
    contact = [re.sub(r";expires=\d+", ";expires=300", line) for line in lines[1:] if line.lower().startswith("contact:")]
    return ("SIP/2.0 200 OK\r\n" + "\r\n".join(keep + to + contact) + "\r\n" + extra +
            "Content-Length: 0\r\n\r\n").encode()


class TcpRegistrar(threading.Thread):
    """Accepts the gateway's connections and answers each REGISTER with 200
    and "Require: outbound"; notes each REGISTER with the number of the
    connection it came on. close() closes the current connection."""

    def __init__(self):
        super().__init__(daemon=True)
        self.listener = socket.socket()
        self.listener.bind(("127.0.0.1", 0))
        self.listener.listen(4)
        self.listener.settimeout(0.2)
        self.port = self.listener.getsockname()[1]
        self.stopping = False
        self.lock = threading.Lock()
        self.registers = []
        self.connections = []

    def run(self):
        while not self.stopping:
            try:
                connection, _ = self.listener.accept()
            except socket.timeout:
                continue
            with self.lock:
                self.connections.append(connection)
                number = len(self.connections)
            threading.Thread(target=self.serve, args=(connection, number), daemon=True).start()

    def serve(self, connection, number):
        buffer = b""
        connection.settimeout(0.2)
        while not self.stopping:
            try:
                data = connection.recv(65535)
            except socket.timeout:
                continue
            except OSError:
                return
            if not data:
                return
            buffer += data
            buffer = buffer.lstrip(b"\r\n")
            while b"\r\n\r\n" in buffer:
                head, _, buffer = buffer.partition(b"\r\n\r\n")
                request = head.decode()
                if not request.startswith("REGISTER"):
                    continue
                with self.lock:
                    self.registers.append((number, request))
                try:
                    connection.sendall(answer(request, "Require: outbound\r\nFlow-Timer: 120\r\n"))
                except OSError:
                    return

    def close(self):
        with self.lock:
            connection = self.connections[-1]
        connection.shutdown(socket.SHUT_RDWR)
        connection.close()

    def received(self):
        with self.lock:
            return list(self.registers)

    def stop(self):
        self.stopping = True
        self.join(5)
        self.listener.close()


class UdpRegistrar(threading.Thread):
    """Answers each REGISTER on its UDP port with 200 (extra headers
    added), from the socket replies (its own unless given); notes every
    datagram it gets."""

    def __init__(self, extra="", replies=None):
        super().__init__(daemon=True)
        self.socket = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
        self.socket.bind(("127.0.0.1", 0))
        self.socket.settimeout(0.2)
        self.port = self.socket.getsockname()[1]
        self.replies = replies or self.socket
        self.extra = extra
        self.stopping = False
        self.lock = threading.Lock()
        self.datagrams = []

    def run(self):
        while not self.stopping:
            try:
                data, source = self.socket.recvfrom(65535)
            except socket.timeout:
                continue
            with self.lock:
                self.datagrams.append(data)
            if data.startswith(b"REGISTER"):
                self.replies.sendto(answer(data.decode(errors="replace").partition("\r\n\r\n")[0], self.extra),
                                    source)

    def received(self, prefix):
        with self.lock:
            return [data for data in self.datagrams if data.startswith(prefix)]

    def stop(self):
        self.stopping = True
        self.join(5)
        self.socket.close()


def await_true(condition):
    deadline = time.monotonic() + WAIT_S
    while time.monotonic() < deadline:
        if condition():
            return True
        time.sleep(0.1)
    return False


def trunk_registers_over_a_flow_and_forms_a_new_one_when_it_breaks(program, work, emulator):
    registrar = TcpRegistrar()
    registrar.start()
    dns = Dns(work, "flow", "tcp", registrar.port)
    script = write_script(work, "flow", BASE_SCRIPT + trunk_script("trunk", ["nat-traversal-flows set on"]))
    store = os.path.join(work, "flow.sqlite")
    for leftover in (store, store + ".instance"):
        if os.path.exists(leftover):
            os.remove(leftover)
    options = ["--dns-server", "127.0.0.1:%d" % dns.port, "--store", store]
    try:
        gateway = Gateway(program, emulator, work, "flow", [script], options)
        try:
            check(await_true(lambda: registrar.received()), "no REGISTER came: " + gateway.errors())
            first = registrar.received()[0][1]
            instance = re.search(INSTANCE, first)
            check(instance and ";reg-id=1" in first, "the Contact names no flow: " + first)
            check(re.search(r"^Supported:.*\boutbound\b", first, re.M), "no Supported: outbound: " + first)
            registrar.close()
            check(await_true(lambda: any(number == 2 for number, _ in registrar.received())),
                  "no REGISTER on a new connection after the flow broke: " + gateway.errors())
            renewed = [request for number, request in registrar.received() if number == 2][0]
            check(re.search(r"^Contact: .*;expires=300;", renewed, re.M),
                  "the first REGISTER on the new connection is no registration: " + renewed)
            check(re.search(INSTANCE, renewed).group(1) == instance.group(1) and ";reg-id=1" in renewed,
                  "the new flow is not the same instance's: " + renewed)
            gateway.stop()
        finally:
            gateway.kill()
        # The instance outlives the process.
        count = len(registrar.received())
        again = Gateway(program, emulator, work, "flow-again", [script], options)
        try:
            check(await_true(lambda: len(registrar.received()) > count), "no REGISTER after the restart")
            restarted = registrar.received()[count][1]
            check(re.search(INSTANCE, restarted).group(1) == instance.group(1),
                  "the instance changed with the restart: " + restarted)
            again.stop()
        finally:
            again.kill()
    finally:
        dns.stop()
        registrar.stop()


def udp_flow_is_kept_by_stun_alone(program, work, emulator):
    # The face asks for OPTIONS every second; over a flow libre's STUN
    # keep-alive takes its place.
    registrar = UdpRegistrar("Require: outbound\r\nFlow-Timer: 1\r\n")
    registrar.start()
    dns = Dns(work, "stun", "udp", registrar.port)
    script = write_script(work, "stun", BASE_SCRIPT + trunk_script(
        "trunk", ["nat-traversal-flows set on", "keep-alive-method set options", "keep-alive-interval set 1"]))
    options = ["--dns-server", "127.0.0.1:%d" % dns.port, "--store", os.path.join(work, "stun.sqlite")]
    try:
        gateway = Gateway(program, emulator, work, "stun", [script], options)
        try:
            check(await_true(lambda: "registered at" in gateway.errors()), "not registered: " + gateway.errors())
            # A STUN binding request: type 0x0001 and the magic cookie.
            check(await_true(lambda: any(data[4:8] == b"\x21\x12\xa4\x42"
                                         for data in registrar.received(b"\x00\x01"))),
                  "no STUN keep-alive on the flow")
            time.sleep(2.5)
            check(not registrar.received(b"OPTIONS"), "OPTIONS keep-alives beside the flow's")
            gateway.stop()
        finally:
            gateway.kill()
    finally:
        dns.stop()
        registrar.stop()


def answer_from_an_address_the_name_did_not_resolve_to_is_refused_when_checked(program, work, emulator):
    # The registrar is reached at 127.0.0.1 and answers from 127.0.0.2.
    elsewhere = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
    elsewhere.bind(("127.0.0.2", 0))
    registrar = UdpRegistrar(replies=elsewhere)
    registrar.start()
    dns = Dns(work, "dns-check", "udp", registrar.port)
    script = write_script(work, "dns-check", BASE_SCRIPT + trunk_script("checked", ["dns-security-check set on"]) +
                          trunk_script("trusting", []))
    try:
        gateway = Gateway(program, emulator, work, "dns-check", [script], ["--dns-server", "127.0.0.1:%d" % dns.port])
        try:
            refused = (r"trunk example.com/checked failed to register \(answer from 127\.0\.0\.2:%d, "
                       r"not an address of carrier\.example\), retrying in 1 s" % elsewhere.getsockname()[1])
            check(await_true(lambda: re.search(refused, gateway.errors())),
                  "the answer from elsewhere was not refused: " + gateway.errors())
            check(await_true(lambda: "trunk example.com/trusting registered at udp:127.0.0.2:" in gateway.errors()),
                  "without the check the answer was not taken: " + gateway.errors())
            check("trunk example.com/checked registered" not in gateway.errors(),
                  "the checked trunk registered: " + gateway.errors())
            gateway.stop()
        finally:
            gateway.kill()
    finally:
        dns.stop()
        registrar.stop()
        elsewhere.close()


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: nat.py GATEWAY WORK-DIR [EMULATOR...]")
    if not os.path.exists(DNSMASQ):
        print("no dnsmasq: skipped")
        sys.exit(77)
    sys.exit(run([("trunk_registers_over_a_flow_and_forms_a_new_one_when_it_breaks",
                   trunk_registers_over_a_flow_and_forms_a_new_one_when_it_breaks),
                  ("udp_flow_is_kept_by_stun_alone", udp_flow_is_kept_by_stun_alone),
                  ("answer_from_an_address_the_name_did_not_resolve_to_is_refused_when_checked",
                   answer_from_an_address_the_name_did_not_resolve_to_is_refused_when_checked)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
