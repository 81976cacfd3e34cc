#!/bin/bash
# Takes the built program on a short tour on a virtual display and saves pictures of it.
#
#   scripts/tour.sh FOLDER PICTURES
#
# FOLDER is a Quorvan folder (see quorvan-cli setup) with at least two portfolios; it must ask for no password.
# Every step must change the screen; the tour ends with Quit and fails when the program does not end by itself.
set -eu
here=$(cd "$(dirname "$0")" && pwd)
. "$here/packages.sh"

[ $# -eq 2 ] || fail "usage: scripts/tour.sh FOLDER PICTURES"
folder=$1
pictures=$2
mkdir -p "$pictures" || fail "the folder $pictures for the pictures cannot be made"
pictures=$(cd "$pictures" && pwd)
scratch=$(mktemp -d)
server=
program=

clean_up() {
    local process
    for process in $program $server; do
        kill "$process" 2>/dev/null || true
        wait "$process" 2>/dev/null || true
    done
    rm -rf "$scratch"
}
trap clean_up EXIT

# within SECONDS COMMAND...: repeats the command until it succeeds; fails when it does not in that time.
within() {
    local end=$((SECONDS + $1))
    shift
    until "$@"; do
        [ $SECONDS -lt $end ] || return 1
        sleep 0.1
    done
}

start_display() {
    Xvfb -displayfd 3 -screen 0 1200x760x24 -nolisten tcp 3>"$scratch/display" 2>"$scratch/xvfb" &
    server=$!
    within 20 test -s "$scratch/display" || fail "the virtual display did not start: $(cat "$scratch/xvfb")"
    DISPLAY=:$(cat "$scratch/display")
    export DISPLAY
    unset WAYLAND_DISPLAY
}

find_window() {
    window=$(xdotool search --onlyvisible --name '^Quorvan$' 2>/dev/null | head -n 1)
    [ -n "$window" ]
}

start_program() {
    (cd "$folder" && exec env QT_QPA_PLATFORM=xcb ./quorvan) 2>"$scratch/program" &
    program=$!
    within 30 find_window || fail "the main window did not appear: $(cat "$scratch/program")"
    xdotool windowmove "$window" 100 60 windowsize --sync "$window" 1000 520
    settle
}

screen() { import -silent -window root -depth 8 rgb:- | md5sum; }

# Waits until the screen has stopped changing.
settle() {
    local end=$((SECONDS + 15)) last now
    last=$(screen)
    while sleep 0.2; do
        now=$(screen)
        [ "$now" != "$last" ] || return 0
        [ $SECONDS -lt $end ] || fail "the screen does not come to rest"
        last=$now
    done
}

changed() { [ "$(screen)" != "$before" ]; }

# step WHAT COMMAND...: the command must change the screen.
step() {
    local what=$1
    shift
    before=$(screen)
    "$@"
    within 10 changed || fail "nothing changed on the screen: $what"
    settle
}

# Menus lie over the window, so the picture is cut out of the whole screen.
picture() {
    import -silent -window root -crop 1000x520+100+60 +repage "$pictures/$1.png"
    echo "$pictures/$1.png"
}

click() { xdotool mousemove $((100 + $1)) $((60 + $2)) click 1; }

# The bottom line of the list's header is the first of that grey under the given x.
header_bottom() {
    import -silent -window root -crop "1x400+$((100 + $1))+60" +repage txt:- |
        sed -n '/#989898/{s/^0,\([0-9]*\):.*/\1/p;q}'
}

# The middle of a column, from the widths in the settings; columns lie one pixel apart.
column_middle() {
    awk -F= -v wanted="$1" '
        /^ColumnWidth[0-9]+=/ { width[substr($1, 12) + 0] = $2 }
        END { for (i = 0; i < wanted; ++i) x += width[i] + 1; print int(x + width[wanted] / 2) }' "$folder/Quorvan.ini"
}

ended() { ! kill -0 "$program" 2>/dev/null; }

start_display
start_program
picture main-window
value=$(column_middle 6)
bottom=$(header_bottom "$value")
[ -n "$bottom" ] || fail "the list's header was not found"
step "opening the File menu" click 15 10
picture file-menu
step "closing the File menu" xdotool key Escape
step "sorting by Value" click "$value" $((bottom - 8))
picture sorted-by-value
# The selector stands above the list, its text behind the label.
listed=$(screen)
step "opening the portfolio selector" click 150 $((bottom - 32))
picture portfolio-selector
# The last portfolio is shown, so the next one down is the first.
step "going to the first portfolio" xdotool key Down
step "selecting it" xdotool key Return
[ "$(screen)" != "$listed" ] || fail "selecting another portfolio showed the same one"
picture other-portfolio
step "opening the File menu again" click 15 10
step "going to Quit" xdotool key Up
xdotool key Return
within 20 ended || fail "the program did not end after Quit"
status=0
wait "$program" || status=$?
program=
[ $status -eq 0 ] || fail "the program ended with status $status: $(cat "$scratch/program")"
echo "The pictures are in $pictures"
