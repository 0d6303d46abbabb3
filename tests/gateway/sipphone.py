"""A scripted SIP phone over UDP on loopback, for the gateway's security tests.

SIPp, the phone of the other scenarios, cannot do these cases: Debian's SIPp
3.6 knows MD5 only, answers only the first challenge, and cannot send a
captured request again with one header changed. This client does no more
than the cases need: it writes requests as text, reads the status line and
header fields of the answer, and computes digest responses with hashlib.

Gateway starts location-gateway (through an emulator when one is given) on a
free port and stops it by its PID; every wait is bounded.
"""

import hashlib
import os
import re
import base64
import signal
import socket
import ssl
import struct
import subprocess
import sys
import time

START_LIMIT_S = 30
ANSWER_LIMIT_S = 5
SIPP = os.environ.get("SIPP", "sipp")
SIPP_LIMIT_S = 90


class Failure(Exception):
    pass


def check(condition, message):
    if not condition:
        raise Failure(message)


class Gateway:
    def __init__(self, program, emulator, work, name, scripts, options=()):
        self.emulated = bool(emulator)
        self.out_path = os.path.join(work, name + ".gateway.out")
        self.err_path = os.path.join(work, name + ".gateway.err")
        env = dict(os.environ)
        # Freed memory goes back at once, so that resident memory shows what
        # the gateway keeps rather than what the sanitizer holds back.
        env["ASAN_OPTIONS"] = "quarantine_size_mb=0:" + env.get("ASAN_OPTIONS", "")
        # The scenarios here check the gateway as registrar and redirect
        # server unless they ask for relayed calls.
        if "--calls" not in options:
            options = ["--calls", "redirect"] + list(options)
        with open(self.out_path, "wb") as out, open(self.err_path, "wb") as err:
            self.process = subprocess.Popen(
                list(emulator) + [program, "--listen", "127.0.0.1:0", "--store", "none"] + list(options) + list(scripts),
                stdout=out, stderr=err, env=env)
        self.port = None
        # Up once it listens, and with --control once the socket is there
        # too: it is made after the trunks and subscriptions have started,
        # which under an emulator takes a while.
        controlled = "--control" in options
        deadline = time.monotonic() + START_LIMIT_S
        while time.monotonic() < deadline and self.process.poll() is None:
            errors = self.errors()
            found = re.search(r"listening on udp:127\.0\.0\.1:(\d+)", errors)
            if found and (not controlled or "location-gateway: control socket " in errors):
                self.port = int(found.group(1))
                return
            time.sleep(0.1)
        self.kill()
        raise Failure("the gateway did not start: " + self.errors())

    def listening(self, transport):
        """The port of the gateway's first listener of transport (udp, tcp,
        tls, ws, wss) on 127.0.0.1. The secure ones are told on lines of
        their own, after the one the constructor waits for: wait for it."""
        pattern = re.compile(r"^location-gateway: listening on .*\b%s:127\.0\.0\.1:(\d+)" % transport, re.M)
        deadline = time.monotonic() + START_LIMIT_S
        while True:
            found = pattern.search(self.errors())
            if found:
                return int(found.group(1))
            if time.monotonic() > deadline or self.process.poll() is not None:
                raise Failure("the gateway does not listen on %s: %s" % (transport, self.errors()))
            time.sleep(0.1)

    def errors(self):
        with open(self.err_path, errors="replace") as err:
            return err.read()

    def output(self):
        with open(self.out_path, errors="replace") as out:
            return out.read()

    def resident_kib(self):
        # Under an emulator the gateway is the emulator's process itself.
        with open("/proc/%d/status" % self.process.pid) as status:
            for line in status:
                if line.startswith("VmRSS:"):
                    return int(line.split()[1])
        raise Failure("no VmRSS")

    def stop(self):
        # Signals the gateway may take while serving must never take their
        # default action: libre's own handler leaves a window in which a
        # second one did. Under an emulator the process is the emulator's.
        if not self.emulated and self.process.poll() is None:
            with open("/proc/%d/status" % self.process.pid) as status:
                blocked = int(re.search(r"^SigBlk:\s*([0-9a-f]+)", status.read(), re.M).group(1), 16)
            for each in (signal.SIGINT, signal.SIGTERM):
                check(blocked & (1 << (each - 1)), "%s is not blocked while the gateway serves" % each.name)
        # Two in a row, as supervisors send them (timeout(1) signals the
        # process, then its group): the second must neither kill the gateway
        # nor cut its shut-down short.
        self.process.send_signal(signal.SIGTERM)
        self.process.send_signal(signal.SIGTERM)
        try:
            status = self.process.wait(timeout=START_LIMIT_S)
        except subprocess.TimeoutExpired:
            self.kill()
            raise Failure("the gateway did not exit after SIGTERM")
        check(status == 0, "the gateway exited with %d" % status)

    def kill(self):
        if self.process.poll() is None:
            self.process.kill()
            self.process.wait()


class Response:
    def __init__(self, text):
        lines = text.split("\r\n")
        self.status = int(lines[0].split()[1])
        self.headers = []
        for line in lines[1:]:
            if not line:
                break
            name, _, value = line.partition(":")
            self.headers.append((name.strip().lower(), value.strip()))

    def all(self, name):
        return [value for key, value in self.headers if key == name.lower()]

    def challenges(self, header="WWW-Authenticate"):
        """(realm, nonce, algorithm, stale) of each challenge header, in order."""
        found = []
        for value in self.all(header):
            params = dict(re.findall(r'(\w+)="?([^",]*)"?', value))
            found.append((params["realm"], params["nonce"], params.get("algorithm", "MD5"),
                          params.get("stale") == "true"))
        return found


class Phone:
    counter = 0
    via = "UDP"

    def __init__(self, gateway_port, address="127.0.0.1"):
        self.target = ("127.0.0.1", gateway_port)
        self.socket = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
        self.socket.bind((address, 0))
        self.socket.settimeout(ANSWER_LIMIT_S)
        self.address, self.port = self.socket.getsockname()

    def close(self):
        self.socket.close()

    def new_call_id(self):
        Phone.counter += 1
        return "%d-%d@%s" % (os.getpid(), Phone.counter, self.address)

    def build(self, method, uri, to, call_id, cseq, headers=()):
        Phone.counter += 1
        lines = [
            "%s %s SIP/2.0" % (method, uri),
            "Via: SIP/2.0/%s %s:%d;branch=z9hG4bK-%d-%d" % (self.via, self.address, self.port, os.getpid(),
                                                              Phone.counter),
            "From: <sip:phone@example.com>;tag=%d" % Phone.counter,
            "To: <%s>" % to,
            "Call-ID: " + call_id,
            "CSeq: %d %s" % (cseq, method),
            "Max-Forwards: 70",
        ] + list(headers) + ["Content-Length: 0", "", ""]
        return "\r\n".join(lines)

    def send(self, text, answer=True):
        self.socket.sendto(text.encode(), self.target)
        if not answer:
            return None
        data, _ = self.socket.recvfrom(65535)
        return Response(data.decode(errors="replace"))

    def quiet(self, seconds):
        """True when nothing arrives within seconds."""
        self.socket.settimeout(seconds)
        try:
            self.socket.recvfrom(65535)
            return False
        except socket.timeout:
            return True
        finally:
            self.socket.settimeout(ANSWER_LIMIT_S)


class StreamPhone(Phone):
    """The phone over TLS, WebSocket or secure WebSocket (RFC 7118: the "sip"
    subprotocol, one message a frame, masked from the client)."""

    def __init__(self, gateway_port, transport, ca_file=None):
        self.via = transport.upper()
        connection = socket.create_connection(("127.0.0.1", gateway_port), timeout=ANSWER_LIMIT_S)
        if transport in ("tls", "wss"):
            context = ssl.create_default_context(cafile=ca_file)
            connection = context.wrap_socket(connection, server_hostname="localhost")
        self.socket = connection
        self.address, self.port = connection.getsockname()
        self.websocket = transport in ("ws", "wss")
        self.buffer = b""
        if self.websocket:
            key = base64.b64encode(os.urandom(16)).decode()
            connection.sendall(("GET / HTTP/1.1\r\nHost: localhost\r\nUpgrade: websocket\r\n"
                                "Connection: Upgrade\r\nSec-WebSocket-Key: %s\r\nSec-WebSocket-Version: 13\r\n"
                                "Sec-WebSocket-Protocol: sip\r\n\r\n" % key).encode())
            head = self.read_until(b"\r\n\r\n").decode(errors="replace")
            # A libre before 4.x accepts the sip subprotocol without naming it
            # in its answer (browsers refuse that); the README says so.
            check(" 101 " in head.split("\r\n")[0], "no WebSocket: " + head)

    def read_until(self, end):
        while end not in self.buffer:
            data = self.socket.recv(65535)
            check(data, "the gateway closed the connection")
            self.buffer += data
        head, _, self.buffer = self.buffer.partition(end)
        return head + end

    def read_exactly(self, count):
        while len(self.buffer) < count:
            data = self.socket.recv(65535)
            check(data, "the gateway closed the connection")
            self.buffer += data
        head, self.buffer = self.buffer[:count], self.buffer[count:]
        return head

    def send(self, text, answer=True):
        data = text.encode()
        if self.websocket:
            mask = os.urandom(4)
            size = len(data)
            header = struct.pack("!BB", 0x81, 0x80 | size) if size < 126 else struct.pack("!BBH", 0x81, 0xfe, size)
            data = header + mask + bytes(b ^ mask[i % 4] for i, b in enumerate(data))
        self.socket.sendall(data)
        if not answer:
            return None
        if not self.websocket:
            return Response(self.read_until(b"\r\n\r\n").decode(errors="replace"))
        while True:
            first, second = struct.unpack("!BB", self.read_exactly(2))
            size = second & 0x7f
            if size == 126:
                size = struct.unpack("!H", self.read_exactly(2))[0]
            elif size == 127:
                size = struct.unpack("!Q", self.read_exactly(8))[0]
            check(not second & 0x80, "a masked frame from the server")
            payload = self.read_exactly(size)
            # RFC 7118 lets a message travel as text or binary; control
            # frames (a keep-alive ping) are skipped.
            if first & 0x0f in (1, 2):
                return Response(payload.decode(errors="replace"))


class Sipp:
    """One SIPp run in the work directory, bounded by limit_s: scenario is
    "uas" (SIPp's own) or a scenario file's path, and options follow it.
    With a port (-p, and -i the address) it returns once SIPp has bound it."""

    def __init__(self, work, name, scenario, options, limit_s=SIPP_LIMIT_S):
        self.name = name
        self.limit_s = limit_s
        self.work = work
        scenario_options = ["-sn", scenario] if scenario == "uas" else ["-sf", scenario]
        with open(os.path.join(work, name + ".sipp.out"), "wb") as out:
            self.process = subprocess.Popen(
                [SIPP] + scenario_options + list(options) +
                ["-timeout", "%ds" % limit_s, "-timeout_error", "-trace_err", "-trace_logs",
                 "-error_file", os.path.join(work, name + ".errors"),
                 "-log_file", os.path.join(work, name + ".logs")],
                cwd=work, stdout=out, stderr=subprocess.STDOUT, stdin=subprocess.DEVNULL)
        # Whatever is sent to its port before SIPp has bound it is lost.
        if "-p" in options:
            kind = socket.SOCK_STREAM if "t1" in options else socket.SOCK_DGRAM
            await_bound(self.process, int(options[options.index("-p") + 1]), START_LIMIT_S,
                        options[options.index("-i") + 1], kind)

    def succeeded(self):
        try:
            status = self.process.wait(timeout=self.limit_s + 10)
        except subprocess.TimeoutExpired:
            self.kill()
            return False
        return status == 0

    def errors(self):
        path = os.path.join(self.work, self.name + ".errors")
        return open(path, errors="replace").read()[-2000:] if os.path.exists(path) else ""

    def logged(self):
        path = os.path.join(self.work, self.name + ".logs")
        return open(path, errors="replace").read().splitlines() if os.path.exists(path) else []

    def kill(self):
        if self.process.poll() is None:
            self.process.kill()
            self.process.wait()


def write_script(work, name, text):
    """The path of a gateway script NAME.script in work, holding text."""
    path = os.path.join(work, name + ".script")
    with open(path, "w") as file:
        file.write(text)
    return path


def logged_digest_is_right(line, method, account, uri=None):
    """Whether a digest header as SIPp logs it answers its nonce with the
    account's (user, realm, password) for method (RFC 2617, MD5, qop=auth),
    and names uri when one is given."""
    fields = dict(re.findall(r'(\w+)="?([^",]*)"?', line))
    user, realm, password = account
    if fields.get("username") != user or fields.get("realm") != realm:
        return False
    if uri is not None and fields.get("uri") != uri:
        return False
    ha1 = hash_hex("MD5", "%s:%s:%s" % (user, realm, password))
    ha2 = hash_hex("MD5", "%s:%s" % (method, fields["uri"]))
    expected = hash_hex("MD5", ":".join([ha1, fields["nonce"], fields["nc"], fields["cnonce"], "auth", ha2]))
    return fields.get("response") == expected


def hash_hex(algorithm, text):
    name = {"MD5": "md5", "SHA-256": "sha256"}[algorithm]
    return hashlib.new(name, text.encode()).hexdigest()


def authorization(challenge, method, uri, user, password, nc=1, cnonce="0a4f113b"):
    realm, nonce, algorithm, _ = challenge
    ha1 = hash_hex(algorithm, "%s:%s:%s" % (user, realm, password))
    ha2 = hash_hex(algorithm, "%s:%s" % (method, uri))
    count = "%08x" % nc
    response = hash_hex(algorithm, ":".join([ha1, nonce, count, cnonce, "auth", ha2]))
    return ('Authorization: Digest username="%s", realm="%s", nonce="%s", uri="%s", algorithm=%s, '
            'qop=auth, nc=%s, cnonce="%s", response="%s"'
            % (user, realm, nonce, uri, algorithm, count, cnonce, response))


def free_port(address="127.0.0.1", kind=socket.SOCK_DGRAM):
    """A port nobody holds on address now (UDP unless kind says TCP)."""
    with socket.socket(socket.AF_INET, kind) as probe:
        probe.bind((address, 0))
        return probe.getsockname()[1]


def await_bound(process, port, limit_s, address="127.0.0.1", kind=socket.SOCK_DGRAM):
    """Whether process (a phone, a carrier) came to hold port within limit_s
    and before it ended: a request sent there before would be lost."""
    deadline = time.monotonic() + limit_s
    while time.monotonic() < deadline and process.poll() is None:
        with socket.socket(socket.AF_INET, kind) as probe:
            try:
                probe.bind((address, port))
            except OSError:
                return True
        time.sleep(0.05)
    return False


def ask_control(path, line):
    """What the gateway's control socket at path prints for one line."""
    client = socket.socket(socket.AF_UNIX, socket.SOCK_STREAM)
    client.settimeout(ANSWER_LIMIT_S)
    client.connect(path)
    client.sendall(line.encode() + b"\n")
    data = b""
    while not (data.endswith(b"\0ok\n") or data.endswith(b"\0failed\n")):
        chunk = client.recv(65536)
        check(chunk, "the control socket closed before answering %r" % line)
        data += chunk
    client.close()
    return data[:data.rindex(b"\0")].decode(errors="replace")


def run(cases, program, work, emulator):
    """Runs each case (name, function) in order; prints and returns an exit status."""
    os.makedirs(work, exist_ok=True)
    failed = 0
    for name, case in cases:
        try:
            case(program, work, emulator)
            print("PASS", name)
        except (Failure, OSError) as error:
            failed += 1
            print("FAIL %s: %s" % (name, error))
    sys.stdout.flush()
    return 1 if failed else 0
