#!/bin/bash
# Runs clang-tidy over all sources, or over those that match the given patterns: scripts/tidy.sh 'util/'
set -eu
cd "$(dirname "$0")/.."
. scripts/packages.sh

install_missing "${build_packages[@]}" "${test_packages[@]}" "${tidy_packages[@]}"
# Generated sources must be there.
quietly "the build could not be prepared" cmake --preset dev
quietly "the build failed" cmake --build --preset dev
[ $# -gt 0 ] || set -- "$PWD/(app|dialogs|charts|print|quotes|ColumnListView|util|db|platform|resources|tools|tour|tests|bench|fuzz)/"
run-clang-tidy -quiet -p build/dev "$@" || fail "clang-tidy found what is named above"
