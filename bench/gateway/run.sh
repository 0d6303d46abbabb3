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
#   3. call every subscriber once (invite.xml: INVITE, 302, ACK);
# then each server is started again for the call phase (the gateway with
# --calls relay, Kamailio with -A CALLS: a stateful proxy that
# record-routes):
#   4. every subscriber registers again (register.xml, at
#      CALLEE_REGISTER_RATE, default 2,000 a second: these only need to
#      succeed), from the port of one of CALLEES (default 2) SIPp phones
#      and so with its Contact there, the subscribers dealt among them in
#      turn; each phone then answers on that port (answer.xml: 180, 200,
#      ACK, BYE, 200). (The gateway sends a call to a loopback Contact
#      registered from another port to the port the REGISTER came from, as
#      to a phone behind NAT.) Callers from outside the served domain (no
#      call authentication) call them through the server (call.xml:
#      INVITE, 100/180, 200, ACK, CALL_SECONDS (default 5) of call, BYE,
#      200): probes at CALL_RATES, then a full run of at most
#      CALL_RUN_SECONDS (default 60) of calls, as phases 1 and 3 run; a
#      call counts only when its callee, too, saw no failure or
#      retransmission. Then, on a server started afresh and registered
#      again, CONCURRENT_CALLS (default 10,000) calls up at once: at
#      CONCURRENT_CALLS / CALL_SECONDS calls a second, or at the clean rate
#      found when that is lower with calls long enough, for long enough
#      that all are up together for about four seconds: the server's PSS
#      at its highest then, less before, per call up; and again
#      SETTLE_SECONDS (default 40, longer than a BYE's server transaction
#      lives) after they ended.
# Phases 1, 3 and 4 first find the highest rate the server sustains: short
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
# picks the servers, PHASES (default "registrations calls") the phases:
# "registrations" is 1 to 3, "calls" is 4. Prints, and writes to
# BUILD/bench-gateway/report.txt, the figures side by side with their
# ratios; exits with 1 when a phase was not sustained at any rate tried.
#
# STORE picks where the gateway keeps its bindings: sqlite (the default: a
# file in the work directory), postgresql (a server the run starts itself,
# as the store's tests do) or none. With a store, the gateway is started
# once more at the end on the bindings it stored, and the report gives the
# time it took to restore them. The call phase runs the gateway with
# --store none: it changes no binding the phase measures, and a store of
# the same kind already holds the first phases' bindings, whose phones are
# gone.
set -euo pipefail
root="$(cd "$(dirname "$0")/../.." && pwd)"
here="$root/bench/gateway"
subscribers=${SUBSCRIBERS:-100000}
read -r -a rates <<<"${RATES:-500 1000 2000 4000 6000 8000 10000 12000 15000 20000}"
read -r -a targets <<<"${TARGETS:-gateway kamailio}"
read -r -a phases <<<"${PHASES:-registrations calls}"
read -r -a call_rates <<<"${CALL_RATES:-50 100 200 500 1000 1500 2000 2500 3000 4000 5000}"
call_run_seconds=${CALL_RUN_SECONDS:-60}
call_seconds=${CALL_SECONDS:-5}
callees=${CALLEES:-2}
concurrent_calls=${CONCURRENT_CALLS:-10000}
settle_seconds=${SETTLE_SECONDS:-40}
callee_register_rate=${CALLEE_REGISTER_RATE:-2000}
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
# Thousands of calls at once: SIPp wants descriptors to spare.
ulimit -n "$(ulimit -Hn)"

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
# The SIPp processes running when the run stops.
sipp_pids=()
stop_sipp() {
  local pid
  for pid in "${sipp_pids[@]}"; do
    kill -TERM "$pid" 2>/dev/null || true
  done
}
trap 'stop_sipp; stop_server; postgres_stop' EXIT
trap 'exit 143' TERM INT

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

# What run_sipp runs: the users' file, SIPp's own options, and for the call
# phase the length of a call (SIPp's -d) and the ports of the callees.
sipp_users=users.csv
sipp_options=()
hold_seconds=0
callee_ports=()
# When true, run_sipp samples the server's PSS every half second while
# SIPp runs (into pss_peak) and the calls up at once (into calls_peak).
sample_memory=false

# callees_start LABEL LIMIT: a SIPp phone on each of callee_ports, answering
# whatever calls come, for LIMIT seconds at most; returns once each has its
# port.
callee_pids=()
callees_start() {
  local label=$1 limit=$2 j
  callee_pids=()
  for j in "${!callee_ports[@]}"; do
    timeout "$limit" sipp -sf "$here/answer.xml" -i 127.0.0.1 -p "${callee_ports[$j]}" -nostdin \
      -trace_stat -stf "$label-callee-$j.csv" -fd 3600 >"$label-callee-$j.log" 2>&1 &
    callee_pids+=($!)
    sipp_pids+=($!)
  done
  for j in "${!callee_ports[@]}"; do
    local tenths=100
    until ss -Hlun "sport = :${callee_ports[$j]}" | grep -q .; do
      [ $((tenths--)) -gt 0 ] || { echo "the callee on port ${callee_ports[$j]} did not start" >&2; exit 1; }
      sleep 0.1
    done
  done
}
# callees_stop LABEL: stops them (SIPp writes its last statistics on
# SIGTERM) and sums their statistics into callee_succeeded, callee_failed
# and callee_retransmitted.
callees_stop() {
  local label=$1 j
  for j in "${!callee_pids[@]}"; do
    kill -TERM "${callee_pids[$j]}" 2>/dev/null || true
    wait "${callee_pids[$j]}" || true
  done
  callee_pids=()
  sipp_pids=()
  callee_succeeded=0 callee_failed=0 callee_retransmitted=0
  for j in "${!callee_ports[@]}"; do
    callee_succeeded=$((callee_succeeded + $(statistic "$label-callee-$j.csv" 'SuccessfulCall(C)')))
    callee_failed=$((callee_failed + $(statistic "$label-callee-$j.csv" 'FailedCall(C)')))
    callee_retransmitted=$((callee_retransmitted + $(statistic "$label-callee-$j.csv" 'Retransmissions(C)')))
  done
}

# run_sipp SCENARIO RATE CALLS LABEL: runs CALLS calls at RATE per second
# (bounded in time), then sets passed (true when every call succeeded with no
# retransmission and SIPp made 90% of the calls per second asked or more),
# achieved (calls completed per second) and ticks (the server's CPU ticks
# meanwhile). With callee_ports, callees answer the calls for the run, and a
# call passes only when its callee saw no failure or retransmission either;
# the rates then leave out the last hold_seconds, when no call starts.
run_sipp() {
  local scenario=$1 rate=$2 calls=$3 label=$4
  local limit=$((calls / rate + 30 + hold_seconds))
  local before start end
  local callee_options=()
  [ "$hold_seconds" = 0 ] || callee_options=(-d $((hold_seconds * 1000)))
  [ ${#callee_ports[@]} = 0 ] || callees_start "$label" $((limit + 20))
  before=$(server_ticks)
  start=$(date +%s.%N)
  local status=0
  timeout $((limit + 10)) sipp "$address" -sf "$here/$scenario" -inf "$sipp_users" -m "$calls" \
    -r "$rate" -i 127.0.0.1 -auth_uri example.com -nostdin -timeout "${limit}s" -timeout_error \
    "${sipp_options[@]}" "${callee_options[@]}" -trace_stat -stf "$label.csv" -fd "$([ $sample_memory = true ] && echo 1 || echo 3600)" \
    >"$label.log" 2>&1 &
  local caller=$!
  sipp_pids+=("$caller")
  pss_peak=0
  while [ $sample_memory = true ] && kill -0 "$caller" 2>/dev/null; do
    local pss
    pss=$(server_pss_kib)
    [ "$pss" -le "$pss_peak" ] || pss_peak=$pss
    sleep 0.5
  done
  wait "$caller" || status=$?
  sipp_pids=("${callee_pids[@]}")
  end=$(date +%s.%N)
  ticks=$(($(server_ticks) - before))
  local succeeded failed retransmitted
  succeeded=$(statistic "$label.csv" 'SuccessfulCall(C)')
  failed=$(statistic "$label.csv" 'FailedCall(C)')
  retransmitted=$(statistic "$label.csv" 'Retransmissions(C)')
  local callees_clean=true
  if [ ${#callee_ports[@]} != 0 ]; then
    callees_stop "$label"
    [ "$callee_succeeded" = "$calls" ] && [ "$callee_failed" = 0 ] && [ "$callee_retransmitted" = 0 ] ||
      callees_clean=false
  fi
  calls_peak=$(awk -F';' 'NR == 1 { for (i = 1; i <= NF; ++i) if ($i == "CurrentCall") column = i }
    NR > 1 && $column > peak { peak = $column } END { print peak + 0 }' "$label.csv")
  local kept
  if [ "$hold_seconds" = 0 ]; then
    achieved=$(awk -v n="$succeeded" -v s="$start" -v e="$end" 'BEGIN { printf "%.0f", n / (e - s) }')
    kept=$(awk -v made="$(statistic "$label.csv" 'CallRate(C)')" -v asked="$rate" 'BEGIN { print (made >= 0.9 * asked) }')
  else
    # SIPp's own rate counts the last call's length too: its ringing
    # (answer.xml's 0.1 s) and its hold.
    local last=$(awk -v h="$hold_seconds" 'BEGIN { print h + 0.1 }')
    achieved=$(awk -v n="$succeeded" -v s="$start" -v e="$end" -v h="$last" \
      'BEGIN { printf "%.0f", n / (e - s - h) }')
    kept=$(awk -v made="$(statistic "$label.csv" 'OutgoingCall(C)')" -v s="$start" -v e="$end" -v h="$last" \
      -v asked="$rate" 'BEGIN { print (made / (e - s - h) >= 0.9 * asked) }')
  fi
  passed=false
  if [ "$status" = 0 ] && [ "$succeeded" = "$calls" ] && [ "$failed" = 0 ] && [ "$retransmitted" = 0 ] &&
    [ "$kept" = 1 ] && [ $callees_clean = true ]; then
    passed=true
  fi
  printf '  %-30s %6d/s asked, %6d/s done, %d of %d succeeded, %d failed, %d retransmitted, %.2f s CPU\n' \
    "$label" "$rate" "$achieved" "$succeeded" "$calls" "$failed" "$retransmitted" \
    "$(awk -v t="$ticks" -v hz="$ticks_per_second" 'BEGIN { print t / hz }')" >&2
  if [ ${#callee_ports[@]} != 0 ]; then
    printf '  %-30s callees: %d succeeded, %d failed, %d retransmitted\n' \
      "" "$callee_succeeded" "$callee_failed" "$callee_retransmitted" >&2
    # The server still retransmits the requests of the calls that failed,
    # for up to 32 s: to the next run's phones, they would be calls of
    # that run failing.
    [ $passed = true ] || sleep 35
  fi
}

# run_phase SCENARIO NAME RATE...: the probes, then every subscriber at the
# best rate (the first RATE when none passed), and again a quarter slower
# while that fails (at most four full runs); sets rate, achieved, ticks,
# sustained and phase_calls (the calls made) of the last one. With
# phase_seconds, a full run makes at most that many seconds of calls.
phase_seconds=0
run_phase() {
  local scenario=$1 name=$2 best=0 probe attempt
  shift 2
  local rates=("$@")
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
    phase_calls=$subscribers
    [ "$phase_seconds" = 0 ] || [ $((rate * phase_seconds)) -ge "$subscribers" ] ||
      phase_calls=$((rate * phase_seconds))
    run_sipp "$scenario" "$rate" "$phase_calls" "$name-$rate"
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

start_server() { # TARGET [calls]
  local start=$SECONDS
  address=""
  case $1 in
    gateway)
      local calls=(--store "$store" --calls redirect)
      [ "${2:-}" != calls ] || calls=(--store none --calls relay)
      local log=gateway${2:+-$2}
      # SIPp answers only an MD5 first challenge.
      "$gateway" --listen 127.0.0.1:0 "${calls[@]}" --statistics --digest MD5 subscribers.script >"$log.out" 2>"$log.err" &
      server_pid=$!
      while [ -z "$address" ]; do
        if ! kill -0 "$server_pid" 2>/dev/null || [ $((SECONDS - start)) -gt 600 ]; then
          echo "the gateway did not start listening:" >&2
          cat "$log.err" >&2
          exit 1
        fi
        sleep 0.2
        address=$(sed -n 's/^location-gateway: listening on udp:\(127[^ ]*\).*$/\1/p' "$log.err" | head -n 1)
      done
      ;;
    kamailio)
      address=127.0.0.1:$(free_port)
      local calls=()
      [ "${2:-}" != calls ] || calls=(-A CALLS)
      local log=kamailio${2:+-$2}
      kamailio -f "$here/kamailio.cfg" "${calls[@]}" -L "$kamailio_modules" -l "udp:$address" -DD -E -m 512 \
        -P "$work/kamailio.pid" >"$log.out" 2>"$log.err" &
      server_pid=$!
      # Ready when its workers are up.
      while [ "$(pgrep -c -P "$server_pid" || true)" -lt 2 ]; do
        if ! kill -0 "$server_pid" 2>/dev/null || [ $((SECONDS - start)) -gt 60 ]; then
          echo "Kamailio did not start:" >&2
          cat "$log.err" >&2
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
  run_phase register.xml "$target-register" "${rates[@]}"
  figure[$target.register_rate]=$achieved
  figure[$target.register_sustained]=$sustained
  figure[$target.register_us]=$(awk -v t="$ticks" -v n=$((2 * subscribers)) -v hz="$ticks_per_second" \
    'BEGIN { printf "%.1f", 1e6 * t / hz / n }')
  pss_stormed=$(server_pss_kib)
  run_sipp register.xml "$rate" "$subscribers" "$target-refresh-$rate"
  figure[$target.refresh_us]=$(awk -v t="$ticks" -v n=$((2 * subscribers)) -v hz="$ticks_per_second" \
    'BEGIN { printf "%.1f", 1e6 * t / hz / n }')
  pss_refreshed=$(server_pss_kib)
  run_phase invite.xml "$target-invite" "${rates[@]}"
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

# call_server TARGET: a server started for the call phase, every
# subscriber's phone registered at one of callee_ports in turn; false (the
# server stopped) when some did not register.
call_server() {
  local target=$1 j registered=0 hold=$hold_seconds
  start_server "$target" calls
  hold_seconds=0
  local ports=("${callee_ports[@]}")
  callee_ports=()
  for j in "${!ports[@]}"; do
    awk -v n="${#ports[@]}" -v j="$j" 'NR == 1 || (NR - 2) % n == j' users.csv >"callee-$j.csv"
    local count=$(($(wc -l <"callee-$j.csv") - 1)) attempt made=0
    sipp_users=callee-$j.csv
    sipp_options=(-p "${ports[$j]}")
    # A registration lost in a burst is tried again with all the others.
    for attempt in 1 2 3; do
      run_sipp register.xml "$callee_register_rate" "$count" "$target-register-callee-$j-$attempt"
      made=$(statistic "$target-register-callee-$j-$attempt.csv" 'SuccessfulCall(C)')
      [ "$made" != "$count" ] || break
    done
    registered=$((registered + made))
  done
  sipp_users=users.csv
  sipp_options=()
  callee_ports=("${ports[@]}")
  hold_seconds=$hold
  [ "$registered" != "$subscribers" ] || return 0
  echo "$target: $registered of $subscribers phones registered; the logs are in $work" >&2
  stop_server
  return 1
}

# The call phase of TARGET: the rate and the CPU on one server, the memory
# on another started afresh, so that the probes' calls have not already
# grown it.
measure_calls() { # TARGET
  local target=$1 j
  callee_ports=()
  for j in $(seq 1 "$callees"); do
    local port
    port=$(free_port)
    while [[ " ${callee_ports[*]} " == *" $port "* ]]; do port=$(free_port); done
    callee_ports+=("$port")
  done
  figure[$target.calls_sustained]=false
  call_server "$target" || { callee_ports=(); return 0; }
  hold_seconds=$call_seconds
  phase_seconds=$call_run_seconds
  run_phase call.xml "$target-call" "${call_rates[@]}"
  phase_seconds=0
  figure[$target.call_rate]=$achieved
  figure[$target.calls_sustained]=$sustained
  figure[$target.call_us]=$(awk -v t="$ticks" -v n="$phase_calls" -v hz="$ticks_per_second" \
    'BEGIN { printf "%.1f", 1e6 * t / hz / n }')
  stop_server
  # CONCURRENT_CALLS up at once: at the phase's rate for as long as it
  # takes, at most CONCURRENT_CALLS / CALL_SECONDS a second.
  local memory_rate=$((concurrent_calls / call_seconds))
  [ "$achieved" -ge "$memory_rate" ] || [ "$achieved" = 0 ] || memory_rate=$achieved
  hold_seconds=$(((concurrent_calls + memory_rate - 1) / memory_rate))
  figure[$target.memory_shape]="$memory_rate/s, ${hold_seconds} s"
  if call_server "$target"; then
    local pss_before pss_after
    sleep 1
    pss_before=$(server_pss_kib)
    sample_memory=true
    # All of them up together for about four seconds.
    run_sipp call.xml "$memory_rate" $((concurrent_calls + 4 * memory_rate)) "$target-calls-up-$concurrent_calls"
    sample_memory=false
    figure[$target.memory_clean]=$passed
    figure[$target.calls_peak]=$calls_peak
    figure[$target.call_bytes]=$(awk -v a="$pss_before" -v b="$pss_peak" -v n="$concurrent_calls" \
      'BEGIN { printf "%.0f", 1024 * (b - a) / n }')
    sleep "$settle_seconds"
    pss_after=$(server_pss_kib)
    figure[$target.calls_after]=$(awk -v a="$pss_before" -v b="$pss_after" 'BEGIN { printf "%+d KiB", b - a }')
    echo "$target: PSS $pss_before KiB before the calls, $pss_peak KiB at most with up to $calls_peak up," \
      "$pss_after KiB $settle_seconds s after they ended" >&2
    stop_server
  fi
  callee_ports=()
  hold_seconds=0
}

has_phase() { [[ " ${phases[*]} " == *" $1 "* ]]; }

load_average=$(cut -d' ' -f1 /proc/loadavg)
for target in "${targets[@]}"; do
  ! has_phase registrations || measure "$target"
  ! has_phase calls || measure_calls "$target"
done

restored="no store"
if [ "$store" != none ] && [[ " ${targets[*]} " == *" gateway "* ]] && has_phase registrations; then
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
row_alone() { # LABEL KEY: a figure no ratio means anything for
  printf '| %s | %s | %s | |\n' "$1" "${figure[gateway.$2]:--}" "${figure[kamailio.$2]:--}"
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
  row "calls a second ($call_seconds s each), no failure or retransmission" call_rate
  row "CPU per call, µs" call_us
  row_alone "calls up at once: rate, length" memory_shape
  row "growth with $concurrent_calls calls up, bytes a call" call_bytes
  row_alone "PSS $settle_seconds s after the calls, against before" calls_after
  echo
  echo "gateway store: ${STORE:-sqlite}; started again on it: $restored"
  for target in "${targets[@]}"; do
    ! has_phase registrations || echo "$target: registrations $(verdict "${figure[$target.register_sustained]}")," \
      "INVITEs $(verdict "${figure[$target.invite_sustained]}")"
    ! has_phase calls || echo "$target: calls $(verdict "${figure[$target.calls_sustained]:-}")," \
      "the $concurrent_calls at once $(verdict "${figure[$target.memory_clean]:-}") (at most ${figure[$target.calls_peak]:--} up)"
  done
} | tee report.txt
status=0
for target in "${targets[@]}"; do
  if has_phase registrations && { [ "${figure[$target.register_sustained]}" != true ] ||
    [ "${figure[$target.invite_sustained]}" != true ]; }; then
    status=1
  fi
  if has_phase calls && [ "${figure[$target.calls_sustained]:-}" != true ]; then
    status=1
  fi
done
exit $status
