#!/bin/sh
# Pictures the editor while the messages window is open, as run.sh does without a display:
# picture_with_dialog.sh PICTURE_SCRIPT PROGRAM. Fails unless the pictures show that window and the
# editor is closed.
set -eu
script=$1
program=$2
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
export XDG_CONFIG_HOME="$folder/config"

# The number of pixels that have this colour.
pixels() {
    convert "$1" -format %c histogram:info: | awk -v colour="$2" '
        index($0, colour) { count = $1 }
        END { print count + 0 }'
}

printf '@misc{one, note = {a} title = {b}}\n' >"$folder/broken.bib"
for name in broken missing; do
    picture=$folder/$name.png
    export CARTULO_LOG="1:$folder/$name.log"
    "$script" "$picture" "$program" "$folder/$name.bib" || {
        cat "$folder/$name.log"
        exit 1
    }
    grep -q 'MyApp:OnExit End' "$folder/$name.log" || { echo "not closed" >&2; exit 1; }
    # The heading of the messages is red. Black is what no window covers; the texts have little.
    [ "$(pixels "$picture" '#C80000')" -gt 0 ] || { echo "$name: no messages" >&2; exit 1; }
    [ "$(pixels "$picture" '#000000')" -lt 10000 ] || { echo "$name: black areas" >&2; exit 1; }
done
