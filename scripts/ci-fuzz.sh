#!/usr/bin/env bash
# CI job: builds every fuzz target with clang, AddressSanitizer and UndefinedBehaviorSanitizer
# (build-fuzz, or $VTR_FUZZ_BUILD_DIR) and runs each for a bounded time ($VTR_FUZZ_SECONDS,
# 30 by default) from its seed corpus, as many at a time as there are processors
# ($VTR_FUZZ_JOBS). A crash, a broken property, a leak, an input that
# takes over a second or one that makes a reader ask for absurd memory fails the job; the
# input is kept in fuzz/artifacts/<target>/ of the build folder. One target alone:
#   scripts/ci-fuzz.sh sequence
set -euo pipefail
root=$(cd "$(dirname "$0")/.." && pwd)
build=${VTR_FUZZ_BUILD_DIR:-$root/build-fuzz}
seconds=${VTR_FUZZ_SECONDS:-30}

"$root/scripts/setup-deps.sh" clang libclang-rt-14-dev llvm
cmake -S "$root" -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
    -DCMAKE_CXX_COMPILER=clang++ \
    -DVTR_BUILD_FUZZ=ON -DVTR_SANITIZE=ON -DVTR_BUILD_TESTS=OFF -DVTR_BUILD_BENCH=OFF \
    -DVTR_BUILD_UI=OFF
cmake --build "$build" --target fuzz_all

# The longest input of each target: the file readers get room for whole small files.
max_len() {
    case "$1" in
        sequence | sequence_compressed) echo 16384 ;;
        file_version | settings_store) echo 8192 ;;
        *) echo 4096 ;;
    esac
}

targets=("$@")
if [ ${#targets[@]} -eq 0 ]; then
    targets=(list_notation show_file weekly_schedule calendar_schedule time_range monitored_event
        settings_store sequence sequence_compressed edit_file shell_map file_version)
fi

export ASAN_OPTIONS=detect_leaks=1:allocator_may_return_null=0:halt_on_error=1
export UBSAN_OPTIONS=print_stacktrace=1:halt_on_error=1
if command -v llvm-symbolizer >/dev/null 2>&1; then
    export ASAN_SYMBOLIZER_PATH=$(command -v llvm-symbolizer)
fi

work=$build/fuzz
jobs=${VTR_FUZZ_JOBS:-$(nproc)}

# Runs one target; its outcome goes to results/<target>: "ok <line>" or "failed <line>".
run_target() {
    local target=$1
    local corpus=$work/corpus/$target artifacts=$work/artifacts/$target
    local scratch=$work/tmp/$target log=$work/logs/$target.log result=$work/results/$target
    rm -rf "$artifacts" "$scratch"
    mkdir -p "$corpus" "$artifacts" "$scratch" "$work/logs" "$work/results"
    local status=0
    # The readers that need a file write it into a folder of their own below TMPDIR.
    TMPDIR=$scratch "$work/fuzz_$target" "$corpus" "$work/seeds/$target" \
        -max_total_time="$seconds" -timeout=1 -rss_limit_mb=1024 -malloc_limit_mb=256 \
        -max_len="$(max_len "$target")" -print_final_stats=1 \
        -artifact_prefix="$artifacts/" >"$log" 2>&1 || status=$?
    local runs inputs leftovers line
    runs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$log" | tail -n 1)
    inputs=$(find "$corpus" -type f | wc -l)
    leftovers=$(find "$scratch" -mindepth 1 | wc -l)
    line=$(printf '%-20s %10s runs %6s inputs in the corpus' "$target" "${runs:-?}" "$inputs")
    if [ "$status" -ne 0 ]; then
        echo "failed $line: status $status, see $log" >"$result"
    elif [ "$leftovers" -ne 0 ]; then
        echo "failed $line: $leftovers files left in its temporary folder" >"$result"
    else
        echo "ok $line" >"$result"
    fi
}

rm -rf "$work/results"
echo "--- fuzzing ${#targets[@]} targets for ${seconds}s each, $jobs at a time"
running=0
for target in "${targets[@]}"; do
    if [ "$running" -ge "$jobs" ]; then
        wait -n || true
        running=$((running - 1))
    fi
    run_target "$target" &
    running=$((running + 1))
done
wait

echo
echo "=== fuzzing, ${seconds}s a target"
failed=()
for target in "${targets[@]}"; do
    result=$(cat "$work/results/$target" 2>/dev/null || echo "failed $target: no outcome")
    echo "${result#* }"
    if [ "${result%% *}" != ok ]; then
        failed+=("$target")
        tail -n 60 "$work/logs/$target.log" 2>/dev/null || true
    fi
done
if [ ${#failed[@]} -ne 0 ]; then
    echo "failed: ${failed[*]} (inputs in $work/artifacts/)"
    exit 1
fi
