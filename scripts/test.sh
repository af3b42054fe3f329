#!/bin/sh
# The test command: installs what a fresh Debian 12 machine lacks, then configures, builds and runs
# every test in the given configurations (default: default, asan and m32).
set -eu
cd "$(dirname "$0")/.."

packages="cmake g++ g++-multilib python3 libgtest-dev googletest libbenchmark-dev libcli11-dev nlohmann-json3-dev prometheus gcovr lcov clang libclang-rt-14-dev binutils qemu-user"
missing=""
for p in $packages; do
    dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed" || missing="$missing $p"
done
if [ -n "$missing" ]; then
    echo "installing:$missing"
    SUDO=""
    [ "$(id -u)" -eq 0 ] || SUDO="sudo"
    $SUDO apt-get update -qq
    DEBIAN_FRONTEND=noninteractive $SUDO apt-get install -y -qq $missing
fi

presets="${*:-default asan m32}"
for preset in $presets; do
    echo "=== workflow $preset"
    cmake --workflow --preset "$preset"
done
