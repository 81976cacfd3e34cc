#!/bin/bash
# Runs the fuzzers, one after another, and says how much each tried and reached.
#
#   scripts/fuzz.sh SECONDS [TARGET...]
#
# What a fuzzer finds stays in build/fuzz/found/TARGET; put it into fuzz/corpus/TARGET with the mend.
set -eu
cd "$(dirname "$0")/.."
. scripts/packages.sh

[ $# -ge 1 ] || fail "usage: scripts/fuzz.sh SECONDS [TARGET...]"
seconds=$1
shift
install_missing "${build_packages[@]}" "${fuzz_packages[@]}"
quietly "the build could not be prepared" cmake --preset fuzz -DQUORVAN_BENCH=OFF
[ $# -gt 0 ] || set -- $(ls fuzz/corpus)
for target in "$@"; do
    quietly "the build of fuzz_$target failed" cmake --build --preset fuzz --target "fuzz_$target"
    found=build/fuzz/found/$target
    mkdir -p "$found" "build/fuzz/grown/$target"
    echo "Fuzzing $target for $seconds s"
    "build/fuzz/fuzz/fuzz_$target" -max_total_time="$seconds" -timeout=20 -max_len=65536 -print_final_stats=1 \
        -artifact_prefix="$found/" "build/fuzz/grown/$target" "fuzz/corpus/$target" \
        >"build/fuzz/$target.log" 2>&1 || fail "fuzz_$target found something; see build/fuzz/$target.log and $found"
    grep -E 'DONE|stat::number_of_executed_units|stat::average_exec_per_sec' "build/fuzz/$target.log"
done
