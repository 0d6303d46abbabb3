# Sourced by the gateway's test runners.
#
# await_line FILE PATTERN: waits until FILE holds a line matching PATTERN;
# false after wait_limit seconds, or at once when the process gateway_pid
# names, if the runner set it, has exited without writing it.
await_line() {
  local file=$1 pattern=$2 tenths=$((wait_limit * 10))
  while ((tenths-- > 0)); do
    grep -q -- "$pattern" "$file" 2>/dev/null && return 0
    [[ -n ${gateway_pid:-} ]] && ! kill -0 "$gateway_pid" 2>/dev/null && return 1
    sleep 0.1
  done
  return 1
}
