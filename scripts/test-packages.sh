#!/usr/bin/env bash
# Installs Debian packages of this project into a fresh system of the machine's own release, builds and
# runs the installed examples there, and takes the packages away again. Wants root, debootstrap and the
# network; minutes on an idle machine.
# usage: scripts/test-packages.sh [FOLDER WITH THE PACKAGES]   default: build/package/packages
set -euo pipefail
cd "$(dirname "$(readlink -f "$0")")/.."

packages=$(readlink -f "${1:-build/package/packages}")
release=$(. /etc/os-release && echo "$VERSION_CODENAME")
mirror=${DEBIAN_MIRROR:-http://deb.debian.org/debian}
root=$(mktemp -d /tmp/vidshow-root.XXXXXX)
trap 'rm -rf --one-file-system "$root"' EXIT
chmod 755 "$root"

in_root() { timeout 1200 chroot "$root" env LC_ALL=C DEBIAN_FRONTEND=noninteractive "$@"; }
quietly() {
    "$@" >"$root.log" 2>&1 || {
        tail -n 40 "$root.log"
        echo "scripts/test-packages.sh: failed: $*" >&2
        exit 1
    }
}

echo "== a fresh $release in $root"
quietly timeout 1800 debootstrap --variant=minbase "$release" "$root" "$mirror"
mkdir "$root/packages"
cp "$packages"/*.deb "$root/packages"

echo "== installing $(cd "$packages" && echo *.deb)"
quietly in_root sh -c 'apt-get install -yq --no-install-recommends /packages/*.deb \
    g++ cmake make pkg-config'
in_root sh -c 'ldconfig -p | grep -q libvidshowhw2-19.so'

echo "== building the examples by CMake and pkg-config"
examples=/usr/share/doc/libvidshow-dev/examples
quietly in_root sh -c "cmake -S $examples -B /build && cmake --build /build &&
    ctest --test-dir /build --output-on-failure --no-tests=error"
quietly in_root sh -c "g++ -std=c++17 $examples/desktop_converter.cpp -o /converter \
    \$(pkg-config --cflags --libs vidshow) && /converter >/printed &&
    cmp /printed $examples/desktop_converter.expected"
for tool in "$root"/usr/bin/vidshow-*; do
    [ ! -e "$tool" ] || in_root "${tool#"$root"}" --version
done

echo "== removing them"
quietly in_root sh -c 'apt-get purge -yq "libvidshow*" && ! dpkg -l "libvidshow*" | grep -q ^ii'
left=$(find "$root/usr" -name '*vidshow*')
[ -z "$left" ] || { echo "left behind: $left" >&2; exit 1; }
rm -f "$root.log"
echo "== the packages install, work, and go"
