#!/usr/bin/env bash
# CI job: clang-tidy over every source of src/ (the window's included) with the checks that
# .clang-tidy names, from the compile commands of a clang configuration in build-tidy (or
# $VTR_TIDY_BUILD_DIR); nothing needs to be built. Any finding fails the job: .clang-tidy
# treats every warning as an error. Some files alone, by a part of their path:
#   scripts/ci-tidy.sh src/checks/
set -euo pipefail
root=$(cd "$(dirname "$0")/.." && pwd)
build=${VTR_TIDY_BUILD_DIR:-$root/build-tidy}

"$root/scripts/setup-deps.sh" clang clang-tidy
cmake -S "$root" -B "$build" -G Ninja -DCMAKE_CXX_COMPILER=clang++ \
    -DVTR_BUILD_TESTS=OFF -DVTR_BUILD_BENCH=OFF -DVTR_BUILD_FUZZ=OFF -DVTR_SANITIZE=OFF \
    >/dev/null

runner=$(command -v run-clang-tidy || command -v run-clang-tidy-14)
if [ $# -eq 0 ]; then
    set -- "$root/src/"
else
    set -- "${@/#/$root/}"
fi
start=$(date +%s)
# run-clang-tidy takes regular expressions over the files of the compile commands; those of
# src/ are the shipped code. It exits non-zero when clang-tidy found anything in any file.
if ! "$runner" -p "$build" -quiet -j "$(nproc)" "$@" >"$build/clang-tidy.log" 2>&1; then
    # One line per finding (a header's findings come once, however many files include it).
    sed 's/\x1b\[[0-9;]*m//g' "$build/clang-tidy.log" | grep -E '^/.*: (warning|error): ' |
        sort -u >&2 || sed 's/\x1b\[[0-9;]*m//g' "$build/clang-tidy.log" >&2
    echo "ci-tidy: clang-tidy found the problems above (whole output: $build/clang-tidy.log)" >&2
    exit 1
fi
echo "ci-tidy: clean ($(( $(date +%s) - start ))s)"
