# What the scripts beside this one wait for; they read it with ". wait.sh".

# Runs a command until it succeeds, for a minute at the most.
until_done() {
    end=$(($(date +%s) + 60))
    until "$@"; do
        [ "$(date +%s)" -lt "$end" ] || return 1
        sleep 0.1
    done
}

# has_window PROCESS TITLE: the window's number is in $window then.
has_window() {
    window=$(xdotool search --all --onlyvisible --pid "$1" --name "$2" 2>/dev/null)
}

# Right after the start the window manager may not heed the first requests.
takes_keys() {
    xdotool windowactivate "$window" 2>/dev/null || true
    [ "$(xdotool getactivewindow 2>/dev/null)" = "$window" ]
}

has_ended() {
    ! kill -0 "$1" 2>/dev/null
}

# ends_with PROCESS KEY: presses the key once, when $window takes it.
ends_with() {
    until_done takes_keys && xdotool key "$2" && until_done has_ended "$1"
}
