#!/bin/sh
# Starts the program on a display as a user does and closes its window with the keyboard:
# start_and_close.sh PROGRAM. Fails unless the file is loaded, the configuration folder made, and
# the program ends well.
set -eu
program=$1
folder=$(mktemp -d)
editor=
trap '[ -z "$editor" ] || kill "$editor" 2>/dev/null || true; rm -rf "$folder"' EXIT

printf '@misc{one, note = {Note}}\n' >"$folder/Müller's refs.bib"
cd "$folder"
XDG_CONFIG_HOME=$folder/config/new CARTULO_LOG=1:$folder/log "$program" "Müller's refs" &
editor=$!

tries=0
until window=$(xdotool search --all --onlyvisible --pid "$editor" --name '^Quarlo Cartulo$'); do
    tries=$((tries + 1))
    [ "$tries" -lt 200 ] && kill -0 "$editor" || { echo "no window" >&2; exit 1; }
    sleep 0.1
done
# Right after the start the window manager may not heed the first requests.
while kill -0 "$editor" 2>/dev/null; do
    tries=$((tries + 1))
    [ "$tries" -lt 200 ] || { echo "the window does not close" >&2; exit 1; }
    xdotool windowactivate "$window" 2>/dev/null || true
    sleep 0.1
    [ "$(xdotool getactivewindow 2>/dev/null)" != "$window" ] || xdotool key alt+F4
    sleep 0.1
done
wait "$editor" || { echo "the editor ended with status $?" >&2; exit 1; }
editor=

grep -q "Loading: Müller's refs.bib" log || { cat log >&2; exit 1; }
grep -q 'MyApp:OnExit End' log || { cat log >&2; exit 1; }
[ -d config/new ] || { echo "no configuration folder" >&2; exit 1; }
