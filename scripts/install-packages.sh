#!/usr/bin/env bash
# Installs the Debian packages that a purpose needs and that are missing; does nothing, and asks the
# network nothing, when all are there.
# usage: scripts/install-packages.sh demo|test|analyse|coverage|charts
set -euo pipefail

build=(build-essential cmake ninja-build pkg-config)
tools=(libavcodec-dev libavformat-dev libavutil-dev libswscale-dev libsdl2-dev libpng-dev
    libcli11-dev)
tests=(git googletest ffmpeg xvfb xdotool libx11-dev openjdk-17-jdk-headless clang-format
    crossbuild-essential-armhf qemu-user libsimde-dev doxygen file
    libgstreamer1.0-dev libgstreamer-plugins-base1.0-dev gstreamer1.0-tools gstreamer1.0-plugins-base)
bench=(libbenchmark-dev libyuv-dev libzimg-dev libglib2.0-dev libavfilter-dev libpostproc-dev)

case "${1:-}" in
    demo) wanted=("${build[@]}" "${tools[@]}") ;;
    test) wanted=("${build[@]}" "${tools[@]}" "${tests[@]}" "${bench[@]}") ;;
    analyse) wanted=("${build[@]}" "${tools[@]}" cppcheck clang-tidy) ;;
    coverage) wanted=("${build[@]}" "${tests[@]}" gcovr) ;;
    charts) wanted=(python3-matplotlib) ;;
    *)
        echo "usage: scripts/install-packages.sh demo|test|analyse|coverage|charts" >&2
        exit 2
        ;;
esac

missing=()
for package in "${wanted[@]}"; do
    [ "$(dpkg-query -W -f '${db:Status-Status}' "$package" 2>/dev/null)" = installed ] ||
        missing+=("$package")
done
[ ${#missing[@]} -gt 0 ] || exit 0

if [ "$(id -u)" != 0 ]; then
    echo "install these Debian packages, or run this as root: ${missing[*]}" >&2
    exit 1
fi
echo "installing ${missing[*]}"
log=$(mktemp)
if ! { apt-get update -q &&
    DEBIAN_FRONTEND=noninteractive apt-get install -yq --no-install-recommends "${missing[@]}"; } \
    >"$log" 2>&1; then
    tail -n 20 "$log"
    echo "the packages could not be installed; the end of apt-get's output is above" >&2
    exit 1
fi
rm -f "$log"
