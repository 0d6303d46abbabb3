#!/usr/bin/env bash
# The gateway operated while it serves, on loopback in a temporary
# directory:
#
#   run-operations.sh CASE GATEWAY CONSOLE SIPP WORK-DIR [EMULATOR...]
#
# operate:   the gateway serves operated.script with --control, --autosave
#            and --metrics; a watching console sees the registrations;
#            changes.script goes in over the socket (a subscriber added, an
#            alias removed, a password changed) and SIPp's phone.xml must
#            find each in effect; the autosaved file must rebuild the same
#            dump; /metrics, read by the Prometheus client's parser, must
#            count what SIPp did; removing a registered subscriber must drop
#            and count its binding.
# trunk:     the trunk of ../trunks/trunk.script added over the socket must
#            register with SIPp's carrier registrar (../trunks/carrier.xml),
#            and removed over the socket must unregister there.
# bad-input: bad-input.py's clients, then the gateway must still answer SIP.
#
# The gateway and the console run through EMULATOR when one is given; SIPp
# and Python run natively. Every wait is bounded; the gateway gets SIGTERM
# and must exit 0. What a failing run printed stays in WORK-DIR.
set -u

here=$(cd "$(dirname "$0")" && pwd)
case=$1
gateway=$2
console=$3
sipp=$4
work=$5
shift 5
emulator=("$@")
wait_limit=30
python=/usr/bin/python3

mkdir -p "$work"
cd "$work" || exit 1
rm -rf "$case" && mkdir "$case" && cd "$case" || exit 1

fail() {
  echo "FAIL ($case): $*" >&2
  for file in gateway.err gateway.out watch.out watch.err sipp.log *_errors.log; do
    [[ -s $file ]] && { echo "--- $file" >&2; tail -n 30 "$file" >&2; }
  done
  exit 1
}

gateway_pid=
watch_pid=
sipp_pid=
cleanup() {
  [[ -n $watch_pid ]] && kill -KILL "$watch_pid" 2>/dev/null
  [[ -n $sipp_pid ]] && kill -KILL "$sipp_pid" 2>/dev/null
  [[ -n $gateway_pid ]] && kill -KILL "$gateway_pid" 2>/dev/null
  exec 7>&- 2>/dev/null
}
trap cleanup EXIT

source "$here/../await-line.sh"

console() {
  timeout "$wait_limit" "${emulator[@]}" "$console" "$@"
}

# SIPp 3.6 answers only an MD5 first challenge, with its digest over the
# Request-URI only when told it (-auth_uri).
start_gateway() {
  "${emulator[@]}" "$gateway" --listen 127.0.0.1:0 --store none --calls redirect --control "$PWD/control.sock" --digest MD5 "$@" \
    >gateway.out 2>gateway.err &
  gateway_pid=$!
  await_line gateway.err "control socket" || fail "the gateway did not start"
  gateway_port=$(sed -n 's/.*listening on udp:127\.0\.0\.1:\([0-9]*\).*/\1/p' gateway.err)
}

stop_gateway() {
  kill -TERM "$gateway_pid"
  local status=0
  wait "$gateway_pid" || status=$?
  gateway_pid=
  ((status == 0)) || fail "the gateway exited with $status after SIGTERM"
  [[ ! -e control.sock ]] || fail "the control socket was left behind"
}

# run_sipp [SECONDS]: phone.xml once, for at most SECONDS (20).
run_sipp() {
  local limit=${1:-20}
  timeout $((limit + 5)) "$sipp" -sf "$here/phone.xml" -i 127.0.0.1 -timeout "${limit}s" -timeout_error \
    -nostdin -trace_err -m 1 -auth_uri example.com 127.0.0.1:"$gateway_port" >sipp.log 2>&1
}

case $case in
  operate)
    start_gateway --autosave "$PWD/autosaved.script" --metrics 127.0.0.1:0 "$here/operated.script"
    [[ $(stat -c %a control.sock) == 600 ]] || fail "the control socket is not mode 0600"
    metrics_url=$(sed -n 's#.*metrics on \(http://.*/metrics\)$#\1#p' gateway.err)

    # A second gateway on the same socket is refused while the first lives.
    "${emulator[@]}" "$gateway" --listen 127.0.0.1:0 --store none --calls redirect --control "$PWD/control.sock" "$here/operated.script" \
      >second.out 2>second.err && fail "a second gateway took a live control socket"
    grep -q "already listens on" second.err || fail "the second gateway gave no reason: $(cat second.err)"

    # The watcher: a console reading lines from a pipe held open here.
    mkfifo watch.in
    timeout 120 "${emulator[@]}" "$console" --connect control.sock - <watch.in >watch.out 2>watch.err &
    watch_pid=$!
    exec 7>watch.in
    echo "watch on" >&7

    console --connect control.sock "$here/changes.script" >changes.out 2>changes.err ||
      fail "changes.script failed: $(cat changes.err)"
    console --connect control.sock - >dump.out 2>dump.err <<<"dump" || fail "dump failed: $(cat dump.err)"
    # A failed line over the socket: the console's exit status and error line.
    status=0
    console --connect control.sock - >wrong.out 2>wrong.err <<<"identity example.com nobody remove" || status=$?
    ((status == 1)) || fail "a failed line over the socket exited $status"
    grep -q '^<stdin>:1:22: no configured identity "nobody"' wrong.err || fail "error line: $(cat wrong.err)"

    run_sipp || fail "SIPp's phone failed"
    echo "echo watched" >&7
    exec 7>&-
    wait "$watch_pid" || fail "the watching console failed: $(cat watch.err)"
    watch_pid=
    grep -q "^event: example.com/erin registered inbound$" watch.out || fail "the watcher saw no registration"
    grep -q "^event: example.com/alice registered inbound$" watch.out || fail "the watcher missed alice"

    # The bindings question: erin's contact, with what it came with.
    console --connect control.sock - >bindings.out 2>bindings.err <<<"bindings example.com erin" ||
      fail "bindings failed: $(cat bindings.err)"
    grep -Eq '^example.com/erin <sip:erin@127.0.0.1:[0-9]+> expires in (1[01][0-9]|120) s, Call-ID [^,]+, from udp:127.0.0.1:[0-9]+$' \
      bindings.out || fail "erin's binding is not shown: $(cat bindings.out)"

    # The autosave (at most a second after the change) rebuilds the dump.
    sleep 1.5
    printf 'dump\n' >dump.script
    console "$PWD/autosaved.script" dump.script >rebuilt.out 2>rebuilt.err || fail "the autosave does not run"
    diff <(sed -n '/^> dump$/,$p' rebuilt.out | tail -n +2) <(tail -n +2 dump.out) >dump.diff ||
      fail "the autosaved configuration dumps differently: $(head -40 dump.diff)"

    "$python" "$here/check-metrics.py" "$metrics_url" \
      'location_gateway_requests_total{method="REGISTER",code="401"}=3' \
      'location_gateway_requests_total{method="REGISTER",code="403"}=1' \
      'location_gateway_requests_total{method="REGISTER",code="200"}=2' \
      'location_gateway_requests_total{method="MESSAGE",code="404"}=1' \
      'location_gateway_failed_authentications_total=1' \
      'location_gateway_bindings=2' 'location_gateway_registered_contacts=2' \
      'location_gateway_bindings_dropped_total=0' || fail "the metrics do not count what SIPp did"

    # Removing a registered subscriber drops its binding and counts it.
    console --connect control.sock - >remove.out 2>remove.err <<<"identity example.com erin remove" ||
      fail "removing erin failed: $(cat remove.err)"
    "$python" "$here/check-metrics.py" "$metrics_url" 'location_gateway_bindings=1' \
      'location_gateway_registered_contacts=1' 'location_gateway_bindings_dropped_total=1' ||
      fail "erin's binding was not dropped"
    stop_gateway
    ;;
  trunk)
    start_gateway "$here/operated.script"
    # SIPp's registrar needs a port the trunk's proxy line can name.
    for attempt in 1 2 3 4 5; do
      port=$((20000 + RANDOM % 30000))
      timeout 60 "$sipp" -sf "$here/../trunks/carrier.xml" -i 127.0.0.1 -p "$port" -m 2 -timeout 50s \
        -timeout_error -nostdin -trace_err >sipp.log 2>&1 &
      sipp_pid=$!
      sleep 0.5
      kill -0 "$sipp_pid" 2>/dev/null && break
      wait "$sipp_pid"
      sipp_pid=
    done
    [[ -n $sipp_pid ]] || fail "SIPp found no free port"
    { grep -v '^location-service' "$here/../trunks/trunk.script"
      echo "face example.com trunk registration-outbound proxy insert 0 127.0.0.1:$port loose"; } >trunk.script
    console --connect control.sock trunk.script >trunk.out 2>trunk.err || fail "adding the trunk: $(cat trunk.err)"
    await_line gateway.err "trunk example.com/trunk registered at udp:127.0.0.1:$port" ||
      fail "the trunk added over the socket did not register"
    console --connect control.sock - >remove.out 2>remove.err <<<"identity example.com trunk remove" ||
      fail "removing the trunk: $(cat remove.err)"
    await_line gateway.err "trunk example.com/trunk unregistering" || fail "the removed trunk did not unregister"
    status=0
    wait "$sipp_pid" || status=$?
    sipp_pid=
    ((status == 0)) || fail "SIPp's registrar failed ($status): no unregistration"
    stop_gateway
    ;;
  bad-input)
    start_gateway "$here/operated.script"
    # A socket file left by a dead gateway is replaced, not refused.
    "$python" -c 'import socket,sys; s=socket.socket(socket.AF_UNIX); s.bind(sys.argv[1])' stale.sock
    "${emulator[@]}" "$gateway" --listen 127.0.0.1:0 --store none --calls redirect --control "$PWD/stale.sock" "$here/operated.script" \
      >stale.out 2>stale.err &
    stale_pid=$!
    await_line stale.err "control socket" || { kill -KILL $stale_pid; fail "a stale socket file was refused"; }
    kill -TERM $stale_pid
    wait $stale_pid || fail "the gateway on the stale socket did not exit cleanly"

    timeout 120 "$python" "$here/bad-input.py" "$PWD/control.sock" || fail "bad input on the control socket"
    # phone.xml's first request names erin, whom only changes.script adds:
    # challenged as a user of the domain, known or not.
    run_sipp 2
    await_line gateway.out '^REGISTER sip:example.com ".*" 401$' || fail "the gateway no longer answers SIP"
    stop_gateway
    ;;
  *)
    fail "no such case"
    ;;
esac
echo "PASS ($case)"
