#!/usr/bin/python3
"""End to end: two real softphones, Debian's linphonec, register at the
gateway with digest and call each other through it, the gateway relaying
the calls (--calls relay): UDP to UDP, UDP to a callee registered over TCP,
and a caller over TLS to UDP.

    softphones.py GATEWAY WORK-DIR [EMULATOR...]

Each phone is a linphonec of its own, with a configuration file and a HOME
made here, the gateway as its registrar and outbound proxy, free ports of
its own on loopback, no video, no sound card (linphonec's "soundcard use
files"), no STUN, ICE or UPnP. The callee answers by itself; its phone
rings first (the caller sees 180). A call is up when both phones' logs
(-d 6) show it in the state StreamsRunning: media set up from the SDP the
gateway relayed. Each leg's ACK must reach its end: the callee's phone
logs the gateway's, and the gateway does not send the caller its 200 again
and again while the first call stays up for a while. Each pair
of phones places two calls, the first hung up by the caller, the second by
the callee, and both phones must see each end.
The TLS phone verifies the gateway's certificate, made here with openssl.
"""

import ctypes
import os
import re
import shutil
import signal
import socket
import subprocess
import sys
import tempfile
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import Failure, Gateway, check, free_port, run  # noqa: E402

SCRIPT = os.path.join(os.path.dirname(os.path.abspath(__file__)), "phones.script")
PASSWORDS = {"u1": "one-secret", "u3": "three-secret"}
# Registration, a call set up and a call ended take well under a second
# natively; the gateway may run under qemu-user or AddressSanitizer.
WAIT_S = 60
STOP_S = 15
# How long the first call of each pair stays up: the gateway sends a 200
# again after 0.5 s and 1.5 s without an ACK (RFC 3261 timer G).
HOLD_S = 2

TIMESTAMP = re.compile(r"\d{4}-\d\d-\d\d \d\d:")
START_LINE = re.compile(r"(SIP/2\.0 \d{3} |[A-Z]+ sips?:\S+ SIP/2\.0$)")
STATE = re.compile(r"CallSession \[(0x[0-9a-f]+)\] moving from state (\w+) to (\w+)")


def make_certificate(directory):
    """The gateway's self-signed certificate, for 127.0.0.1 by its common name
    only: belle-sip's mbedtls matches the host a phone connects to against
    the certificate's DNS names, or its common name when it has none, never
    against an IP address entry."""
    certificate = os.path.join(directory, "gateway.pem")
    key = os.path.join(directory, "gateway.key")
    subprocess.run(["openssl", "req", "-x509", "-newkey", "rsa:2048", "-nodes", "-keyout", key, "-out", certificate,
                    "-days", "1", "-subj", "/CN=127.0.0.1"], check=True, capture_output=True, timeout=60)
    return certificate, key


def free_rtp_port():
    """An even UDP port whose successor (RTCP) is free too."""
    for _ in range(100):
        port = free_port()
        if port % 2 or port >= 65535:
            continue
        try:
            with socket.socket(socket.AF_INET, socket.SOCK_DGRAM) as rtcp:
                rtcp.bind(("127.0.0.1", port + 1))
            return port
        except OSError:
            continue
    raise Failure("no free pair of RTP ports")


def die_with_parent():
    # linphonec does not exit when its standard input closes: should this
    # test be killed, its phones go with it.
    ctypes.CDLL(None, use_errno=True).prctl(1, signal.SIGKILL)  # PR_SET_PDEATHSIG


class Softphone:
    def __init__(self, work, name, user, transport, gateway_port, ca_file=None):
        self.name = name
        self.user = user
        self.gateway_port = gateway_port
        directory = tempfile.mkdtemp(dir=work, prefix=name + ".")
        home = os.path.join(directory, "home")
        # linphonec keeps its databases there and will not start without it.
        os.makedirs(os.path.join(home, ".local", "share", "linphone"))
        ports = {"udp": 0, "tcp": 0, "tls": 0}
        ports[transport] = free_port(kind=socket.SOCK_DGRAM if transport == "udp" else socket.SOCK_STREAM)
        proxy = "sip:127.0.0.1:%d;transport=%s" % (gateway_port, transport)
        self.config = os.path.join(directory, "linphonerc")
        with open(self.config, "w") as config:
            config.write("\n".join([
                "[sip]",
                "sip_port=%d" % ports["udp"],
                "sip_tcp_port=%d" % ports["tcp"],
                "sip_tls_port=%d" % ports["tls"],
                "use_ipv6=0",
                "bind_address=127.0.0.1",
                "default_proxy=0",
                "root_ca=%s" % (ca_file or ""),
                "verify_server_certs=1",
                "verify_server_cn=1",
                "[rtp]",
                "bind_address=127.0.0.1",
                # Without a sound card a phone sends hardly any RTP; the
                # calls end well before this.
                "nortp_timeout=300",
                "audio_rtp_port=%d" % free_rtp_port(),
                "video_rtp_port=%d" % free_rtp_port(),
                "[video]",
                "capture=0",
                "display=0",
                "automatically_initiate=0",
                "automatically_accept=0",
                "[net]",
                "nat_policy_ref=none",
                "[nat_policy_0]",
                "ref=none",
                "stun_server=",
                "protocols=",
                "[proxy_0]",
                "reg_proxy=" + proxy,
                # The outbound proxy: every request goes through the gateway.
                "reg_route=" + proxy,
                "reg_identity=sip:%s@127.0.0.1" % user,
                "reg_expires=600",
                "reg_sendregister=1",
                "[auth_info_0]",
                "username=" + user,
                "passwd=" + PASSWORDS[user],
                "realm=127.0.0.1",
                "domain=127.0.0.1",
                ""]))
        env = dict(os.environ, HOME=home)
        self.log_path = os.path.join(work, name + ".linphonec.log")
        with open(self.log_path, "wb") as log:
            self.process = subprocess.Popen([shutil.which("linphonec"), "-c", self.config, "-d", "6"],
                                            stdin=subprocess.PIPE, stdout=log, stderr=subprocess.STDOUT, env=env,
                                            preexec_fn=die_with_parent)
        try:
            self.command("soundcard use files")
            self.command("autoanswer enable")
            self.await_text("Using wav files instead of soundcard.", "no sound card")
            self.await_text("Auto answer enabled.", "autoanswer")
        except (Failure, OSError):
            self.stop()
            raise

    def command(self, line):
        self.process.stdin.write((line + "\n").encode())
        self.process.stdin.flush()

    def log(self):
        with open(self.log_path, errors="replace") as log:
            return log.read()

    def await_text(self, text, what):
        deadline = time.monotonic() + WAIT_S
        while time.monotonic() < deadline:
            if text in self.log():
                return
            check(self.process.poll() is None, "%s: linphonec exited with %s" % (self.name, self.process.returncode))
            time.sleep(0.1)
        raise Failure("%s: %s not seen within %d s (%s)" % (self.name, what, WAIT_S, self.log_path))

    def await_registered(self):
        self.await_text("for identity [sip:%s@127.0.0.1] moving from state [LinphoneRegistrationProgress] to "
                        "[LinphoneRegistrationOk]" % self.user, "registration")

    def senders(self):
        """Where the SIP messages this phone received came from, as ports."""
        return set(int(port) for port in
                   re.findall(r"received \[\d+\] new bytes from \[\w+://127\.0\.0\.1:(\d+)\]", self.log()))

    def received(self):
        """The SIP messages this phone received, in order: (start line,
        Call-ID, CSeq method). A read over TCP or TLS may hold several."""
        messages = []
        receiving = False
        current = None
        for line in self.log().split("\n"):
            if TIMESTAMP.match(line):
                receiving = "new bytes from" in line
                current = None
            elif receiving and START_LINE.match(line):
                current = [line, None, None]
                messages.append(current)
            elif current and line.lower().startswith("call-id:"):
                current[1] = line.split(":", 1)[1].strip()
            elif current and line.lower().startswith("cseq:"):
                current[2] = line.split()[-1]
        return [tuple(message) for message in messages]

    def await_ack(self, call_id):
        deadline = time.monotonic() + WAIT_S
        while time.monotonic() < deadline:
            if any(start.startswith("ACK ") and each == call_id for start, each, _ in self.received()):
                return
            time.sleep(0.1)
        raise Failure("%s: no ACK for the call %s (%s)" % (self.name, call_id, self.log_path))

    def calls(self):
        """The states each call went through, in the order the calls began.
        A call begins in the state Idle; the next may reuse its session's
        address."""
        calls = []
        current = {}
        for session, before, after in STATE.findall(self.log()):
            if before == "LinphoneCallIdle" or session not in current:
                current[session] = [before]
                calls.append(current[session])
            current[session].append(after)
        return calls

    def await_state(self, index, state):
        deadline = time.monotonic() + WAIT_S
        while time.monotonic() < deadline:
            calls = self.calls()
            if len(calls) > index and state in calls[index]:
                return calls[index]
            time.sleep(0.1)
        calls = self.calls()
        raise Failure("%s: call %d never reached %s: %r (%s)" % (
            self.name, index + 1, state, calls[index] if len(calls) > index else None, self.log_path))

    def stop(self):
        if self.process.poll() is not None:
            return
        try:
            self.command("quit")
            self.process.wait(timeout=STOP_S)
        except (OSError, subprocess.TimeoutExpired):
            self.process.kill()
            self.process.wait()


def await_output(gateway, text, count):
    deadline = time.monotonic() + WAIT_S
    while time.monotonic() < deadline:
        if gateway.output().count(text) >= count:
            return
        time.sleep(0.1)
    raise Failure("%d lines %r expected: %s" % (count, text, gateway.output()))


def call_twice(program, work, emulator, name, caller_transport, callee_transport):
    """u1 calls u3 twice: the caller hangs up the first call, the callee the second."""
    directory = tempfile.mkdtemp(dir=work, prefix=name + ".")
    certificate, key = make_certificate(directory)
    gateway = Gateway(program, emulator, work, name, [SCRIPT],
                      ["--calls", "relay", "--tls", "127.0.0.1:0", "--certificate", certificate, "--key", key])
    phones = []
    try:
        callee = Softphone(work, name + ".u3", "u3", callee_transport, gateway.listening(callee_transport), certificate)
        phones.append(callee)
        caller = Softphone(work, name + ".u1", "u1", caller_transport, gateway.listening(caller_transport), certificate)
        phones.append(caller)
        callee.await_registered()
        caller.await_registered()
        for index, hanging_up in enumerate((caller, callee)):
            caller.command("call sip:u3@127.0.0.1")
            sides = {"caller": caller, "callee": callee}
            for side, phone in sides.items():
                phone.await_state(index, "LinphoneCallStreamsRunning")
            check("LinphoneCallOutgoingRinging" in caller.calls()[index] or
                  "LinphoneCallOutgoingEarlyMedia" in caller.calls()[index],
                  "the caller never heard the callee ring: %r" % caller.calls()[index])
            check("LinphoneCallIncomingReceived" in callee.calls()[index],
                  "the callee's phone never rang: %r" % callee.calls()[index])
            await_output(gateway, "INVITE sip:u3@127.0.0.1 lab/u3 200", index + 1)
            # The ACK of each leg reaches its phone: the callee's through the
            # gateway's dialog with it, the caller's taken by the gateway,
            # which would otherwise send its 200 again every so often.
            invites = [each for start, each, _ in callee.received() if start.startswith("INVITE ")]
            callee.await_ack(invites[index])
            if index == 0:
                time.sleep(HOLD_S)
                # One retransmission may cross a slow ACK under an emulator.
                answers = sum(1 for start, _, method in caller.received()
                              if start.startswith("SIP/2.0 200 ") and method == "INVITE")
                check(answers <= 2, "the caller got the 200 %d times: the gateway did not take its ACK" % answers)
            hanging_up.command("terminate")
            for side, phone in sides.items():
                states = phone.await_state(index, "LinphoneCallReleased")
                check("LinphoneCallEnd" in states and "LinphoneCallError" not in states,
                      "call %d, hung up by the %s: the %s went %r" % (
                          index + 1, "caller" if hanging_up is caller else "callee", side, states))
        # Over TCP and TLS the gateway reaches a phone over the connection the
        # phone registered on: a connection of the gateway's own would come
        # from another port.
        for phone in phones:
            check(phone.senders() == {phone.gateway_port},
                  "%s heard from %r, not only from the gateway's port %d" % (phone.name, sorted(phone.senders()),
                                                                          phone.gateway_port))
        for phone in phones:
            phone.stop()
            check(phone.process.returncode == 0, "%s: linphonec exited with %d" % (phone.name,
                                                                                  phone.process.returncode))
        gateway.stop()
    finally:
        for phone in phones:
            phone.stop()
        gateway.kill()


def udp_phones_call_each_other(program, work, emulator):
    call_twice(program, work, emulator, "udp-udp", "udp", "udp")


def udp_phone_calls_a_phone_registered_over_tcp(program, work, emulator):
    call_twice(program, work, emulator, "udp-tcp", "udp", "tcp")


def tls_phone_calls_a_udp_phone(program, work, emulator):
    call_twice(program, work, emulator, "tls-udp", "tls", "udp")


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: softphones.py GATEWAY WORK-DIR [EMULATOR...]")
    if not shutil.which("linphonec"):
        print("skipped: no linphonec (Debian's linphone-cli)")
        sys.exit(77)
    sys.exit(run([("udp_phones_call_each_other", udp_phones_call_each_other),
                  ("udp_phone_calls_a_phone_registered_over_tcp", udp_phone_calls_a_phone_registered_over_tcp),
                  ("tls_phone_calls_a_udp_phone", tls_phone_calls_a_udp_phone)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
