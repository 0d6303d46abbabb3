#!/usr/bin/env bash
# The console in one command: installs what the build needs, builds
# location-console (Release, in build-console/) when anything changed, and
# runs it with the arguments given; without any it runs the embedded
# default session.
set -euo pipefail
root="$(cd "$(dirname "$0")/.." && pwd)"

bash "$root/tools/install-missing-packages.sh" cmake make g++ pkg-config libre2-dev >&2
cmake -S "$root" -B "$root/build-console" -DCMAKE_BUILD_TYPE=Release -DLS_BUILD_TESTS=OFF >/dev/null
cmake --build "$root/build-console" --target location-console -j "${JOBS:-2}" >/dev/null
exec "$root/build-console/tools/console/location-console" "$@"
