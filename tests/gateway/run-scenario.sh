#!/usr/bin/env bash
# Runs one end-to-end scenario of location-gateway against SIPp on loopback:
#
#   run-scenario.sh FOLDER/NAME GATEWAY SIPP WORK-DIR [EMULATOR...]
#
# NAME's files are in FOLDER (the part of the gateway it checks):
# registrar/phone, registrar/retransmission: the gateway serves
#          subscribers.script; SIPp plays the phone of NAME.xml against it,
#          and the gateway's request lines must be exactly NAME.out.
# sip/protocol: the gateway serves protocol.script on IPv4 and IPv6
#          loopback, pinging NATed phones every second (a second one on
#          its port must refuse to start); SIPp plays
#          protocol.xml over each in turn, answering the pings (pong.xml),
#          and the gateway's request lines must be protocol.out twice,
#          GATEWAY standing for its address of each run; then a phone of
#          nat-ping.xml registers from behind NAT and leaves, and its
#          binding must be dropped for the pings it no longer answers, and
#          again over TCP, dropped when its connection closes.
# trunks/carrier: SIPp plays the carrier's registrar of carrier.xml; the
#          gateway serves trunk.script with SIPp's address added as the
#          proxy, must retry after the registrar's 503, report the trunk
#          registered there, and on SIGTERM unregister it.
# trunks/dns: SIPp plays the carrier's registrar of dns.xml, and dnsmasq
#          the DNS server that alone tells where it is (NAPTR, SRV and A
#          records for carrier.example); the gateway serves trunk.script and
#          by-name.script and asks only that server: the trunk must register
#          by name and keep the path open with an OPTIONS a second (new
#          calls to SIPp, which, held to one call, logs them unanswered),
#          and the lost trunk's unresolvable name be told once though
#          retried every second.
# trunks/address: SIPp plays the carrier's registrar of address.xml, whose
#          answers say the gateway's REGISTER came from elsewhere (Via
#          received and rport); the gateway serves address.script with
#          SIPp's address added as the registrar, must register the learnt
#          address in its place, and on SIGTERM unregister that one.
#
# The gateway runs through EMULATOR when one is given (qemu-user for a
# cross build); SIPp always runs natively. Every process is bounded in time,
# and the gateway always gets SIGTERM and must exit 0. What a failing run
# printed stays in WORK-DIR.
set -u

here=$(cd "$(dirname "$0")" && pwd)/$(dirname "$1")
scenario=$(basename "$1")
gateway=$2
sipp=$3
work=$4
shift 4
emulator=("$@")
# Start-up under an emulator is slow; a scenario itself takes seconds.
wait_limit=30
sipp_limit=20

mkdir -p "$work"
cd "$work" || exit 1
rm -f "$scenario".* "$scenario"_*.log

fail() {
  echo "FAIL ($scenario): $*" >&2
  for file in "$scenario".gateway.err "$scenario".sipp.log "$scenario"_*_errors.log; do
    [[ -s $file ]] && { echo "--- $file" >&2; tail -n 30 "$file" >&2; }
  done
  exit 1
}

gateway_pid=
sipp_pid=
dns_pid=
cleanup() {
  [[ -n $gateway_pid ]] && kill -KILL "$gateway_pid" 2>/dev/null
  [[ -n $sipp_pid ]] && kill -KILL "$sipp_pid" 2>/dev/null
  [[ -n $dns_pid ]] && kill -KILL "$dns_pid" 2>/dev/null
}
trap cleanup EXIT

source "$(cd "$(dirname "$0")" && pwd)/await-line.sh"

# Starts the gateway on a free IPv4 loopback port, gateway_port, and with
# "--listen [::1]:0" among the arguments also an IPv6 one, gateway_port6.
start_gateway() {
  "${emulator[@]}" "$gateway" --listen 127.0.0.1:0 --store none --calls redirect "$@" >"$scenario".gateway.out 2>"$scenario".gateway.err &
  gateway_pid=$!
  await_line "$scenario".gateway.err "listening on " || fail "the gateway did not start"
  gateway_port=$(sed -n 's/.* udp:127\.0\.0\.1:\([0-9]*\).*/\1/p' "$scenario".gateway.err)
  gateway_port6=$(sed -n 's/.* udp:\[::1\]:\([0-9]*\).*/\1/p' "$scenario".gateway.err)
}

stop_gateway() {
  kill -TERM "$gateway_pid"
  local status=0
  wait "$gateway_pid" || status=$?
  gateway_pid=
  ((status == 0)) || fail "the gateway exited with $status after SIGTERM"
}

# SIPp's own address; ::1 for IPv6.
sipp_address=127.0.0.1
run_sipp() {
  timeout $((sipp_limit + 5)) "$sipp" -sf "${sipp_scenario:-$here/$scenario.xml}" -i "$sipp_address" \
    -timeout "${sipp_limit}s" \
    -timeout_error -nostdin -trace_err "$@" >"$scenario".sipp.log 2>&1
}

# Starts SIPp as the carrier's registrar on a port the gateway's script or
# DNS can name, in port: tries a few random ones, since one may be taken.
# Arguments: SIPp's.
start_registrar() {
  for attempt in 1 2 3 4 5; do
    port=$((20000 + RANDOM % 30000))
    run_sipp "$@" -p "$port" &
    sipp_pid=$!
    sleep 0.5
    kill -0 "$sipp_pid" 2>/dev/null && return 0
    wait "$sipp_pid"
    sipp_pid=
  done
  fail "SIPp found no free port"
}

# Waits for SIPp's registrar to end its calls; it must pass.
await_registrar() {
  local status=0
  wait "$sipp_pid" || status=$?
  sipp_pid=
  ((status == 0)) || fail "SIPp's registrar failed ($status)"
}

case $scenario in
  phone | retransmission)
    # SIPp 3.6 answers the first challenge and knows MD5 only; its digest
    # uri is the address it sends to unless told the Request-URI.
    start_gateway --digest MD5 "$here/subscribers.script"
    run_sipp -m 1 -auth_uri example.com 127.0.0.1:"$gateway_port" || fail "SIPp's phone failed"
    stop_gateway
    diff -u "$here/$scenario.out" "$scenario".gateway.out >"$scenario".diff || fail "request lines differ: $(cat "$scenario".diff)"
    ;;
  protocol)
    # A machine without IPv6 on loopback (a container may have none) runs
    # the IPv4 half only, and says so.
    ipv6=()
    if grep -qs '^0\{31\}1 ' /proc/net/if_inet6; then
      ipv6=(--listen "[::1]:0")
    else
      echo "no IPv6 loopback: the protocol scenario over IPv4 only" >&2
    fi
    start_gateway "${ipv6[@]}" --nat-ping 1 "$here/protocol.script"
    # A second gateway on the same port must stop, naming the listener.
    status=0
    timeout "$wait_limit" "${emulator[@]}" "$gateway" --listen 127.0.0.1:"$gateway_port" --store none --calls redirect "$here/protocol.script" \
      >/dev/null 2>"$scenario".taken.err || status=$?
    ((status == 1)) && grep -q "cannot listen on udp:127.0.0.1:$gateway_port: " "$scenario".taken.err ||
      fail "a taken port did not stop the start ($status)"
    run_sipp -m 1 -oocsf "$here/pong.xml" -deadcall_wait 0 127.0.0.1:"$gateway_port" || fail "SIPp failed over IPv4"
    sed "s/GATEWAY/127.0.0.1:$gateway_port/g" "$here/protocol.out" >"$scenario".expected
    if ((${#ipv6[@]})); then
      [[ -n $gateway_port6 ]] || fail "the gateway does not listen on [::1]"
      sipp_address=::1
      run_sipp -m 1 -oocsf "$here/pong.xml" -deadcall_wait 0 "[::1]:$gateway_port6" || fail "SIPp failed over IPv6"
      sed "s/GATEWAY/[::1]:$gateway_port6/g" "$here/protocol.out" >>"$scenario".expected
    fi
    sipp_address=127.0.0.1
    sipp_scenario=$here/nat-ping.xml run_sipp -m 1 127.0.0.1:"$gateway_port" || fail "SIPp failed to register bob"
    echo "REGISTER sip:example.com example.com/bob 200" >>"$scenario".expected
    await_line "$scenario".gateway.err "example.com/bob: <sip:bob@10.0.0.2:5060> dropped, 3 NAT pings unanswered" ||
      fail "the phone that left was not dropped"
    sipp_scenario=$here/nat-ping.xml run_sipp -m 1 -t t1 127.0.0.1:"$gateway_port" ||
      fail "SIPp failed to register bob over TCP"
    echo "REGISTER sip:example.com example.com/bob 200" >>"$scenario".expected
    await_line "$scenario".gateway.err "example.com/bob: <sip:bob@10.0.0.2:5060> dropped, its connection closed" ||
      fail "the phone whose connection closed was not dropped"
    stop_gateway
    diff -u "$scenario".expected "$scenario".gateway.out >"$scenario".diff || fail "request lines differ: $(cat "$scenario".diff)"
    ;;
  carrier)
    start_registrar -m 2
    echo "face example.com trunk registration-outbound proxy insert 0 127.0.0.1:$port loose" >"$scenario".proxy.script
    start_gateway "$here/trunk.script" "$scenario".proxy.script
    await_line "$scenario".gateway.err "trunk example.com/trunk registered at udp:127.0.0.1:$port for 300 s" ||
      fail "the trunk did not register"
    grep -q "trunk example.com/trunk failed to register (503), retrying in 1 s" "$scenario".gateway.err ||
      fail "the trunk did not retry after the server error"
    stop_gateway
    grep -q "trunk example.com/trunk unregistering" "$scenario".gateway.err || fail "the trunk was not unregistered"
    await_registrar
    ;;
  address)
    start_registrar -m 1
    echo "face example.com trunk registration-outbound registrar set 127.0.0.1:$port" >"$scenario".registrar.script
    start_gateway "$here/address.script" "$scenario".registrar.script
    await_line "$scenario".gateway.err "trunk example.com/trunk registered at udp:127.0.0.1:$port for 300 s" ||
      fail "the trunk did not register"
    stop_gateway
    await_registrar
    ;;
  dns)
    start_registrar -m 1 -trace_msg -message_file "$scenario".messages.log
    # The DNS server on a free loopback port, knowing nothing but the
    # carrier; as for SIPp, a few random ports.
    for attempt in 1 2 3 4 5; do
      dns_port=$((20000 + RANDOM % 30000))
      "${DNSMASQ:-dnsmasq}" --keep-in-foreground --conf-file=/dev/null --no-resolv --no-hosts --pid-file= --user= \
        --listen-address=127.0.0.1 --bind-interfaces --port="$dns_port" --local=/example/ \
        --naptr-record=carrier.example,10,10,S,SIP+D2U,,_sip._udp.carrier.example \
        --srv-host=_sip._udp.carrier.example,registrar.carrier.example,"$port" \
        --host-record=registrar.carrier.example,127.0.0.1 >"$scenario".dns.log 2>&1 &
      dns_pid=$!
      sleep 0.5
      kill -0 "$dns_pid" 2>/dev/null && break
      wait "$dns_pid"
      dns_pid=
    done
    [[ -n $dns_pid ]] || fail "dnsmasq found no free port"
    start_gateway --dns-server 127.0.0.1:"$dns_port" "$here/trunk.script" "$here/by-name.script"
    await_line "$scenario".gateway.err "trunk example.com/trunk registered at udp:127.0.0.1:$port for 300 s" ||
      fail "the trunk did not register by name"
    lost="trunk example.com/lost failed to register (nowhere.example does not resolve), retrying in 1 s"
    await_line "$scenario".gateway.err "$lost" || fail "the unresolvable name was not told"
    # Two more retries at least.
    sleep 2.5
    stop_gateway
    (($(grep -c -F "$lost" "$scenario".gateway.err) == 1)) || fail "the unresolvable name was told more than once"
    await_registrar
    (($(grep -c "^OPTIONS sip:carrier.example SIP/2.0" "$scenario".messages.log) >= 1)) ||
      fail "the trunk sent no keep-alive"
    kill -TERM "$dns_pid"
    wait "$dns_pid"
    dns_pid=
    ;;
  *)
    fail "no such scenario"
    ;;
esac
echo "PASS ($scenario)"
