#!/bin/bash
# Runs the tests and prints, for each source file of the rooms, how many of its lines they reach and which not.
# Arguments go to gcovr: scripts/coverage.sh --html-details build/coverage/report.html
set -eu
cd "$(dirname "$0")/.."
. scripts/packages.sh

install_missing "${build_packages[@]}" "${run_packages[@]}" "${display_packages[@]}" "${test_packages[@]}" \
    "${coverage_packages[@]}"
quietly "the build could not be prepared" cmake --preset coverage
quietly "the build failed" cmake --build --preset coverage
find build/coverage -name '*.gcda' -delete
# Where a test limits the size of files, the counts would be cut short as well.
quietly "tests failed" ctest --preset coverage -E 'AFullDisk|FailsInOneSentence|TheRoomEnds'
gcovr --root . --exclude 'tests/' --exclude 'tour/' --exclude 'fuzz/' --exclude 'build/' "$@" build/coverage
