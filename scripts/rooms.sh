#!/bin/bash
# Checks the order of the house: one library a folder, and no circle of rooms that include each other.
set -eu
cd "$(dirname "$0")/.."
. scripts/packages.sh

two=$(git ls-files '*CMakeLists.txt' | xargs grep -cE '^(quorvan_room|add_library)\(' | grep -vE ':[01]$' || true)
[ -z "$two" ] || fail "these folders hold more than one library: $two"

# A line for each room that includes another: both names, the lower one last.
mapfile -t rooms < <(git grep -lE '^quorvan_room\(' -- '*CMakeLists.txt' | sed 's|/CMakeLists.txt$||')
[ ${#rooms[@]} -gt 0 ] || fail "there is no room"
git grep -E '^#include "[^"]+/[^"/]+"' -- "${rooms[@]/%//*.h}" "${rooms[@]/%//*.cpp}" |
    sed -E 's|^(.*)/[^/]+:#include "(.*)/[^/]+"$|\1 \2|; s|/private\b||g' |
    awk '$1 != $2' | sort -u | tsort >/dev/null || fail "the rooms named above include each other in a circle"
