#!/bin/sh
# Starts the editor on the present display and writes a picture of its windows as a user sees them,
# dialogs on top: picture.sh PICTURE PROGRAM [ARGUMENT...]. Then closes them as a user would, and
# ends the editor if that takes too long.
set -eu
picture=$1
shift

"$@" &
program=$!
trap 'kill "$program" 2>/dev/null || true' EXIT
trap 'exit 129' HUP
trap 'exit 130' INT
trap 'exit 143' TERM

runs() {
    kill -0 "$program" 2>/dev/null
}

# Runs a command until it succeeds, for about 20 seconds at the most.
until_done() {
    tries=0
    until "$@"; do
        tries=$((tries + 1))
        [ "$tries" -lt 200 ] && runs || return 1
        sleep 0.1
    done
}

windows() {
    xdotool search --all --onlyvisible --pid "$program" --name . 2>/dev/null
}

has_window() {
    [ -n "$(windows)" ]
}

# The part of the screen that the windows take up.
place() {
    for window in $(windows); do
        xwininfo -id "$window" 2>/dev/null || true
    done | awk '
        /Absolute upper-left X:/ { x = $NF; if (left == "" || x < left) left = x }
        /Absolute upper-left Y:/ { y = $NF; if (top == "" || y < top) top = y }
        /Width:/ && x + $NF > right { right = x + $NF }
        /Height:/ && y + $NF > bottom { bottom = y + $NF }
        END { printf "%dx%d+%d+%d\n", right - left, bottom - top, left, top }'
}

# All is drawn when some pictures in a row are the same, and not of one colour.
same=0
before=
is_drawn() {
    import -window root -crop "$(place)" +repage "$picture" 2>/dev/null || return 1
    seen=$(identify -format '%# %k' "$picture")
    [ "$seen" = "$before" ] && same=$((same + 1)) || same=0
    before=$seen
    [ "$same" -ge 5 ] && [ "${seen##* }" -gt 8 ]
}

# One round of Alt+F4. A window with a dialog above it does not heed it.
close_windows() {
    for window in $(windows); do
        xdotool windowactivate "$window" 2>/dev/null || continue
        sleep 0.1
        [ "$(xdotool getactivewindow 2>/dev/null)" != "$window" ] || xdotool key alt+F4
    done
    sleep 0.1
}

rm -f "$picture"
until_done has_window || { echo "The editor showed no window." >&2; exit 1; }
until_done is_drawn || { echo "The editor's window was not drawn." >&2; exit 1; }

rounds=0
while runs; do
    rounds=$((rounds + 1))
    [ "$rounds" -le 30 ] || { echo "The editor's windows did not close." >&2; exit 1; }
    close_windows
done
trap - EXIT
wait "$program"
