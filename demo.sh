#!/usr/bin/env bash
# Shows a real clip on a fresh Debian 12, as root: installs what is missing, builds vidshow-play and
# plays the sample clip, in a window where there is a display, else into pictures.
set -euo pipefail
cd "$(dirname "$(readlink -f "$0")")"

scripts/install-packages.sh demo

echo "building vidshow-play"
log=$(mktemp)
if ! { cmake --preset release -DVIDSHOW_BUILD_BENCH=OFF &&
    cmake --build --preset release --target vidshow-play; } >"$log" 2>&1; then
    tail -n 40 "$log"
    echo "demo.sh: vidshow-play does not build; the end of its output is above" >&2
    exit 1
fi
rm -f "$log"

if [ -n "${DISPLAY:-}${WAYLAND_DISPLAY:-}" ]; then
    echo "playing samples/street.mp4 (space pauses, q quits)"
    exec build/release/tools/vidshow-play samples/street.mp4
fi
build/release/tools/vidshow-play samples/street.mp4 --no-pace --window png:out/street
echo "the pictures are in $PWD/out/street; contact-sheet.png shows them all"
