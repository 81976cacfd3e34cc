#!/bin/bash
# Works the built program through its windows on a virtual display, checks what it sees and saves pictures.
#
#   scripts/tour.sh BUILD PICTURES
#
# BUILD is a build folder with the program, quorvan-cli and quorvan-tour. The tour has a sample folder of its
# own, and nothing else is touched.
set -eu
here=$(cd "$(dirname "$0")" && pwd)
. "$here/packages.sh"

[ $# -eq 2 ] || fail "usage: scripts/tour.sh BUILD PICTURES"
build=$1
pictures=$2
mkdir -p "$pictures" || fail "the folder $pictures for the pictures cannot be made"
pictures=$(cd "$pictures" && pwd)
scratch=$(mktemp -d)
server=

clean_up() {
    if [ -n "$server" ]; then
        kill "$server" 2>/dev/null || true
        wait "$server" 2>/dev/null || true
    fi
    rm -rf "$scratch"
}
trap clean_up EXIT

start_display() {
    Xvfb -displayfd 3 -screen 0 1200x760x24 -nolisten tcp 3>"$scratch/display" 2>"$scratch/xvfb" &
    server=$!
    local end=$((SECONDS + 20))
    until [ -s "$scratch/display" ]; do
        [ $SECONDS -lt $end ] || fail "the virtual display did not start: $(cat "$scratch/xvfb")"
        sleep 0.1
    done
}

start_display
"$build/tools/quorvan-cli" setup "$scratch/home" --sample --program "$build/app/quorvan" >"$scratch/setup" ||
    fail "the sample folder could not be made: $(cat "$scratch/setup")"
DISPLAY=:$(cat "$scratch/display") WAYLAND_DISPLAY='' QT_QPA_PLATFORM=xcb XDG_RUNTIME_DIR=$scratch \
    "$build/tour/quorvan-tour" "$scratch/home" "$pictures" 2>"$scratch/errors" ||
    fail "the tour failed: $(cat "$scratch/errors")"
pdftoppm -r 80 -png -singlefile "$scratch/home/report.pdf" "$pictures/report" ||
    fail "the report could not be made into a picture"
[ -z "$(find "$scratch/home" -name '*.new' -o -name '*.bak' -o -name '*.tmp' -o -name '*.part')" ] ||
    fail "the program left something behind in its folder: $(ls "$scratch/home")"
echo "The pictures are in $pictures"
