#!/bin/bash
# Installs what is missing, builds everything and runs all tests: plain, under AddressSanitizer with
# UndefinedBehaviorSanitizer, and those with threads under ThreadSanitizer. Then builds the release.
set -eu
cd "$(dirname "$0")"
. scripts/packages.sh

install_missing "${build_packages[@]}" "${run_packages[@]}" "${display_packages[@]}" "${test_packages[@]}"

echo "Checking the format"
git ls-files -z '*.h' '*.cpp' | xargs -0 clang-format --dry-run --Werror ||
    fail "the files named above are not formatted; run: git ls-files -z '*.h' '*.cpp' | xargs -0 clang-format -i"

echo "Checking the order of the rooms"
scripts/rooms.sh

for preset in dev asan tsan; do
    echo "Building $preset"
    quietly "the build of $preset could not be prepared" cmake --preset "$preset"
    quietly "the build of $preset failed" cmake --build --preset "$preset"
    echo "Testing $preset"
    ctest --preset "$preset" || fail "tests failed in $preset"
done
# What a person runs is optimised further, and the compiler warns of more then.
echo "Building release"
quietly "the build of release could not be prepared" cmake --preset release
quietly "the build of release failed" cmake --build --preset release
echo "All tests passed."

# Non-blank lines of the files that match.
lines_of() {
    git ls-files -z -- "$@" | xargs -0 cat | grep -c '[^[:space:]]'
}
tests=$(lines_of 'tests/*.cpp' 'tests/*.h')
program=$(lines_of '*.cpp' '*.h' ':!tests' ':!bench' ':!fuzz' ':!tour')
echo "Lines: program $program, tests $tests, which is $((100 * tests / program)) % of it."
