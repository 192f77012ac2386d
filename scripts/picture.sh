#!/bin/sh
# Starts the editor on the present display and writes a picture of its window:
# picture.sh PICTURE PROGRAM [ARGUMENTS]. The editor is closed again as a user would.
set -eu
picture=$1
shift

"$@" &
program=$!
trap 'kill "$program" 2>/dev/null || true' EXIT

# Runs a command until it succeeds, for 20 seconds at the most.
until_done() {
    tries=0
    until "$@"; do
        tries=$((tries + 1))
        [ "$tries" -lt 200 ] || return 1
        kill -0 "$program" 2>/dev/null || return 1
        sleep 0.1
    done
}

find_window() {
    window=$(xdotool search --onlyvisible --pid "$program" --name "Cartulo" 2>/dev/null | head -n 1)
    [ -n "$window" ]
}

# The window is drawn when two pictures in a row are the same and not of one colour.
is_drawn() {
    [ ! -e "$picture" ] || mv "$picture" "$picture.before"
    import -window "$window" "$picture" 2>/dev/null || return 1
    [ -e "$picture.before" ] && cmp -s "$picture" "$picture.before" &&
        [ "$(identify -format %k "$picture")" -gt 8 ]
}

rm -f "$picture" "$picture.before"
until_done find_window || { echo "The editor showed no window." >&2; exit 1; }
until_done is_drawn || { echo "The editor's window was not drawn." >&2; exit 1; }
rm -f "$picture.before"

xdotool windowactivate --sync "$window" key alt+F4
trap - EXIT
wait "$program"
