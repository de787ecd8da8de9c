#!/usr/bin/env bash
# Builds the libFuzzer targets (preset "fuzz": clang, AddressSanitizer) and runs each one for a
# bounded time, starting from its seed corpus in fuzz/corpus/<name>/. Not part of the test run.
#
#   scripts/fuzz.sh            # 60 seconds per target
#   scripts/fuzz.sh 600        # ten minutes per target
#   scripts/fuzz.sh 60 path    # only the targets whose name contains "path"
#
# Findings (crash-*, leak-*, timeout-*) land in build/fuzz/findings/<name>/; new inputs grow the
# working corpus in build/fuzz/corpus/<name>/. The last line per target is libFuzzer's
# "Done N runs in S second(s)"; the script fails when a target found something.
set -euo pipefail
cd "$(dirname "$0")/.."

seconds=${1:-60}
filter=${2:-}
jobs=${TEKIT_JOBS:-2}
build=build/fuzz

cmake --preset fuzz >/dev/null
cmake --build --preset fuzz -j "$jobs"

status=0
for source in fuzz/*Fuzzer.cpp; do
    name=$(basename "$source" .cpp)
    target=$(tr '[:upper:]' '[:lower:]' <<<"$name")
    short=${name%Fuzzer}
    short=$(tr '[:upper:]' '[:lower:]' <<<"$short")
    [[ -n "$filter" && "$short" != *"$filter"* ]] && continue
    if [[ ! -x "$build/fuzz/$target" ]]; then
        echo "==== $target: not built (its peer library is not installed: see fuzz/CMakeLists.txt)"
        continue
    fi
    corpus="$build/corpus/$short"
    findings="$build/findings/$short"
    mkdir -p "$corpus" "$findings"
    seeds=()
    [[ -d "fuzz/corpus/$short" ]] && seeds=("fuzz/corpus/$short")
    echo "==== $target: ${seconds} s"
    log="$build/$short.log"
    set +e
    ASAN_OPTIONS=detect_leaks=1 "$build/fuzz/$target" -max_total_time="$seconds" -timeout=10 \
        -rss_limit_mb=2048 -print_final_stats=1 -artifact_prefix="$findings/" \
        "$corpus" "${seeds[@]}" >"$log" 2>&1
    code=$?
    set -e
    grep -E "^Done [0-9]+ runs|stat::number_of_executed_units|==ERROR|SUMMARY:" "$log" || true
    if [[ $code -ne 0 || -n "$(ls -A "$findings")" ]]; then
        echo "fuzz.sh: $target found a problem (exit $code), see $findings and $log"
        status=1
    fi
done
exit $status
