#!/bin/sh
# Starts the program on a display as a user does and closes its window with the keyboard:
# start_and_close.sh PROGRAM. Fails unless the file is loaded, the configuration folder made, and
# the program ends well.
set -eu
. "${0%/*}/wait.sh"
program=$1
folder=$(mktemp -d)
editor=
trap '[ -z "$editor" ] || kill "$editor" 2>/dev/null || true; rm -rf "$folder"' EXIT

printf '@misc{one, note = {Note}}\n' >"$folder/Müller's refs.bib"
cd "$folder"
XDG_CONFIG_HOME=$folder/config/new CARTULO_LOG=1:$folder/log "$program" "Müller's refs" &
editor=$!

until_done has_window "$editor" '^Quarlo Cartulo$' || { echo "no window" >&2; exit 1; }
ends_with "$editor" alt+F4 || { echo "the window does not close" >&2; exit 1; }
wait "$editor" || { echo "the editor ended with status $?" >&2; exit 1; }
editor=

grep -q "Loading: Müller's refs.bib" log || { cat log >&2; exit 1; }
grep -q 'MyApp:OnExit End' log || { cat log >&2; exit 1; }
[ -d config/new ] || { echo "no configuration folder" >&2; exit 1; }
