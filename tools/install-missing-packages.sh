#!/usr/bin/env bash
# Installs those of the Debian packages named on the command line that the
# machine lacks, through sudo when not run as root. Installs nothing, and
# needs no network, when every package is there already. A package of
# another architecture ("libre2-dev:armhf") adds that architecture first.
#
# usage: install-missing-packages.sh [--refresh] PACKAGE...
# With --refresh the package lists are updated and every package named is
# installed as on a new machine, whether or not it is there.
set -euo pipefail

refresh=false
if [ "${1:-}" = --refresh ]; then
  refresh=true
  shift
fi
sudo=""
if [ "$(id -u)" != 0 ]; then
  sudo=sudo
fi

for package in "$@"; do
  case $package in
    *:*)
      architecture=${package##*:}
      if ! dpkg --print-foreign-architectures | grep -qx "$architecture"; then
        $sudo dpkg --add-architecture "$architecture"
      fi
      ;;
  esac
done

wanted=("$@")
if [ $refresh = false ]; then
  wanted=()
  for package in "$@"; do
    if ! dpkg-query -W -f='${Status}' "$package" 2>/dev/null | grep -q 'install ok installed'; then
      wanted+=("$package")
    fi
  done
fi
if [ ${#wanted[@]} -eq 0 ]; then
  exit 0
fi

echo "Installing ${wanted[*]}" >&2
export DEBIAN_FRONTEND=noninteractive
# A mirror caught mid-sync fails an update of one index now and then: try
# again, then go on with the lists there are; the install itself must work.
for attempt in 1 2 3; do
  if $sudo apt-get update; then
    break
  fi
  echo "package-list update failed (attempt $attempt)" >&2
  sleep 5
done
# A package that is Multi-Arch: same must be at one version in every
# architecture. When another architecture's index lags behind the native
# one's (its security mirror failing to update, say), the resolver refuses
# the install. Then every package its complaint names (those it could not
# install and those they depend on or break) is installed in the native and
# each foreign architecture at the highest version both have, and the
# install is tried once more.
log=$(mktemp)
trap 'rm -f "$log"' EXIT
if $sudo apt-get install -y --no-install-recommends "${wanted[@]}" 2>&1 | tee "$log"; then
  exit 0
fi
# The versions of PACKAGE the indexes offer, one a line.
versions() { apt-cache madison "$1" | awk -F'|' '{ gsub(/ /, "", $2); print $2 }'; }
foreign=$(printf '%s\n' "${wanted[@]}" | sed -n 's/^[^:]*:\(.*\)$/\1/p' | sort -u)
named=$({
  sed -n 's/^ *\([a-z0-9][a-z0-9.+-]*\)\(:[a-z0-9]*\)\{0,1\} : .*/\1/p' "$log"
  sed -n 's/.*\(Depends\|Breaks\): \([a-z0-9][a-z0-9.+-]*\).*/\2/p' "$log"
} | sort -u)
aligned=()
for name in $named; do
  for architecture in $foreign; do
    best=""
    for version in $(versions "$name"); do
      if versions "$name:$architecture" | grep -qxF "$version" &&
        { [ -z "$best" ] || dpkg --compare-versions "$version" gt "$best"; }; then
        best=$version
      fi
    done
    if [ -n "$best" ]; then
      aligned+=("$name=$best" "$name:$architecture=$best")
    fi
  done
done
if [ ${#aligned[@]} -eq 0 ]; then
  exit 1
fi
echo "Aligning ${aligned[*]}" >&2
# The packages wanted that were aligned go in at their aligned version only.
rest=()
for package in "${wanted[@]}"; do
  native=${package%:*}
  case " ${aligned[*]} " in
    *" $package="* | *" $native="*) ;;
    *) rest+=("$package") ;;
  esac
done
$sudo apt-get install -y --no-install-recommends --allow-downgrades "${aligned[@]}" "${rest[@]}"
