#!/usr/bin/python3
"""End to end: message waiting. The gateway learns from a message server
whether messages wait for an identity (RFC 3842) and tells the identity's
registered phones with an unsolicited NOTIFY.

    notifier.py GATEWAY WORK-DIR [EMULATOR...]     (SIPP in the environment)

SIPp plays the message servers: notifier.xml challenges the subscription,
accepts it, notifies once and takes the unsubscription; moved.xml answers
302 towards another one. The phones, and the message server that notifies
without a subscription, are sipphone.py's scripted clients. Every process
is bounded in time and stopped by its PID.
"""

import os
import re
import socket
import subprocess
import sys
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), ".."))
from sipphone import (ANSWER_LIMIT_S, SIPP, Failure, Gateway, Phone, Sipp, StreamPhone,  # noqa: E402
                      ask_control, check, free_port, logged_digest_is_right, run, write_script)

HERE = os.path.dirname(os.path.abspath(__file__))
# The message server SIPp plays.
NOTIFIER_XML = os.path.join(HERE, "notifier.xml")
# How long a NOTIFY may take to reach a phone, a subscription that had to
# wait for its message server included (UDP retransmissions reach it).
NOTIFY_LIMIT_S = 30
ACCOUNT = ("alice-mwi", "voicemail.example", "v0icemail")

BASE_SCRIPT = """location-service example.com create
location-service example.com domain insert 0 example.com
authentication-service voicemail create
authentication-service voicemail realm insert 0 voicemail.example
authentication-service voicemail credentials set alice-mwi v0icemail
identity example.com alice create identity
identity example.com alice face registration-inbound create
identity example.com alice face authentication-outbound create
face example.com alice authentication-outbound authenticate insert 0 voicemail alice-mwi
identity example.com alice face message-subscription create
face example.com alice message-subscription mwi-subscription-mode set explicit
face example.com alice message-subscription lifetime set 300
face example.com alice message-subscription retry-timeout-on-system-error set 1
"""




def register(phone, user, transport="udp"):
    contact = "<sip:%s@%s:%d;transport=%s>" % (user, phone.address, phone.port, transport)
    answer = phone.send(phone.build("REGISTER", "sip:example.com", "sip:%s@example.com" % user, phone.new_call_id(), 1,
                                    ["Contact: " + contact, "Expires: 300"]))
    check(answer.status == 200, "%s's REGISTER over %s answered %d" % (user, transport, answer.status))


def receive_request(phone):
    """The next request the gateway sends phone, (head, body), answered
    200; within NOTIFY_LIMIT_S."""
    phone.socket.settimeout(NOTIFY_LIMIT_S)
    try:
        if isinstance(phone, StreamPhone):
            head = phone.read_until(b"\r\n\r\n").decode(errors="replace")
            length = re.search(r"^Content-Length: *(\d+)", head, re.M | re.I)
            body = phone.read_exactly(int(length.group(1)) if length else 0).decode(errors="replace")
        else:
            data, _ = phone.socket.recvfrom(65535)
            head, _, body = data.decode(errors="replace").partition("\r\n\r\n")
    except socket.timeout:
        raise Failure("no request reached the phone within %d s" % NOTIFY_LIMIT_S)
    finally:
        phone.socket.settimeout(ANSWER_LIMIT_S)
    lines = head.split("\r\n")
    kept = [line for line in lines[1:] if re.match(r"(Via|From|To|Call-ID|CSeq):", line, re.I)]
    phone.send("\r\n".join(["SIP/2.0 200 OK"] + kept + ["Content-Length: 0", "", ""]), answer=False)
    return head, body


def check_notify(phone, who, waiting, voice):
    head, body = receive_request(phone)
    check(head.startswith("NOTIFY "), "%s got no NOTIFY but %s" % (who, head.split("\r\n")[0]))
    check(re.search(r"^Event: *message-summary", head, re.M | re.I), "%s's NOTIFY has no message-summary event" % who)
    check(re.search(r"^Content-Type: *application/simple-message-summary", head, re.M | re.I),
          "%s's NOTIFY is no message summary" % who)
    check(re.search(r"^Subscription-State: *active", head, re.M | re.I), "%s's NOTIFY is not active" % who)
    check(re.search(r"^Messages-Waiting: *%s" % waiting, body, re.M) and ("Voice-Message: " + voice) in body,
          "%s was told %r" % (who, body))


def await_control(gateway, control, line, pattern):
    """What the control socket answers line once the answer matches
    pattern, within NOTIFY_LIMIT_S."""
    deadline = time.monotonic() + NOTIFY_LIMIT_S
    while True:
        answer = ask_control(control, line)
        if re.search(pattern, answer, re.M):
            return answer
        check(time.monotonic() < deadline, "%r answered %r, not %r; %s" % (line, answer, pattern, gateway.errors()))
        time.sleep(0.2)



def explicit_subscription_is_relayed_to_every_phone(program, work, emulator):
    # The message server starts once the phones are registered: until then
    # the gateway's SUBSCRIBE goes unanswered, and a retransmission or the
    # retry a second after reaches it, so that its NOTIFY finds the phones
    # there and is relayed when it arrives rather than at registration.
    notifier_port = free_port()
    control = os.path.join(work, "explicit.control")
    script = write_script(work, "explicit", BASE_SCRIPT +
                          "face example.com alice message-subscription mwi-notifier set 127.0.0.1:%d\n" % notifier_port)
    # Relayed calls (the default) run libre's session layer on the stack
    # too, whose listener the in-dialog NOTIFY passes on its way.
    gateway = Gateway(program, emulator, work, "explicit", [script], ["--calls", "relay", "--control", control])
    notifier = None
    phones = []
    try:
        udp = Phone(gateway.port)
        phones.append(udp)
        register(udp, "alice")
        tcp = StreamPhone(gateway.port, "tcp")
        phones.append(tcp)
        register(tcp, "alice", "tcp")
        notifier = Sipp(work, "explicit-notifier", NOTIFIER_XML, ["-i", "127.0.0.1", "-p", str(notifier_port), "-m", "1"])
        check_notify(udp, "the phone over UDP", "yes", "2/8 (0/0)")
        check_notify(tcp, "the phone over TCP", "yes", "2/8 (0/0)")
        late = Phone(gateway.port)
        phones.append(late)
        register(late, "alice")
        check_notify(late, "the phone registered afterwards", "yes", "2/8 (0/0)")
        await_control(gateway, control, "mwi",
                      r"^example\.com/alice explicit subscribed notifier 127\.0\.0\.1:%d messages yes voice 2/8 \(0/0\)$"
                      % notifier_port)
        await_control(gateway, control, "statistics", r"^message waiting: faces 1, subscribed 1, NOTIFYs relayed 5$")
        gateway.stop()
        check(notifier.succeeded(), "the message server did not see the subscription through to its end "
                                    "(Expires: 0 at shut-down): " + notifier.errors() + gateway.errors())
        # libre lets the stack go only once the final NOTIFY has ended the
        # subscription; else it reports the stack's sockets still in use.
        check(" in use" not in gateway.errors(), "the subscription outlived the shut-down: " + gateway.errors())
        credentials = notifier.logged()
        check(len(credentials) == 1 and
              logged_digest_is_right(credentials[0], "SUBSCRIBE", ACCOUNT, "sip:alice@127.0.0.1:%d" % notifier_port),
              "the message server did not get alice's outbound credentials: %s" % credentials)
    finally:
        gateway.kill()
        if notifier:
            notifier.kill()
        for phone in phones:
            phone.close()


def redirected_subscription_goes_to_the_contact(program, work, emulator):
    # alice's server moved her mailbox; bob's two servers name each other,
    # and the second move is his subscription's failure.
    moved_port = free_port()
    notifier_port = free_port()
    ping_port = free_port()
    pong_port = free_port()
    control = os.path.join(work, "moved.control")
    script = write_script(work, "moved", BASE_SCRIPT +
                          "face example.com alice message-subscription mwi-notifier set 127.0.0.1:%d\n"
                          "identity example.com bob create identity\n"
                          "identity example.com bob face message-subscription create\n"
                          "face example.com bob message-subscription mwi-subscription-mode set explicit\n"
                          "face example.com bob message-subscription retry-timeout-on-client-error set 600\n"
                          "face example.com bob message-subscription mwi-notifier set 127.0.0.1:%d\n"
                          % (moved_port, ping_port))
    servers = [Sipp(work, "moved-notifier", NOTIFIER_XML, ["-i", "127.0.0.1", "-p", str(notifier_port), "-m", "1"])]
    for name, port, target in [("moved-first", moved_port, notifier_port), ("moved-ping", ping_port, pong_port),
                               ("moved-pong", pong_port, ping_port)]:
        servers.append(Sipp(work, name, os.path.join(HERE, "moved.xml"), ["-i", "127.0.0.1", "-p", str(port), "-m", "1",
                                                      "-key", "target", "127.0.0.1:%d" % target]))
    notifier, moved, ping, pong = servers
    gateway = Gateway(program, emulator, work, "moved", [script], ["--control", control])
    try:
        check(moved.succeeded(), "the first message server was not asked: " + moved.errors())
        await_control(gateway, control, "mwi",
                      r"^example\.com/alice explicit subscribed notifier 127\.0\.0\.1:%d learnt messages yes" % notifier_port)
        check(ping.succeeded() and pong.succeeded(), "bob's servers were not asked once each: " + ping.errors() +
              pong.errors())
        await_control(gateway, control, "mwi",
                      r"^example\.com/bob explicit failed notifier 127\.0\.0\.1:%d messages unknown$" % ping_port)
        check(re.search(r"subscription of example\.com/bob at 127\.0\.0\.1:%d failed \(302\)" % pong_port,
                        gateway.errors()), "the second move was not bob's failure: " + gateway.errors())
        gateway.stop()
        check(notifier.succeeded(), "the subscription did not move to the Contact's message server: " +
              notifier.errors() + gateway.errors())
    finally:
        gateway.kill()
        for server in servers:
            server.kill()


def changed_face_subscribes_anew(program, work, emulator):
    # A proxy added over the control socket: the subscription ends at the
    # message server and is made again through the proxy (a second message
    # server here, which takes whatever reaches it).
    first_port = free_port()
    proxy_port = free_port()
    control = os.path.join(work, "changed.control")
    script = write_script(work, "changed", BASE_SCRIPT +
                          "face example.com alice message-subscription mwi-notifier set 127.0.0.1:%d\n" % first_port)
    first = Sipp(work, "changed-first", NOTIFIER_XML, ["-i", "127.0.0.1", "-p", str(first_port), "-m", "1"])
    proxy = Sipp(work, "changed-proxy", NOTIFIER_XML, ["-i", "127.0.0.1", "-p", str(proxy_port), "-m", "1"])
    gateway = Gateway(program, emulator, work, "changed", [script], ["--control", control])
    try:
        await_control(gateway, control, "mwi", r"^example\.com/alice explicit subscribed .* messages yes")
        ask_control(control, "face example.com alice message-subscription proxy insert 0 127.0.0.1:%d loose" % proxy_port)
        check(first.succeeded(), "the subscription did not end when the face changed: " + first.errors())
        await_control(gateway, control, "mwi", r"^example\.com/alice explicit subscribed .* messages yes")
        gateway.stop()
        check(proxy.succeeded(), "the subscription was not made again through the proxy: " + proxy.errors() +
              gateway.errors())
    finally:
        gateway.kill()
        first.kill()
        proxy.kill()


def notify(phones, gateway, source, body, expected):
    """An out-of-dialog NOTIFY for bob from a message server at source,
    which must be answered expected."""
    server = Phone(gateway.port, address=source)
    phones.append(server)
    text = server.build("NOTIFY", "sip:bob@127.0.0.1:%d" % gateway.port, "sip:bob@example.com", server.new_call_id(), 1,
                        ["Event: message-summary", "Subscription-State: active",
                         "Content-Type: application/simple-message-summary"])
    text = text.replace("Content-Length: 0\r\n\r\n", "Content-Length: %d\r\n\r\n%s" % (len(body), body))
    status = server.send(text).status
    check(status == expected, "a NOTIFY from %s got %d, not %d" % (source, status, expected))


def implicit_notifies_are_taken_from_the_notifier_only(program, work, emulator):
    script = write_script(work, "implicit", """location-service example.com create
location-service example.com domain insert 0 example.com
identity example.com bob create identity
identity example.com bob face registration-inbound create
identity example.com bob face message-subscription create
face example.com bob message-subscription mwi-subscription-mode set implicit
face example.com bob message-subscription mwi-notifier set 127.0.0.1:5999
""")
    control = os.path.join(work, "implicit.control")
    gateway = Gateway(program, emulator, work, "implicit", [script], ["--control", control])
    phones = []
    try:
        phone = Phone(gateway.port)
        phones.append(phone)
        register(phone, "bob")
        notify(phones, gateway, "127.0.0.2", "Messages-Waiting: yes\r\nVoice-Message: 9/9 (9/9)\r\n", 403)
        notify(phones, gateway, "127.0.0.1", "Messages-Waiting: no\r\nVoice-Message: 0/3 (0/0)\r\n", 200)
        # The refused NOTIFY, sent first, would have come first.
        check_notify(phone, "bob's phone", "no", "0/3 (0/0)")
        check(re.search(r"NOTIFY for example\.com/bob from 127\.0\.0\.2:\d+ refused", gateway.errors()),
              "no line for the refused NOTIFY: " + gateway.errors())
        await_control(gateway, control, "mwi",
                      r"^example\.com/bob implicit implicit notifier 127\.0\.0\.1:5999 messages no voice 0/3 \(0/0\)$")
        # The message server moves: the gateway follows the face's change.
        ask_control(control, "face example.com bob message-subscription mwi-notifier set 127.0.0.2:5999")
        notify(phones, gateway, "127.0.0.1", "Messages-Waiting: yes\r\nVoice-Message: 1/3 (0/0)\r\n", 403)
        notify(phones, gateway, "127.0.0.2", "Messages-Waiting: yes\r\nVoice-Message: 1/3 (0/0)\r\n", 200)
        gateway.stop()
    finally:
        gateway.kill()
        for phone in phones:
            phone.close()


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit("usage: notifier.py GATEWAY WORK-DIR [EMULATOR...]")
    if subprocess.call(["sh", "-c", "command -v \"$0\" >/dev/null", SIPP]) != 0:
        print("SKIP: no SIPp")
        sys.exit(77)
    sys.exit(run([("explicit_subscription_is_relayed_to_every_phone", explicit_subscription_is_relayed_to_every_phone),
                  ("redirected_subscription_goes_to_the_contact", redirected_subscription_goes_to_the_contact),
                  ("changed_face_subscribes_anew", changed_face_subscribes_anew),
                  ("implicit_notifies_are_taken_from_the_notifier_only",
                   implicit_notifies_are_taken_from_the_notifier_only)],
                 sys.argv[1], sys.argv[2], sys.argv[3:]))
