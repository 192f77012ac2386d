#!/bin/sh
# What the program prints without a display: answer_without_display.sh PROGRAM VERSION. Fails unless
# the answers are right and it ends well, and badly when it cannot print them.
set -eu
program=$1
version=$2
unset DISPLAY WAYLAND_DISPLAY

[ "$("$program" --version)" = "cartulo $version" ]
help=$("$program" --help)
for word in Usage: -dFOLDER/ -eNAME --help --version CARTULO_LOG=; do
    case $help in
    *"$word"*) ;;
    *) echo "the help lacks $word" >&2; exit 1 ;;
    esac
done
[ "$("$program" -h)" = "$help" ]
for option in --version --help; do
    ! "$program" "$option" >/dev/full || { echo "$option did not fail" >&2; exit 1; }
done
