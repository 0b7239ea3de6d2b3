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

# Branches that only an exception would take are the compiler's, and nothing is thrown here. The
# kernels' tests compile some of the kernels once more for themselves, with exceptions. What only an
# AVX-512 processor runs is counted there alone; elsewhere a test runs it in a portable form. Threads
# that count at once can leave a count below zero, which gcovr takes for nonsense unless it is told.
left_out=(--exclude presenter/android/device --exclude-directories '.*/(tests/kernels|fuzz)(/|$)')
grep -q avx512bw /proc/cpuinfo || left_out+=(--exclude kernels/x86/vec_avx512.cpp)
gcovr -j "$(nproc)" --root . --object-directory "$build" --exclude-throw-branches \
    --exclude-unreachable-branches --filter '(kernels|imageproc|presenter|platform)/' \
    --gcov-ignore-parse-errors "${left_out[@]}" --json "$build/coverage.json" \
    --json-summary "$build/summary.json" "$build/CMakeFiles" "$build/kernels"
gcovr --root . --add-tracefile "$build/coverage.json"
gcovr --root . --add-tracefile "$build/coverage.json" --branches

python3 - "$build/summary.json" <<'EOF'
import json, sys
files = json.load(open(sys.argv[1]))["files"]
def share(part, what):
    chosen = [file for file in files if file["filename"].startswith(part)]
    covered, total = (sum(file[f"{what}_{kind}"] for file in chosen) for kind in ("covered", "total"))
    print(f"{part or 'all':12}{what:8}{covered:6} of {total:6}{100 * covered / max(total, 1):8.2f} %")
    return 100 * covered / max(total, 1)
for part in "kernels/", "imageproc/", "presenter/", "platform/":
    share(part, "line"), share(part, "branch")
enough = share("", "line") >= 98, share("", "branch") >= 92
sys.exit(0 if all(enough) else 1)
EOF
