#!/usr/bin/env bash
# Runs one end-to-end scenario of location-gateway against SIPp on loopback:
#
#   run-scenario.sh FOLDER/NAME GATEWAY SIPP WORK-DIR [EMULATOR...]
#
# NAME's files are in FOLDER (the part of the gateway it checks):
# registrar/phone, registrar/retransmission: the gateway serves
#          subscribers.script; SIPp plays the phone of NAME.xml against it,
#          and the gateway's request lines must be exactly NAME.out.
# trunks/carrier: SIPp plays the carrier's registrar of carrier.xml; the
#          gateway serves trunk.script with SIPp's address added as the
#          proxy, must retry after the registrar's 503, report the trunk
#          registered there, and on SIGTERM unregister it.
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
cleanup() {
  [[ -n $gateway_pid ]] && kill -KILL "$gateway_pid" 2>/dev/null
  [[ -n $sipp_pid ]] && kill -KILL "$sipp_pid" 2>/dev/null
}
trap cleanup EXIT

# Waits until file holds a line matching pattern; false after wait_limit s.
await_line() {
  local file=$1 pattern=$2 tenths=$((wait_limit * 10))
  while ((tenths-- > 0)); do
    grep -q -- "$pattern" "$file" 2>/dev/null && return 0
    [[ -n $gateway_pid ]] && ! kill -0 "$gateway_pid" 2>/dev/null && return 1
    sleep 0.1
  done
  return 1
}

start_gateway() {
  "${emulator[@]}" "$gateway" --listen 127.0.0.1:0 "$@" >"$scenario".gateway.out 2>"$scenario".gateway.err &
  gateway_pid=$!
  await_line "$scenario".gateway.err "listening on udp:" || fail "the gateway did not start"
  gateway_port=$(sed -n 's/.*listening on udp:127\.0\.0\.1:\([0-9]*\).*/\1/p' "$scenario".gateway.err)
}

stop_gateway() {
  kill -TERM "$gateway_pid"
  local status=0
  wait "$gateway_pid" || status=$?
  gateway_pid=
  ((status == 0)) || fail "the gateway exited with $status after SIGTERM"
}

run_sipp() {
  timeout $((sipp_limit + 5)) "$sipp" -sf "$here/$scenario.xml" -i 127.0.0.1 -timeout "${sipp_limit}s" \
    -timeout_error -nostdin -trace_err "$@" >"$scenario".sipp.log 2>&1
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
  carrier)
    # SIPp needs a port the gateway's script can name: try a few random
    # ones, since one may be taken.
    for attempt in 1 2 3 4 5; do
      port=$((20000 + RANDOM % 30000))
      run_sipp -m 2 -p "$port" &
      sipp_pid=$!
      sleep 0.5
      kill -0 "$sipp_pid" 2>/dev/null && break
      wait "$sipp_pid"
      sipp_pid=
    done
    [[ -n $sipp_pid ]] || fail "SIPp found no free port"
    echo "face example.com trunk registration-outbound proxy insert 0 127.0.0.1:$port loose" >"$scenario".proxy.script
    start_gateway "$here/trunk.script" "$scenario".proxy.script
    await_line "$scenario".gateway.err "trunk example.com/trunk registered at udp:127.0.0.1:$port for 300 s" ||
      fail "the trunk did not register"
    grep -q "trunk example.com/trunk failed to register (503), retrying in 1 s" "$scenario".gateway.err ||
      fail "the trunk did not retry after the server error"
    stop_gateway
    grep -q "trunk example.com/trunk unregistering" "$scenario".gateway.err || fail "the trunk was not unregistered"
    status=0
    wait "$sipp_pid" || status=$?
    sipp_pid=
    ((status == 0)) || fail "SIPp's registrar failed ($status)"
    ;;
  *)
    fail "no such scenario"
    ;;
esac
echo "PASS ($scenario)"
