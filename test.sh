#!/usr/bin/env bash
# Passes all tests on a fresh Debian 12, as root: installs what is missing, then builds and runs the
# suite for 32-bit ARM under the emulator, under AddressSanitizer and UndefinedBehaviorSanitizer,
# under ThreadSanitizer (what has threads), and natively, in this order.
set -euo pipefail
cd "$(dirname "$(readlink -f "$0")")"

scripts/install-packages.sh test

run_preset() {
    local preset=$1
    shift
    echo "== $preset"
    local log
    log=$(mktemp)
    if ! { cmake --preset "$preset" && cmake --build --preset "$preset"; } >"$log" 2>&1; then
        tail -n 60 "$log"
        echo "test.sh: the preset $preset does not build; the end of its output is above" >&2
        exit 1
    fi
    rm -f "$log"
    ctest --preset "$preset" --progress --no-tests=error "$@"
}

run_preset armhf
run_preset asan-ubsan
run_preset tsan -L threads
run_preset dev
