#!/usr/bin/env bash
# The gateway under load, in one command: builds location-gateway (Release,
# in BUILD, by default build-gateway-bench/), configures it with SUBSCRIBERS (default 100,000)
# subscribers of one location service inheriting a "DEFAULT" group with
# inbound authentication (generate.sh), and has SIPp, on loopback:
#   1. register every subscriber with digest authentication (register.xml:
#      REGISTER, 401, REGISTER with credentials, 200);
#   2. call every subscriber once (invite.xml: INVITE, 302, ACK).
# Each phase first finds the highest rate the gateway sustains: short probes
# (PROBE_SECONDS each) at the rising RATES, each passing only when every call
# succeeds, no request is retransmitted and SIPp keeps 90% of the rate. The
# whole phase then runs at the best rate, and a quarter slower while a full
# run fails, at most four times. Every SIPp run is bounded in calls and
# time; the gateway is stopped at the end or on any failure.
#
# Prints, and writes to BUILD/bench-gateway/report.txt:
# registrations and INVITEs per second, the gateway's CPU time per request
# (from /proc), its resident memory loaded and with every binding (VmRSS;
# the second holds what the stack's transactions took at their peak too, as
# freed memory stays with the process), and the share of its CPU time spent in the library's calls (from its
# --statistics line, over the time it served: loading the script left out).
# Exits with 1 when a phase was not sustained at any rate tried.
set -euo pipefail
root="$(cd "$(dirname "$0")/../.." && pwd)"
here="$root/bench/gateway"
subscribers=${SUBSCRIBERS:-100000}
read -r -a rates <<<"${RATES:-500 1000 2000 4000 6000 8000 10000 12000 15000 20000}"
probe_seconds=${PROBE_SECONDS:-3}
build=${BUILD:-"$root/build-gateway-bench"}
work="$build/bench-gateway"

bash "$root/tools/install-missing-packages.sh" cmake make g++ pkg-config libre2-dev libre-dev sip-tester >&2
cmake -S "$root" -B "$build" -DCMAKE_BUILD_TYPE=Release -DLS_BUILD_TESTS=OFF -DLS_BUILD_GATEWAY=ON >/dev/null
cmake --build "$build" --target location-gateway -j "${JOBS:-2}" >/dev/null
gateway="$build/gateway/location-gateway"

rm -rf "$work"
mkdir -p "$work"
cd "$work"
bash "$here/generate.sh" "$subscribers" .

ticks_per_second=$(getconf CLK_TCK)
gateway_pid=""
# SIGTERM, then SIGKILL when the gateway has not exited a minute later.
stop_gateway() {
  [ -n "$gateway_pid" ] || return 0
  kill -TERM "$gateway_pid" 2>/dev/null || true
  local tenths=600
  while kill -0 "$gateway_pid" 2>/dev/null && [ $((tenths--)) -gt 0 ]; do
    sleep 0.1
  done
  kill -KILL "$gateway_pid" 2>/dev/null || true
  wait "$gateway_pid" || true
  gateway_pid=""
}
trap stop_gateway EXIT

# The gateway's CPU time (user and system) so far, in clock ticks.
gateway_ticks() {
  awk '{ sub(/^.*\) /, ""); print $12 + $13 }' "/proc/$gateway_pid/stat"
}
gateway_rss_kib() {
  awk '/^VmRSS:/ { print $2 }' "/proc/$gateway_pid/status"
}

# Field NAME of the last line of a SIPp statistics file.
statistic() {
  awk -F';' -v name="$2" 'NR == 1 { for (i = 1; i <= NF; ++i) if ($i == name) column = i }
    END { print $column + 0 }' "$1"
}

# run_sipp SCENARIO RATE CALLS LABEL: runs CALLS calls at RATE per second
# (bounded in time), then sets passed (true when every call succeeded with no
# retransmission and SIPp made 90% of the calls per second asked or more),
# achieved (calls completed per second), ticks (the gateway's CPU ticks
# meanwhile) and sipp_cpu (SIPp's CPU seconds).
run_sipp() {
  local scenario=$1 rate=$2 calls=$3 label=$4
  local limit=$((calls / rate + 30))
  local before start end
  before=$(gateway_ticks)
  start=$(date +%s.%N)
  local status=0
  TIMEFORMAT=%U+%S
  { time timeout $((limit + 10)) sipp "$address" -sf "$here/$scenario" -inf users.csv -m "$calls" \
      -r "$rate" -i 127.0.0.1 -nostdin -timeout "${limit}s" -timeout_error \
      -trace_stat -stf "$label.csv" -fd 3600 >"$label.log" 2>&1; } 2>"$label.time" || status=$?
  end=$(date +%s.%N)
  ticks=$(($(gateway_ticks) - before))
  sipp_cpu=$(awk -F+ '{ printf "%.2f", $1 + $2 }' "$label.time")
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
  printf '  %-20s %6d/s asked, %6d/s done, %d of %d succeeded, %d failed, %d retransmitted, gateway %.2f s CPU\n' \
    "$label" "$rate" "$achieved" "$succeeded" "$calls" "$failed" "$retransmitted" \
    "$(awk -v t="$ticks" -v hz="$ticks_per_second" 'BEGIN { print t / hz }')" >&2
}

# run_phase SCENARIO NAME: the probes, then every subscriber at the best
# rate (the first of RATES when none passed), and again a quarter slower
# while that fails (at most four full runs); sets rate, achieved, ticks,
# sipp_cpu and sustained of the last one.
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

"$gateway" --listen 127.0.0.1:0 --statistics subscribers.script >gateway.out 2>gateway.err &
gateway_pid=$!
load_start=$SECONDS
address=""
while [ -z "$address" ]; do
  if ! kill -0 "$gateway_pid" 2>/dev/null || [ $((SECONDS - load_start)) -gt 600 ]; then
    echo "the gateway did not start listening:" >&2
    cat gateway.err >&2
    exit 1
  fi
  sleep 0.2
  address=$(sed -n 's/^location-gateway: listening on udp:\([^ ]*\).*$/\1/p' gateway.err)
done
load_seconds=$((SECONDS - load_start))
load_ticks=$(gateway_ticks)
rss_loaded=$(gateway_rss_kib)
echo "gateway on $address: $subscribers subscribers loaded in $load_seconds s, VmRSS $rss_loaded KiB" >&2

load_average=$(cut -d' ' -f1 /proc/loadavg)
run_phase register.xml register
register_rate=$rate register_achieved=$achieved register_ticks=$ticks register_sipp=$sipp_cpu
register_sustained=$sustained
rss_bound=$(gateway_rss_kib)
run_phase invite.xml invite
invite_rate=$rate invite_achieved=$achieved invite_ticks=$ticks invite_sipp=$sipp_cpu
invite_sustained=$sustained
serve_ticks=$(($(gateway_ticks) - load_ticks))
rss_peak=$(awk '/^VmHWM:/ { print $2 }' "/proc/$gateway_pid/status")
stop_gateway
statistics=$(sed -n 's/^location-gateway: \([0-9]* requests, CPU .*\)$/\1/p' gateway.err)
library_seconds=$(sed -n 's/.* in the library \([0-9.]*\) s .*/\1/p' <<<"$statistics")

microseconds() { # TICKS REQUESTS
  awk -v t="$1" -v n="$2" -v hz="$ticks_per_second" 'BEGIN { printf "%.1f", 1e6 * t / hz / n }'
}
verdict() { # SUSTAINED
  if [ "$1" = true ]; then echo "no failure, no retransmission"; else echo "NOT SUSTAINED: failures or retransmissions"; fi
}
{
  echo "location-gateway under SIPp, $subscribers subscribers of one location service inheriting \"DEFAULT\""
  echo "$(nproc) cores, $(uname -m), load average $load_average before the run; SIPp on the same machine, UDP on loopback"
  printf 'registrations (REGISTER 401, REGISTER 200): %6d/s (asked %d/s, %s); gateway %s us CPU a request; SIPp %s s CPU\n' \
    "$register_achieved" "$register_rate" "$(verdict "$register_sustained")" \
    "$(microseconds "$register_ticks" $((2 * subscribers)))" "$register_sipp"
  printf 'INVITE to 302:                              %6d/s (asked %d/s, %s); gateway %s us CPU a request; SIPp %s s CPU\n' \
    "$invite_achieved" "$invite_rate" "$(verdict "$invite_sustained")" \
    "$(microseconds "$invite_ticks" "$subscribers")" "$invite_sipp"
  printf 'gateway VmRSS: %d KiB loaded, %d KiB with %d bindings (transactions at their peak included), peak %d KiB\n' \
    "$rss_loaded" "$rss_bound" "$subscribers" "$rss_peak"
  echo "gateway --statistics: $statistics"
  awk -v l="$library_seconds" -v t="$serve_ticks" -v hz="$ticks_per_second" 'BEGIN {
    printf "serving only (probes included, loading the script left out): CPU %.2f s, in the library %.2f s (%.1f%%)\n",
      t / hz, l, 100 * l * hz / t }'
} | tee report.txt
[ "$register_sustained" = true ] && [ "$invite_sustained" = true ]
