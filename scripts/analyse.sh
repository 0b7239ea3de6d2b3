#!/usr/bin/env bash
# Static analysis: fails on a finding. cppcheck looks at the library, the host and the tools; GCC's
# analyzer and clang-tidy (its checks: .clang-tidy) at the library, `tidy-tools` at the other two.
# usage: scripts/analyse.sh [cppcheck] [gcc] [tidy] [tidy-tools]     the first three if none is named
set -euo pipefail
cd "$(dirname "$(readlink -f "$0")")/.."

readonly build=build/analyse
readonly library='kernels|imageproc|presenter|platform'

scripts/install-packages.sh analyse

# The commands that would build the sources below some folders, a line each: folder, file, command.
# Left out are the files that only give the linker the device's names.
commands() {
    cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo -DVIDSHOW_BUILD_TESTS=OFF \
        -DVIDSHOW_BUILD_TOOLS=ON -DVIDSHOW_WARNINGS_AS_ERRORS=ON -DCMAKE_CXX_COMPILER_LAUNCHER= >/dev/null
    python3 - "$build/compile_commands.json" "$PWD/($1)/" <<'EOF'
import json, re, sys
for entry in json.load(open(sys.argv[1])):
    if re.match(sys.argv[2], entry["file"]) and "/android/device/" not in entry["file"]:
        print(entry["directory"], entry["file"], entry["command"], sep="\t")
EOF
}

run_cppcheck() {
    cppcheck --enable=warning,performance,portability --std=c++17 --language=c++ --quiet -j "$(nproc)" \
        --suppressions-list=scripts/cppcheck-suppressions.txt \
        --error-exitcode=1 -I . -I include -I host/include -I host/jni -I tools \
        -i presenter/android/device kernels imageproc presenter platform host tools
}

# This analyzer is made for C. It follows memory, descriptors and null pointers along the calls of a
# file; of C++ it knows neither exceptions nor what `new` promises, so it is asked about the library
# alone. Shifts of vectors and objects that a call returns it misreads.
run_gcc() {
    local flags="-fanalyzer -fdiagnostics-path-format=none -Wno-analyzer-shift-count-overflow"
    flags+=" -Wno-analyzer-use-of-uninitialized-value"
    commands "$library" | cut -f 1,3 | sed "s|^\(.*\)\t\(.*\)|cd \1 \&\& \2 -o /dev/null $flags|" |
        xargs -d '\n' -P "$(nproc)" -I{} bash -c '{}'
}

run_tidy() {
    commands "$1" | cut -f 2 |
        xargs -P "$(nproc)" -n 1 clang-tidy -p "$build" --quiet \
            --extra-arg=-Wno-unknown-warning-option 2>"$build/tidy-errors" ||
        { grep -v 'warnings\? generated' "$build/tidy-errors" >&2; return 1; }
}

[ $# -gt 0 ] || set -- cppcheck gcc tidy
for check in "$@"; do
    echo "== $check"
    case $check in
        cppcheck) run_cppcheck ;;
        gcc) run_gcc ;;
        tidy) run_tidy "$library" ;;
        tidy-tools) run_tidy 'tools|host' ;;
        *)
            echo "usage: scripts/analyse.sh [cppcheck] [gcc] [tidy] [tidy-tools]" >&2
            exit 2
            ;;
    esac
done
