#!/bin/sh
# Starts a program that is linked so that the parser's messages do not reach it:
# refuse_without_hook.sh PROGRAM. Fails unless it says so, in a box and on standard error, opens no
# window, and ends with a failure status.
set -eu
. "${0%/*}/wait.sh"
program=$1
folder=$(mktemp -d)
editor=
trap '[ -z "$editor" ] || kill "$editor" 2>/dev/null || true; rm -rf "$folder"' EXIT

printf '@misc{one, note = {Note}}\n' >"$folder/refs.bib"
XDG_CONFIG_HOME=$folder CARTULO_LOG=1:$folder/log "$program" "$folder/refs.bib" 2>"$folder/errors" &
editor=$!

until_done has_window "$editor" '^Cartulo$' || { echo "there was no box" >&2; exit 1; }
ends_with "$editor" Return || { echo "the box does not close" >&2; exit 1; }
status=0
wait "$editor" || status=$?
editor=

[ "$status" -ne 0 ] || { echo "the program ended as if all were well" >&2; exit 1; }
grep -q "messages of the BibTeX parser do not reach this program" "$folder/errors"
! grep -q "Loading:" "$folder/log"
