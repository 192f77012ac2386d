#!/usr/bin/env bash
# Runs a command on a screen of its own, with a window manager and a message bus of its own, and
# passes its exit status on: with-display.sh COMMAND [ARGUMENT...]
# WINDOW_MANAGER=xfwm4 in the environment takes that one instead of openbox.
# Needs Xvfb, the window manager, xprop and dbus-daemon.
set -u

if [ $# -eq 0 ]; then
    echo "usage: with-display.sh COMMAND [ARGUMENT...]" >&2
    exit 2
fi

case ${WINDOW_MANAGER:=openbox} in
openbox) manage="openbox --sm-disable" ;;
xfwm4) manage="xfwm4 --compositor=off" ;;
*)
    echo "with-display.sh: unknown window manager: $WINDOW_MANAGER" >&2
    exit 2
    ;;
esac

seconds=60 # how long the screen and the window manager may take to come up
work=$(mktemp -d) || exit 125
screen= bus= manager= command=

# Ends what was started here, and nothing else. The command has a process group of its own.
clean_up() {
    [ -z "$command" ] || kill -- "-$command" 2>/dev/null
    for process in $command $manager $bus $screen; do
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
# It does not start afresh when a client leaves it alone: another one may be about to connect.
Xvfb -displayfd 3 -screen 0 1280x1024x24 -nolisten tcp -noreset 3>"$work/number" \
    >"$work/screen.log" 2>&1 9>&- &
screen=$!
exec 4<>"$work/number"
read -r -t "$seconds" number <&4 || fail "the screen did not start"
exec 4<&-
exec 9>&- # the next may start

export DISPLAY=:$number GDK_BACKEND=x11
export NO_AT_BRIDGE=${NO_AT_BRIDGE-1} # the accessibility bus would only add noise
unset WAYLAND_DISPLAY

# Services that the bus starts, and the window manager, leave the user's own settings alone.
XDG_CONFIG_HOME=$work dbus-daemon --session --nofork --print-address=3 3>"$work/address" \
    >"$work/bus.log" 2>&1 &
bus=$!
end=$((SECONDS + seconds))
until [ -s "$work/address" ]; do
    kill -0 "$bus" 2>/dev/null || fail "the message bus ended"
    [ "$SECONDS" -lt "$end" ] || fail "the message bus did not start"
    sleep 0.02
done
DBUS_SESSION_BUS_ADDRESS=$(cat "$work/address")
export DBUS_SESSION_BUS_ADDRESS

XDG_CONFIG_HOME=$work $manage >"$work/manager.log" 2>&1 &
manager=$!
# A window manager that is ready names its window on the root window.
end=$((SECONDS + seconds))
until xprop -root _NET_SUPPORTING_WM_CHECK 2>/dev/null | grep -q 'window id'; do
    kill -0 "$manager" 2>/dev/null || fail "the window manager ended"
    [ "$SECONDS" -lt "$end" ] || fail "the window manager did not start"
    sleep 0.05
done

setsid "$@" &
command=$!
wait "$command"
status=$?
command=
exit "$status"
