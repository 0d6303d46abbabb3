#!/usr/bin/env bash
# Builds the Debian packages (liblocationservice1, liblocationservice-dev,
# location-gateway) into DIR with Debian's hardening flags, for this
# machine or, with --armhf, cross-built for 32-bit ARM:
#
#   bash tools/build-packages.sh [--armhf] [DIR]   (default build-deb or build-deb-armhf)
#
# which is: dpkg-buildflags' flags for the target's architecture, a
# Release build with debug information of the packaged targets only, and
# `cpack -G DEB` in the build directory.
set -euo pipefail
root="$(cd "$(dirname "$0")/.." && pwd)"

arch=$(dpkg --print-architecture)
toolchain=()
if [ "${1:-}" = "--armhf" ]; then
  arch=armhf
  toolchain=(-DCMAKE_TOOLCHAIN_FILE="$root/cmake/armhf-linux.cmake")
  shift
fi
dir=${1:-$root/build-deb$([ "$arch" = armhf ] && echo -armhf)}

# The target's DEB_HOST_* variables: dpkg-buildflags gives its flags, and
# dpkg-shlibdeps (run by cpack) looks for its libraries.
eval "$(dpkg-architecture -a"$arch" -s 2>/dev/null)"
export DEB_BUILD_MAINT_OPTIONS=hardening=+all
flags() { dpkg-buildflags --get "$1"; }
cmake -S "$root" -B "$dir" "${toolchain[@]}" -DCMAKE_BUILD_TYPE=RelWithDebInfo -DCMAKE_INSTALL_PREFIX=/usr \
  -DCMAKE_INSTALL_LIBDIR="lib/$DEB_HOST_MULTIARCH" -DLS_BUILD_TESTS=OFF \
  -DLS_BUILD_GATEWAY=ON -DCMAKE_CXX_FLAGS_RELWITHDEBINFO="$(flags CXXFLAGS) $(flags CPPFLAGS) -DNDEBUG" \
  -DCMAKE_EXE_LINKER_FLAGS="$(flags LDFLAGS)" -DCMAKE_SHARED_LINKER_FLAGS="$(flags LDFLAGS)"
cmake --build "$dir" -j "${JOBS:-2}" --target locationservice_shared location-gateway location-console
(cd "$dir" && cpack -G DEB)
ls "$dir"/*.deb
