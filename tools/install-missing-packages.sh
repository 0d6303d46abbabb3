#!/usr/bin/env bash
# Installs those of the Debian packages named on the command line that the
# machine lacks, through sudo when not run as root. Installs nothing, and
# needs no network, when every package is there already.
set -euo pipefail

missing=()
for package in "$@"; do
  if ! dpkg-query -W -f='${Status}' "$package" 2>/dev/null | grep -q 'install ok installed'; then
    missing+=("$package")
  fi
done
if [ ${#missing[@]} -eq 0 ]; then
  exit 0
fi

sudo=""
if [ "$(id -u)" != 0 ]; then
  sudo=sudo
fi
echo "Installing ${missing[*]}" >&2
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
$sudo apt-get install -y --no-install-recommends "${missing[@]}"
