#!/usr/bin/env bash
# Counts the guest instructions per pixel of the NEON kernels under the emulator, beside the same work
# by their portable forms and libyuv's NEON rows, and prints a table. Fetches libyuv's source package
# from Debian on the first run (nothing is installed); wants a cross compiler, qemu-user, dpkg-dev.
# usage: tools/count/count-neon.sh [build directory]
set -euo pipefail

root=$(cd "$(dirname "$0")/../.." && pwd)
build=${1:-$root/build/count}
mkdir -p "$build"

# With lists of its own, apt needs neither root nor source entries in the system's.
fetch_libyuv() {
    local apt=$build/apt
    mkdir -p "$apt/lists/partial" "$apt/cache/archives/partial"
    cat >"$apt/debian.sources" <<EOF
Types: deb-src
URIs: http://deb.debian.org/debian
Suites: bookworm
Components: main
Signed-By: /usr/share/keyrings/debian-archive-keyring.gpg
EOF
    local options=(-qq -o "Dir::Etc::SourceList=$apt/debian.sources" -o Dir::Etc::SourceParts=-
        -o "Dir::State::Lists=$apt/lists" -o "Dir::Cache=$apt/cache")
    apt-get "${options[@]}" update
    (cd "$apt" && apt-get "${options[@]}" source --download-only libyuv)
    dpkg-source --no-check -x "$apt"/libyuv_*.dsc "$build/libyuv" >"$apt/unpack.log"
}

[ -d "$build/libyuv" ] || fetch_libyuv >&2
g++ -O2 -shared -fPIC -o "$build/instruction_counter.so" "$root/tools/count/instruction_counter.cpp"
{
    cmake -S "$root" --preset armhf -B "$build/armhf" -DCMAKE_BUILD_TYPE=Release \
        -DVIDSHOW_BUILD_TESTS=OFF -DVIDSHOW_LIBYUV_SOURCE="$build/libyuv"
    cmake --build "$build/armhf" --target neon_pixels
} >"$build/build.log" || { tail "$build/build.log" >&2; exit 1; }

program=$build/armhf/tools/count/neon_pixels
count() { # WHO CONVERSION PASSES
    qemu-arm -plugin "$build/instruction_counter.so" "$program" "$@" 2>&1
}

# Two runs that differ in the passes alone: what starting costs falls out.
per_pixel() { # WHO CONVERSION
    local twice once
    twice=$(count "$1" "$2" 2)
    once=$(count "$1" "$2" 1)
    awk -v n=$((twice - once)) 'BEGIN { printf "%.2f", n / (640 * 480) }'
}

echo "| conversion | ours | portable | libyuv |"
echo "|---|--:|--:|--:|"
qemu-arm "$program" list | while read -r conversion; do
    name=${conversion/-/ -> }
    printf '| %s | %s | %s | %s |\n' "${name//_/ }" "$(per_pixel ours "$conversion")" \
        "$(per_pixel portable "$conversion")" "$(per_pixel libyuv "$conversion")"
done
