#!/usr/bin/env bash
# The binding store end to end, SIPp as the phones, on loopback:
#
#   run-store.sh restart|shared GATEWAY SIPP WORK-DIR [EMULATOR...]
#
# restart: phones register with a gateway on an SQLite file; the gateway is
#          killed (SIGKILL) and started again on the same file with one
#          identity gone from its configuration. Calls to a name, an alias
#          and a "DEFAULT" user are redirected to their phones, a binding
#          that expired meanwhile is not back, and the binding of the
#          identity gone is deleted with one log line.
# shared:  two gateways on one PostgreSQL server that the test starts
#          itself: registered at A, redirected at B; unregistered at B,
#          unavailable at A; registered at A while the server is stopped,
#          redirected at B once the server is back. B started again without
#          alice, or told to remove her over its control socket, leaves her
#          binding at A. A binding bound to its TCP flow
#          (not stored) survives B's change to its identity. A Call-ID that
#          is not UTF-8 is refused, and a row the database refuses is
#          dropped while the rows after it are written.
#
# The gateway runs through EMULATOR when one is given; SIPp and PostgreSQL
# always run natively. The console (LOCATION_CONSOLE, by default the one
# built beside the gateway) operates a gateway over its control socket. Every process is bounded in time and stopped by its
# PID; what a failing run printed stays in WORK-DIR.
set -u

here=$(cd "$(dirname "$0")" && pwd)
scenario=$1
gateway=$2
sipp=$3
work=$4
shift 4
emulator=("$@")
console=${LOCATION_CONSOLE:-$(dirname "$gateway")/../tools/console/location-console}
subscribers=$here/../registrar/subscribers.script
wait_limit=30

mkdir -p "$work"
cd "$work" || exit 1
rm -rf "$scenario" && mkdir "$scenario" && cd "$scenario" || exit 1
source "$here/postgres.sh"

declare -A pids ports tcp_ports
fail() {
  echo "FAIL ($scenario): $*" >&2
  for file in *.err sipp.log; do
    [[ -s $file ]] && { echo "--- $file" >&2; tail -n 20 "$file" >&2; }
  done
  exit 1
}
cleanup() {
  local name
  for name in "${!pids[@]}"; do kill -KILL "${pids[$name]}" 2>/dev/null; done
  postgres_stop
}
trap cleanup EXIT

source "$here/../await-line.sh"

# start_gateway NAME STORE [SCRIPT...]: its port in ports[NAME].
start_gateway() {
  local name=$1 store=$2
  shift 2
  # A restart's log is its own; the earlier one stays beside it.
  [[ -e $name.err ]] && mv "$name.err" "$name.before.err"
  # SIPp 3.6 answers only an MD5 challenge (see run-scenario.sh).
  "${emulator[@]}" "$gateway" --listen 127.0.0.1:0 --store "$store" --calls redirect --digest MD5 "$subscribers" "$@" \
    >"$name.out" 2>"$name.err" &
  pids[$name]=$!
  await_line "$name.err" "listening on udp:" || fail "gateway $name did not start"
  ports[$name]=$(sed -n 's/.* udp:127\.0\.0\.1:\([0-9]*\).*/\1/p' "$name.err" | tail -n 1)
  tcp_ports[$name]=$(sed -n 's/.* tcp:127\.0\.0\.1:\([0-9]*\).*/\1/p' "$name.err" | tail -n 1)
}

# stop_gateway NAME SIGNAL: with TERM it must exit 0.
stop_gateway() {
  local name=$1 signal=$2 status=0
  kill -"$signal" "${pids[$name]}"
  wait "${pids[$name]}" 2>/dev/null || status=$?
  unset "pids[$name]"
  [[ $signal != TERM ]] || ((status == 0)) || fail "gateway $name exited with $status after SIGTERM"
}

# sipp_run SCENARIO GATEWAY-NAME USER [OPTION...]
sipp_run() {
  local file=$1 name=$2 user=$3
  shift 3
  timeout 25 "$sipp" -sf "$here/$file.xml" -i 127.0.0.1 -m 1 -timeout 20s -timeout_error -nostdin \
    -s "$user" "$@" 127.0.0.1:"${ports[$name]}" >>sipp.log 2>&1
}

# register GATEWAY-NAME USER PASSWORD EXPIRES CONTACT-PORT: SIPp sends from
# the contact's own port, so that the gateway sees no NAT to correct for.
register() {
  sipp_run register "$1" "$2" -au "$2" -ap "$3" -auth_uri example.com -key expires "$4" -key contact_port "$5" \
    -p "$5" ||
    fail "$2 could not register at $1 for $4 s"
}
# Contact ports, one a phone: random, since a fixed one may be taken.
base=$((20000 + RANDOM % 20000))
# moved GATEWAY-NAME USER CONTACT: a call to USER gets 302 to CONTACT alone.
moved() {
  rm -f moved.log
  sipp_run moved "$1" "$2" -trace_logs -log_file moved.log &&
    [[ $(grep -c "redirected to" moved.log) == 1 ]] && grep -qx "redirected to $3" moved.log
}
unavailable() { sipp_run unavailable "$1" "$2" || fail "a call to $2 at $1 was not answered 480"; }
# phone PORT TRANSPORT USER PASSWORD [EXPIRES CONTACT [CALL-ID]]: see phone.py.
phone() { timeout 25 /usr/bin/python3 "$here/phone.py" "$@" 2>>phone.err; }
# eventually_moved GATEWAY-NAME USER CONTACT: within 10 s.
eventually_moved() {
  local attempt
  for attempt in $(seq 10); do
    moved "$@" && return 0
    sleep 1
  done
  return 1
}

case $scenario in
  restart)
    store=$PWD/bindings.sqlite
    start_gateway a "$store"
    register a alice secret 600 $((base + 1))
    register a dave welcome 600 $((base + 2))
    register a bob welcome 600 $((base + 3))
    register a carol welcome 3 $((base + 4))
    # Written behind within 100 ms (an emulated gateway takes longer);
    # killed well inside carol's 3 s, started again after them.
    sleep 1
    stop_gateway a KILL
    sleep 3
    echo "identity example.com bob remove" >without-bob.script
    start_gateway a "$store" without-bob.script
    grep -q "1 stored binding of identities no longer configured deleted" a.err ||
      fail "the binding of the identity removed was not reported deleted"
    for call in alice:alice:$((base + 1)) alice.smith:alice:$((base + 1)) dave:dave:$((base + 2)); do
      IFS=: read -r user phone port <<<"$call"
      moved a "$user" "sip:$phone@127.0.0.1:$port" || fail "a call to $user was not redirected to $phone"
    done
    unavailable a carol
    stop_gateway a TERM
    ;;
  shared)
    postgres_start || fail "PostgreSQL did not start: $(tail -n 5 "$postgres_dir"/*.log 2>/dev/null)"
    start_gateway a "$postgres_uri"
    start_gateway b "$postgres_uri"
    register a alice secret 600 $((base + 1))
    sleep 1
    moved b alice sip:alice@127.0.0.1:$((base + 1)) || fail "B did not redirect to the phone registered at A"
    register b alice secret 0 $((base + 1))
    sleep 1
    unavailable a alice
    postgres_pause || fail "PostgreSQL did not stop"
    register a alice secret 600 $((base + 1))
    postgres_resume || fail "PostgreSQL did not start again"
    # Both reconnect within 5 s of their last attempt, then catch up.
    learnt=false
    for attempt in $(seq 20); do
      moved b alice sip:alice@127.0.0.1:$((base + 1)) && { learnt=true; break; }
      sleep 1
    done
    $learnt || fail "B did not learn the registration made at A while the server was away"
    grep -q "is back; writing 1 queued changes" a.err || fail "A did not write its queued change"

    # A configuration that differs between gateways deletes nothing.
    stop_gateway b TERM
    echo "identity example.com alice remove" >without-alice.script
    start_gateway b "$postgres_uri" without-alice.script
    ! grep -q "no longer configured deleted" b.err || fail "B deleted bindings of identities it lacks"
    sleep 1
    moved a alice sip:alice@127.0.0.1:$((base + 1)) || fail "A lost alice when B started without her"
    stop_gateway b TERM
    start_gateway b "$postgres_uri" --control "$PWD/b.sock"
    await_line b.err "control socket" || fail "B did not open its control socket"
    timeout "$wait_limit" "${emulator[@]}" "$console" --connect "$PWD/b.sock" - <<<"identity example.com alice remove" \
      >remove.out 2>remove.err || fail "B could not remove alice: $(cat remove.err)"
    sleep 1
    moved a alice sip:alice@127.0.0.1:$((base + 1)) || fail "A lost alice when B's configuration dropped her"

    # carol's TCP flow lives at A only; B's change to carol leaves it there.
    flow="<sip:carol@127.0.0.1:PORT;transport=tcp>;+sip.instance=\"<urn:uuid:00000000-0000-0000-0000-0000000000c0>\";reg-id=1"
    [[ $(phone "${tcp_ports[a]}" tcp carol welcome 600 "$flow" | head -n 1) == 200 ]] ||
      fail "carol could not register over TCP at A"
    register b carol welcome 600 $((base + 5))
    sleep 1
    phone "${ports[a]}" udp carol welcome >carol-at-a.out || fail "A did not answer carol's query"
    grep -q ":$((base + 5))>" carol-at-a.out || fail "A did not learn carol's binding at B"
    grep -q "transport=tcp" carol-at-a.out || fail "A dropped carol's TCP flow on B's change"

    # Bytes the database cannot hold are refused at the SIP side; a row it
    # refuses all the same is dropped, and the store goes on writing.
    [[ $(phone "${ports[a]}" udp dave welcome 600 "<sip:dave@127.0.0.1:$((base + 6))>" 'bad-\xff-call' |
      head -n 1) == 400 ]] || fail "a Call-ID that is not UTF-8 was not refused"
    postgres_sql "ALTER TABLE bindings ADD CONSTRAINT no_bob CHECK (identity <> 'bob')" ||
      fail "the constraint could not be added"
    register a bob welcome 600 $((base + 7))
    register a dave welcome 600 $((base + 6))
    eventually_moved b dave sip:dave@127.0.0.1:$((base + 6)) || fail "A stopped writing after a refused row"
    grep -q "the change to example.com/bob <.*> is dropped" a.err || fail "A did not log the row it dropped"
    (($(grep -c "is back;" a.err) == 1)) || fail "A took a refused row for the store going away"
    stop_gateway a TERM
    stop_gateway b TERM
    ;;
  *)
    fail "no such scenario"
    ;;
esac
echo "PASS ($scenario)"
