#!/usr/bin/env bash
# The gateway under a registration storm, beside Kamailio, in one command:
# builds location-gateway (Release, in BUILD, by default
# build-gateway-bench/), writes SUBSCRIBERS (default 100,000) subscribers of
# one location service inheriting a "DEFAULT" group with inbound
# authentication (generate.sh), and has SIPp, on loopback, drive first the
# gateway and then Kamailio (kamailio.cfg: the same work, in-memory
# registrar with digest and 302 to the registered contact, 2 workers), one
# after the other with the same scenarios and users:
#   1. register every subscriber with digest authentication (register.xml:
#      REGISTER, 401, REGISTER with credentials, 200): the storm;
#   2. the same phones refresh at the rate the storm held: memory must not
#      grow;
#   3. call every subscriber once (invite.xml: INVITE, 302, ACK).
# Phases 1 and 3 first find the highest rate the server sustains: short
# probes (PROBE_SECONDS each) at the rising RATES, each passing only when
# every call succeeds, no request is retransmitted and SIPp keeps 90% of the
# rate. The whole phase then runs at the best rate, and a quarter slower
# while a full run fails, at most four times. Every SIPp run is bounded in
# calls and time; each server is stopped at the end or on any failure.
#
# CPU is user and system time of every process of the server (from /proc),
# over the full run of the phase; memory is the proportional set size (PSS)
# of all its processes. The gateway runs with --statistics for the share of
# its CPU spent in the library's calls. TARGETS (default "gateway kamailio")
# picks the servers. Prints, and writes to BUILD/bench-gateway/report.txt,
# the figures side by side with their ratios; exits with 1 when a phase was
# not sustained at any rate tried.
#
# STORE picks where the gateway keeps its bindings: sqlite (the default: a
# file in the work directory), postgresql (a server the run starts itself,
# as the store's tests do) or none. With a store, the gateway is started
# once more at the end on the bindings it stored, and the report gives the
# time it took to restore them.
set -euo pipefail
root="$(cd "$(dirname "$0")/../.." && pwd)"
here="$root/bench/gateway"
subscribers=${SUBSCRIBERS:-100000}
read -r -a rates <<<"${RATES:-500 1000 2000 4000 6000 8000 10000 12000 15000 20000}"
read -r -a targets <<<"${TARGETS:-gateway kamailio}"
probe_seconds=${PROBE_SECONDS:-3}
build=${BUILD:-"$root/build-gateway-bench"}
work="$build/bench-gateway"

bash "$root/tools/install-missing-packages.sh" cmake make g++ pkg-config libre2-dev libre-dev libssl-dev sip-tester \
  kamailio libsqlite3-dev libpq-dev postgresql >&2
cmake -S "$root" -B "$build" -DCMAKE_BUILD_TYPE=Release -DLS_BUILD_TESTS=OFF -DLS_BUILD_GATEWAY=ON >/dev/null
cmake --build "$build" --target location-gateway -j "${JOBS:-2}" >/dev/null
gateway="$build/gateway/location-gateway"
kamailio_modules=$(dirname "$(find /usr/lib -path '*kamailio/modules/registrar.so' | head -n 1)")

rm -rf "$work"
mkdir -p "$work"
cd "$work"
bash "$here/generate.sh" "$subscribers" .

source "$root/tests/gateway/store/postgres.sh"
case ${STORE:-sqlite} in
  sqlite) store=$work/bindings.sqlite ;;
  none) store=none ;;
  postgresql)
    postgres_start || { echo "PostgreSQL did not start" >&2; exit 1; }
    store=$postgres_uri
    ;;
  *) echo "STORE is sqlite, postgresql or none" >&2; exit 2 ;;
esac

ticks_per_second=$(getconf CLK_TCK)
server_pid=""
# SIGTERM, then SIGKILL when the server has not exited a minute later.
stop_server() {
  [ -n "$server_pid" ] || return 0
  kill -TERM "$server_pid" 2>/dev/null || true
  local tenths=600
  while kill -0 "$server_pid" 2>/dev/null && [ $((tenths--)) -gt 0 ]; do
    sleep 0.1
  done
  kill -KILL "$server_pid" 2>/dev/null || true
  pkill -KILL -P "$server_pid" 2>/dev/null || true
  wait "$server_pid" || true
  server_pid=""
}
trap 'stop_server; postgres_stop' EXIT

# The server's process and its children (Kamailio's workers).
server_processes() {
  echo "$server_pid"
  pgrep -P "$server_pid" || true
}
# sum_over_server FILE PROGRAM: the sum over the server's processes of what
# the awk PROGRAM prints from /proc/PID/FILE.
sum_over_server() {
  local pid total=0
  for pid in $(server_processes); do
    total=$((total + $(awk "$2" "/proc/$pid/$1" 2>/dev/null || echo 0)))
  done
  echo "$total"
}
# CPU time (user and system) of all the server's processes so far, in ticks.
server_ticks() { sum_over_server stat '{ sub(/^.*\) /, ""); print $12 + $13 }'; }
# Proportional set size of all the server's processes, in KiB.
server_pss_kib() { sum_over_server smaps_rollup '/^Pss:/ { print $2 }'; }

# Field NAME of the last line of a SIPp statistics file.
statistic() {
  awk -F';' -v name="$2" 'NR == 1 { for (i = 1; i <= NF; ++i) if ($i == name) column = i }
    END { print $column + 0 }' "$1"
}

# run_sipp SCENARIO RATE CALLS LABEL: runs CALLS calls at RATE per second
# (bounded in time), then sets passed (true when every call succeeded with no
# retransmission and SIPp made 90% of the calls per second asked or more),
# achieved (calls completed per second) and ticks (the server's CPU ticks
# meanwhile).
run_sipp() {
  local scenario=$1 rate=$2 calls=$3 label=$4
  local limit=$((calls / rate + 30))
  local before start end
  before=$(server_ticks)
  start=$(date +%s.%N)
  local status=0
  timeout $((limit + 10)) sipp "$address" -sf "$here/$scenario" -inf users.csv -m "$calls" \
    -r "$rate" -i 127.0.0.1 -auth_uri example.com -nostdin -timeout "${limit}s" -timeout_error \
    -trace_stat -stf "$label.csv" -fd 3600 >"$label.log" 2>&1 || status=$?
  end=$(date +%s.%N)
  ticks=$(($(server_ticks) - before))
  local succeeded failed retransmitted
  succeeded=$(statistic "$label.csv" 'SuccessfulCall(C)')
  failed=$(statistic "$label.csv" 'FailedCall(C)')
  retransmitted=$(statistic "$label.csv" 'Retransmissions(C)')
  achieved=$(awk -v n="$succeeded" -v s="$start" -v e="$end" 'BEGIN { printf "%.0f", n / (e - s) }')
  local kept
  kept=$(awk -v made="$(statistic "$label.csv" 'CallRate(C)')" -v asked="$rate" 'BEGIN { print (made >= 0.9 * asked) }')
  passed=false
  if [ "$status" = 0 ] && [ "$succeeded" = "$calls" ] && [ "$failed" = 0 ] && [ "$retransmitted" = 0 ] &&
    [ "$kept" = 1 ]; then
    passed=true
  fi
  printf '  %-30s %6d/s asked, %6d/s done, %d of %d succeeded, %d failed, %d retransmitted, %.2f s CPU\n' \
    "$label" "$rate" "$achieved" "$succeeded" "$calls" "$failed" "$retransmitted" \
    "$(awk -v t="$ticks" -v hz="$ticks_per_second" 'BEGIN { print t / hz }')" >&2
}

# run_phase SCENARIO NAME: the probes, then every subscriber at the best
# rate (the first of RATES when none passed), and again a quarter slower
# while that fails (at most four full runs); sets rate, achieved, ticks and
# sustained of the last one.
run_phase() {
  local scenario=$1 name=$2 best=0 probe attempt
  for probe in "${rates[@]}"; do
    local calls=$((probe * probe_seconds))
    [ "$calls" -le "$subscribers" ] || calls=$subscribers
    run_sipp "$scenario" "$probe" "$calls" "$name-probe-$probe"
    [ $passed = true ] || break
    best=$probe
  done
  rate=$best
  [ "$rate" != 0 ] || rate=${rates[0]}
  for attempt in 1 2 3 4; do
    run_sipp "$scenario" "$rate" "$subscribers" "$name-$rate"
    sustained=$passed
    [ $passed = false ] || return 0
    [ $attempt = 4 ] || rate=$((rate * 3 / 4))
  done
  echo "$name: no run passed; the figures below are of the last, at $rate/s; the logs are in $work" >&2
}

# A free UDP port on loopback for Kamailio, which cannot take port 0.
free_port() {
  local port
  while :; do
    port=$((20000 + RANDOM % 30000))
    ! ss -Hlun "sport = :$port" | grep -q . && echo "$port" && return 0
  done
}

start_server() { # TARGET
  local start=$SECONDS
  address=""
  case $1 in
    gateway)
      # SIPp answers only an MD5 first challenge.
      "$gateway" --listen 127.0.0.1:0 --store "$store" --calls redirect --statistics --digest MD5 subscribers.script >gateway.out 2>gateway.err &
      server_pid=$!
      while [ -z "$address" ]; do
        if ! kill -0 "$server_pid" 2>/dev/null || [ $((SECONDS - start)) -gt 600 ]; then
          echo "the gateway did not start listening:" >&2
          cat gateway.err >&2
          exit 1
        fi
        sleep 0.2
        address=$(sed -n 's/^location-gateway: listening on udp:\(127[^ ]*\).*$/\1/p' gateway.err | head -n 1)
      done
      ;;
    kamailio)
      address=127.0.0.1:$(free_port)
      kamailio -f "$here/kamailio.cfg" -L "$kamailio_modules" -l "udp:$address" -DD -E -m 512 \
        -P "$work/kamailio.pid" >kamailio.out 2>kamailio.err &
      server_pid=$!
      # Ready when its workers are up.
      while [ "$(pgrep -c -P "$server_pid" || true)" -lt 2 ]; do
        if ! kill -0 "$server_pid" 2>/dev/null || [ $((SECONDS - start)) -gt 60 ]; then
          echo "Kamailio did not start:" >&2
          cat kamailio.err >&2
          exit 1
        fi
        sleep 0.2
      done
      sleep 1
      ;;
  esac
  load_seconds=$((SECONDS - start))
}

declare -A figure
measure() { # TARGET
  local target=$1
  start_server "$target"
  local load_ticks pss_loaded pss_stormed pss_refreshed
  load_ticks=$(server_ticks)
  pss_loaded=$(server_pss_kib)
  echo "$target on $address: started in $load_seconds s, PSS $pss_loaded KiB" >&2
  run_phase register.xml "$target-register"
  figure[$target.register_rate]=$achieved
  figure[$target.register_sustained]=$sustained
  figure[$target.register_us]=$(awk -v t="$ticks" -v n=$((2 * subscribers)) -v hz="$ticks_per_second" \
    'BEGIN { printf "%.1f", 1e6 * t / hz / n }')
  pss_stormed=$(server_pss_kib)
  run_sipp register.xml "$rate" "$subscribers" "$target-refresh-$rate"
  figure[$target.refresh_us]=$(awk -v t="$ticks" -v n=$((2 * subscribers)) -v hz="$ticks_per_second" \
    'BEGIN { printf "%.1f", 1e6 * t / hz / n }')
  pss_refreshed=$(server_pss_kib)
  run_phase invite.xml "$target-invite"
  figure[$target.invite_rate]=$achieved
  figure[$target.invite_sustained]=$sustained
  figure[$target.invite_us]=$(awk -v t="$ticks" -v n="$subscribers" -v hz="$ticks_per_second" \
    'BEGIN { printf "%.1f", 1e6 * t / hz / n }')
  local serve_ticks=$(($(server_ticks) - load_ticks))
  stop_server
  figure[$target.loaded_mib]=$(awk -v k="$pss_loaded" 'BEGIN { printf "%.0f", k / 1024 }')
  figure[$target.binding_bytes]=$(awk -v a="$pss_loaded" -v b="$pss_stormed" -v n="$subscribers" \
    'BEGIN { printf "%.0f", 1024 * (b - a) / n }')
  figure[$target.refresh_growth]=$(awk -v a="$pss_stormed" -v b="$pss_refreshed" \
    'BEGIN { printf "%+.1f%%", 100 * (b - a) / a }')
  figure[$target.library_share]=-
  if [ "$target" = gateway ]; then
    local library_seconds
    library_seconds=$(sed -n 's/.* in the library \([0-9.]*\) s .*/\1/p' gateway.err)
    figure[$target.library_share]=$(awk -v l="$library_seconds" -v t="$serve_ticks" -v hz="$ticks_per_second" \
      'BEGIN { printf "%.1f%%", 100 * l * hz / t }')
  fi
}

load_average=$(cut -d' ' -f1 /proc/loadavg)
for target in "${targets[@]}"; do
  measure "$target"
done

restored="no store"
if [ "$store" != none ] && [[ " ${targets[*]} " == *" gateway "* ]]; then
  start_server gateway
  stop_server
  restored=$(sed -n 's/^location-gateway: \([0-9]* bindings restored .*\)$/\1/p' gateway.err)
fi

verdict() { # SUSTAINED
  if [ "$1" = true ]; then echo "clean"; else echo "NOT SUSTAINED"; fi
}
ratio() { # KEY: gateway's figure over Kamailio's
  awk -v a="${figure[gateway.$1]:-0}" -v b="${figure[kamailio.$1]:-0}" \
    'BEGIN { if (a + 0 > 0 && b + 0 > 0) printf "%.2f", a / b; else print "-" }'
}
row() { # LABEL KEY [SUFFIX]
  printf '| %s | %s | %s | %s |\n' "$1" "${figure[gateway.$2]:--}${3:-}" "${figure[kamailio.$2]:--}${3:-}" "$(ratio "$2")"
}
{
  echo "SIPp on loopback, $subscribers subscribers; $(nproc) cores, $(uname -m), $(grep -m 1 'model name' /proc/cpuinfo |
    sed 's/.*: //'); load average $load_average before the run"
  echo
  echo "| | location-gateway | Kamailio | gateway / Kamailio |"
  echo "|---|---|---|---|"
  row "registrations a second, no failure or retransmission" register_rate
  row "CPU per REGISTER request, µs (storm)" register_us
  row "CPU per REGISTER request, µs (refresh)" refresh_us
  row "INVITEs (302, ACK) a second, no failure or retransmission" invite_rate
  row "CPU per INVITE, µs" invite_us
  row "PSS at start, MiB" loaded_mib
  row "growth in the first storm, bytes a binding" binding_bytes
  row "growth when the same phones refresh" refresh_growth
  row "the library's share of the gateway's CPU" library_share
  echo
  echo "gateway store: ${STORE:-sqlite}; started again on it: $restored"
  for target in "${targets[@]}"; do
    echo "$target: registrations $(verdict "${figure[$target.register_sustained]}"), INVITEs $(verdict \
      "${figure[$target.invite_sustained]}")"
  done
} | tee report.txt
status=0
for target in "${targets[@]}"; do
  if [ "${figure[$target.register_sustained]}" != true ] || [ "${figure[$target.invite_sustained]}" != true ]; then
    status=1
  fi
done
exit $status
