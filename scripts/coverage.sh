#!/usr/bin/env bash
# Prints which lines and branches of the library no test runs, and the figures of every part; fails
# below 98 % of the lines or 92 % of the branches. What is left out, and why: docs/RELIABILITY.md.
# usage: scripts/coverage.sh [--no-run]      --no-run: of the tests that have run already
set -euo pipefail
cd "$(dirname "$(readlink -f "$0")")/.."

scripts/install-packages.sh coverage
readonly build=build/coverage
if [ "${1:-}" != --no-run ]; then
    cmake --preset coverage >/dev/null
    cmake --build --preset coverage
    find "$build" -name '*.gcda' -delete
    ctest --preset coverage --no-tests=error
fi

# Branches that only an exception would take are the compiler's, and nothing is thrown here.
report() {
    gcovr --root . --object-directory "$build" --exclude-throw-branches --exclude-unreachable-branches \
        --exclude-lines-by-pattern '.*\bstatic_assert\b.*' --exclude presenter/android/device "$@" "$build"
}

for part in kernels imageproc presenter platform; do
    printf '%-10s ' "$part"
    report --filter "$part/" --json-summary - |
        python3 -c 'import json, sys
s = json.load(sys.stdin)
for what in "line", "branch":
    covered, total = s[what + "_covered"], s[what + "_total"]
    print(f"{what} {covered}/{total} {100 * covered / total:.2f} %", end="   ")
print()'
done
report --filter kernels/ --filter imageproc/ --filter presenter/ --filter platform/ \
    --fail-under-line 98 --fail-under-branch 92
