#!/usr/bin/env bash
# A change to the "DEFAULT" group over the control socket while the gateway
# serves a refresh storm: builds location-gateway (Release, in BUILD, by
# default build-gateway-bench/), loads SUBSCRIBERS (default 100,000)
# subscribers inheriting "DEFAULT" (generate.sh), registers every one with
# SIPp at REGISTER_RATE, then has SIPp refresh them at REFRESH_RATE (by
# default 4,900/s, half the highest rate at which the storm ran clean in the
# README's figures) while CHANGES lines go over the socket a second apart,
# each setting the group's inbound-registration lifetime range anew (every
# member inherits it, and every watcher of a member is told). Reports the
# time from each line sent to its answer (measured by the client, connected
# beforehand), and the failed and retransmitted requests of the refresh.
# Every process is bounded in time and stopped at the end.
set -euo pipefail
root="$(cd "$(dirname "$0")/../.." && pwd)"
here="$root/bench/gateway"
subscribers=${SUBSCRIBERS:-100000}
register_rate=${REGISTER_RATE:-2000}
refresh_rate=${REFRESH_RATE:-4900}
changes=${CHANGES:-10}
build=${BUILD:-"$root/build-gateway-bench"}
work="$build/bench-live-change"

bash "$root/tools/install-missing-packages.sh" cmake make g++ pkg-config libre2-dev libre-dev libssl-dev sip-tester >&2
cmake -S "$root" -B "$build" -DCMAKE_BUILD_TYPE=Release -DLS_BUILD_TESTS=OFF -DLS_BUILD_GATEWAY=ON >/dev/null
cmake --build "$build" --target location-gateway -j "${JOBS:-2}" >/dev/null

rm -rf "$work"
mkdir -p "$work"
cd "$work"
bash "$here/generate.sh" "$subscribers" .

gateway_pid=""
sipp_pid=""
cleanup() {
  [ -n "$sipp_pid" ] && kill -KILL "$sipp_pid" 2>/dev/null
  [ -n "$gateway_pid" ] && kill -TERM "$gateway_pid" 2>/dev/null
  return 0
}
trap cleanup EXIT

# SIPp answers only an MD5 first challenge, its digest over -auth_uri.
"$build/gateway/location-gateway" --listen 127.0.0.1:0 --control "$work/control.sock" --digest MD5 subscribers.script \
  >/dev/null 2>gateway.err &
gateway_pid=$!
for _ in $(seq 600); do
  grep -q "control socket" gateway.err && break
  kill -0 "$gateway_pid" || { cat gateway.err >&2; exit 1; }
  sleep 0.1
done
address=$(sed -n 's/^location-gateway: listening on udp:\(127[^ ]*\).*$/\1/p' gateway.err | head -n 1)

# statistic FILE NAME: field NAME of the last line of a SIPp statistics file.
statistic() {
  awk -F';' -v name="$2" 'NR == 1 { for (i = 1; i <= NF; ++i) if ($i == name) column = i }
    END { print $column + 0 }' "$1"
}
sipp_run() {
  local label=$1 rate=$2 limit=$3
  timeout $((limit + 10)) sipp "$address" -sf "$here/register.xml" -inf users.csv -m "$subscribers" -r "$rate" \
    -i 127.0.0.1 -auth_uri example.com -nostdin -timeout "${limit}s" -timeout_error -trace_stat -stf "$label.csv" \
    -fd 3600 \
    >"$label.log" 2>&1
}

echo "registering $subscribers subscribers at $register_rate/s" >&2
sipp_run register "$register_rate" $((subscribers / register_rate + 60)) || true
echo "registered: $(statistic register.csv 'SuccessfulCall(C)') of $subscribers" >&2

refresh_seconds=$((subscribers / refresh_rate))
echo "refreshing at $refresh_rate/s for about ${refresh_seconds} s; $changes changes meanwhile" >&2
sipp_run refresh "$refresh_rate" $((refresh_seconds + 60)) &
sipp_pid=$!
sleep 5
/usr/bin/python3 - "$work/control.sock" "$changes" >changes.txt <<'PYTHON'
import socket, sys, time
path, count = sys.argv[1], int(sys.argv[2])
client = socket.socket(socket.AF_UNIX, socket.SOCK_STREAM)
client.settimeout(30)
client.connect(path)
for i in range(count):
    line = f"face example.com DEFAULT registration-inbound lifetime-range set 60 7200 {3000 + i}\n"
    start = time.monotonic()
    client.sendall(line.encode())
    data = b""
    while not (data.endswith(b"\0ok\n") or data.endswith(b"\0failed\n")):
        data += client.recv(65536)
    elapsed = time.monotonic() - start
    status = "ok" if data.endswith(b"\0ok\n") else "failed"
    print(f"{elapsed * 1000:.1f} {status}")
    time.sleep(1)
PYTHON
wait "$sipp_pid" || true
sipp_pid=""

sort -n changes.txt | awk -v n="$changes" '
  { ms[NR] = $1; if ($2 != "ok") bad++ }
  END { printf "change to DEFAULT answered in: median %.1f ms, max %.1f ms (%d lines, %d failed)\n",
        ms[int((NR + 1) / 2)], ms[NR], NR, bad }' | tee report.txt
printf 'refresh at %s/s: %s succeeded, %s failed, %s retransmissions\n' "$refresh_rate" \
  "$(statistic refresh.csv 'SuccessfulCall(C)')" "$(statistic refresh.csv 'FailedCall(C)')" \
  "$(statistic refresh.csv 'Retransmissions(C)')" | tee -a report.txt
