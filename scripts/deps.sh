#!/usr/bin/env bash
# Installs the Debian packages the build, the tests and the tools need; does nothing when all are present.
# Usage: scripts/deps.sh [all|native|windows]    (run as root, or with sudo available)
set -eu
what=${1:-all}

native=(cmake ninja-build g++ make pkg-config libgtest-dev googletest libgmock-dev libbenchmark-dev
        libpng-dev libopenimageio-dev openimageio-tools libcairo2-dev libcli11-dev clang libclang-rt-dev)
# The cross-build also compiles one small program for the build machine (the resource-script writer)
# and needs the posix-thread variant of the cross compiler (std::thread, std::mutex).
windows=(cmake ninja-build make g++ g++-mingw-w64-x86-64 g++-mingw-w64-x86-64-posix binutils-mingw-w64-x86-64
         libcli11-dev googletest wine64 wine)

case "$what" in
  native) want=("${native[@]}") ;;
  windows) want=("${windows[@]}") ;;
  all) want=("${native[@]}" "${windows[@]}") ;;
  *) echo "usage: $0 [all|native|windows]" >&2; exit 2 ;;
esac

missing=()
for p in "${want[@]}"; do
  dpkg-query -W -f='${Status}\n' "$p" 2>/dev/null | grep -q '^install ok installed$' || missing+=("$p")
done
[ ${#missing[@]} -eq 0 ] && exit 0

echo "deps: installing ${missing[*]}" >&2
sudo=""
[ "$(id -u)" -eq 0 ] || sudo="sudo"
export DEBIAN_FRONTEND=noninteractive
$sudo apt-get update -qq
$sudo apt-get install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
