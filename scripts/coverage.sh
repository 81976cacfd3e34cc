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
# A test that limits the size of files limits that of the counts as well, which must not be heard of.
export GCOV_ERROR_FILE=/dev/null
quietly "tests failed" ctest --preset coverage
gcovr --root . --exclude 'tests/' --exclude 'tour/' --exclude 'fuzz/' --exclude 'build/' "$@" build/coverage
