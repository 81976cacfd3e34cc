#!/bin/bash
# Makes the pictures of the README and the help anew, from a tour through the program.
#
#   scripts/pictures.sh [BUILD]
#
# BUILD is a build folder with quorvan, quorvan-cli and quorvan-tour; build/run, run.sh's, when none is given.
set -eu
cd "$(dirname "$0")/.."
. scripts/packages.sh

build=${1:-build/run}
for_help=(main-window menu-Portfolio menu-Investment portfolio-add investment-add portfolio-selector update updated
    chart-investment chart-time report)
for_readme=(main-window chart-investment report)

install_missing "${display_packages[@]}"
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
scripts/tour.sh "$build" "$scratch" >/dev/null

# save FOLDER NAME...: few colours are enough for a window, and make a file a quarter of the size.
save() {
    local folder=$1 name
    shift
    mkdir -p "$folder"
    for name in "$@"; do
        [ -s "$scratch/$name.png" ] || fail "the tour made no picture $name"
        convert "$scratch/$name.png" -strip +dither -colors 255 -define png:compression-level=9 \
            "PNG8:$folder/$name.png" || fail "the picture $name could not be converted"
    done
}
save resources/help/pictures "${for_help[@]}"
save doc/pictures "${for_readme[@]}"
echo "Made anew: resources/help/pictures and doc/pictures"
