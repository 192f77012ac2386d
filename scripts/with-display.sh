#!/usr/bin/env bash
# Runs a command on a screen of its own, with a window manager and a message bus of its own, and
# passes its exit status on: with-display.sh COMMAND [ARGUMENT...]
# Needs Xvfb, openbox, xprop and dbus-run-session.
set -u

if [ $# -eq 0 ]; then
    echo "usage: with-display.sh COMMAND [ARGUMENT...]" >&2
    exit 2
fi

seconds=30 # how long the screen and the window manager may take to come up
work=$(mktemp -d) || exit 125
screen= manager= command=

# Ends what was started here, and nothing else. The command has a process group of its own.
clean_up() {
    [ -z "$command" ] || kill -- "-$command" 2>/dev/null
    for process in $command $manager $screen; do
        kill "$process" 2>/dev/null
        wait "$process" 2>/dev/null
    done
    rm -rf "$work"
}
trap clean_up EXIT
trap 'exit 129' HUP
trap 'exit 130' INT
trap 'exit 143' TERM

fail() {
    echo "with-display.sh: $1" >&2
    cat "$work"/*.log >&2
    exit 125
}

# The server picks a free display and writes its number once it listens. Two that start at the same
# moment may pick the same one, so one starts after the other.
exec 9>"${TMPDIR:-/tmp}/with-display-$(id -u).lock"
flock -w "$seconds" 9 || fail "another screen takes too long to start"
mkfifo "$work/number"
Xvfb -displayfd 3 -screen 0 1280x1024x24 -nolisten tcp 3>"$work/number" \
    >"$work/screen.log" 2>&1 9>&- &
screen=$!
exec 4<>"$work/number"
read -r -t "$seconds" number <&4 || fail "the screen did not start"
exec 4<&-
exec 9>&- # the next may start

export DISPLAY=:$number GDK_BACKEND=x11
export NO_AT_BRIDGE=${NO_AT_BRIDGE-1} # the accessibility bus would only add noise
unset WAYLAND_DISPLAY

openbox --sm-disable >"$work/manager.log" 2>&1 &
manager=$!
# A window manager that is ready names its window on the root window.
end=$((SECONDS + seconds))
until xprop -root _NET_SUPPORTING_WM_CHECK 2>/dev/null | grep -q 'window id'; do
    kill -0 "$manager" 2>/dev/null || fail "the window manager ended"
    [ "$SECONDS" -lt "$end" ] || fail "the window manager did not start"
    sleep 0.05
done

setsid dbus-run-session -- "$@" &
command=$!
wait "$command"
status=$?
command=
exit "$status"
