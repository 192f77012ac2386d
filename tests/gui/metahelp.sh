#!/bin/sh
# Starts the help program on a display as the editor does: metahelp.sh METAHELP VERSION. Fails unless
# its window shows the manual and closes with the keyboard, and unless it says so when there is none.
set -eu
. "${0%/*}/wait.sh"
program=$1
version=$2
folder=$(mktemp -d)
help=
trap '[ -z "$help" ] || kill "$help" 2>/dev/null || true; rm -rf "$folder"' EXIT

fail() {
    echo "$1" >&2
    exit 1
}

# shows_manual KEY [TOPIC]
shows_manual() {
    key=$1
    shift
    "$program" "$@" 2>"$folder/errors" &
    help=$!
    until_done has_window "$help" '^Cartulo: the manual$' || fail "no window: $(cat "$folder/errors")"
    ends_with "$help" "$key" || fail "the window does not close with $key"
    wait "$help" || fail "the help program ended with status $?"
    help=
}

[ "$("$program" --version)" = "metahelp $version" ] || fail "wrong version"
case $(env -u DISPLAY "$program" --help) in
Usage:*.QRL.Cartulo*) ;;
*) fail "wrong help" ;;
esac
! "$program" --version >/dev/full || fail "--version did not fail"

# A second start brings the first one's window forward, and ends.
"$program" .QRL.Cartulo &
help=$!
until_done has_window "$help" '^Cartulo: the manual$' || fail "no window"
first=$window
timeout 60 "$program" .QRL.Cartulo || fail "the second start ended with status $?"
[ "$(xdotool search --all --onlyvisible --name '^Cartulo: the manual$')" = "$first" ] ||
    fail "there is a second window"
ends_with "$help" Escape || fail "the window does not close"
wait "$help" || fail "the help program ended with status $?"
help=

shows_manual ctrl+w .QRL.Cartulo
shows_manual Escape .QRL.Other
shows_manual Escape

# Alone in a folder, without its manual.
cp "$program" "$folder/metahelp"
status=0
env -u DISPLAY "$folder/metahelp" .QRL.Cartulo 2>"$folder/errors" || status=$?
[ "$status" -eq 1 ] || fail "status $status without a manual"
grep -q 'manual.html' "$folder/errors" || fail "nothing is said about the manual"
"$folder/metahelp" .QRL.Cartulo 2>"$folder/errors" &
help=$!
until_done has_window "$help" '^Cartulo$' || fail "no box about the missing manual"
ends_with "$help" Escape || fail "the box does not close"
status=0
wait "$help" || status=$?
help=
[ "$status" -eq 1 ] || fail "status $status behind the box"
