#!/usr/bin/env bash
# Passes all tests on a fresh Debian 12, as root: installs what is missing, then builds and runs the
# suite for 32-bit ARM under the emulator, natively, and under the sanitizers (tsan: what has threads).
# usage: ./test.sh [PRESET...]   one more preset: coverage
set -euo pipefail
cd "$(dirname "$(readlink -f "$0")")"

scripts/install-packages.sh test

run_preset() {
    local preset=$1
    local log selection=()
    [ "$preset" != tsan ] || selection=(-L threads)
    echo "== $preset"
    log=$(mktemp)
    if ! { cmake --preset "$preset" && cmake --build --preset "$preset"; } >"$log" 2>&1; then
        tail -n 60 "$log"
        echo "test.sh: the preset $preset does not build; the end of its output is above" >&2
        exit 1
    fi
    rm -f "$log"
    ctest --preset "$preset" --no-tests=error "${selection[@]}"
}

[ $# -gt 0 ] || set -- armhf dev asan-ubsan tsan
for preset in "$@"; do
    run_preset "$preset"
done
