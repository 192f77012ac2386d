#!/bin/sh
# Installs what is missing, builds, and starts the editor: run.sh [options and BIB files]
# Without a display it runs on a virtual screen, and a picture of its window is written.
set -eu
here=$(cd "$(dirname "$0")" && pwd)

display=${DISPLAY:-}${WAYLAND_DISPLAY:-}
if [ -n "$display" ]; then
    "$here/scripts/install.sh" build
else
    "$here/scripts/install.sh" build screen
fi
(
    cd "$here"
    [ -e build/release/build.ninja ] || cmake --preset release >&2
    cmake --build --preset release --target cartulo >&2
)

[ $# -gt 0 ] || set -- "$here/resources/sample.bib"
if [ -n "$display" ]; then
    exec "$here/build/release/cartulo" "$@"
fi
for argument in "$@"; do
    case $argument in
    --help | --version) exec "$here/build/release/cartulo" "$@" ;;
    esac
done
picture=$here/build/window.png
rm -f "$picture"
echo "No display: the editor runs on a virtual screen." >&2
status=0
"$here/scripts/with-display.sh" "$here/scripts/picture.sh" "$picture" \
    "$here/build/release/cartulo" "$@" || status=$?
[ ! -e "$picture" ] || echo "A picture of its window: $picture"
exit "$status"
