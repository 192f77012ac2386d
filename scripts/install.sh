#!/bin/sh
# Installs the Debian packages that are missing: install.sh build [screen] [test]
set -eu

build="g++ cmake ninja-build ccache pkg-config libwxgtk3.2-dev libgtk-3-dev libx11-dev
       libbtparse-dev libicu-dev libgtest-dev libgmock-dev libbenchmark-dev cmark"
# A private screen with a window manager, and pictures of it.
screen="xvfb openbox xfwm4 x11-utils dbus-daemon xdotool wmctrl imagemagick fonts-dejavu-core
        adwaita-icon-theme"
test="locales python3 texlive-binaries"

missing=
for group in "$@"; do
    eval "packages=\$$group"
    for package in $packages; do
        dpkg-query -W -f '${db:Status-Status}\n' "$package" 2>/dev/null | grep -qx installed ||
            missing="$missing $package"
    done
done
[ -n "$missing" ] || exit 0

echo "Installing:$missing" >&2
sudo=
[ "$(id -u)" -eq 0 ] || sudo=sudo
$sudo apt-get update -q >&2
# shellcheck disable=SC2086
$sudo env DEBIAN_FRONTEND=noninteractive apt-get install -y -q --no-install-recommends $missing >&2
