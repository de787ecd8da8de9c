#!/usr/bin/env bash
# The whole test run: installs what is missing, then builds and tests every leg this machine
# can run, stopping at the first failure.
#
#   scripts/test.sh                        # dev (warnings as errors), asan, tsan, then Windows
#   TEKIT_SKIP_WINDOWS=1 scripts/test.sh   # the Linux legs only
#
# The Windows legs are scripts/test-windows.sh. The last line counts the test cases of every
# leg: "tekit: N passed, N failed".
set -euo pipefail
cd "$(dirname "$0")/.."

jobs=$(nproc)
logs=build/test-logs
summary=()
passed=0
failed=0

# fail <leg>: stops the run; a leg that failed before any test failed (a build error) counts
# as one failure.
fail() {
    local before=$failed
    count_tests "${logs}/$1.log"
    if [[ $failed -eq $before ]]; then
        failed=$((failed + 1))
    fi
    echo ""
    echo "test.sh: FAILED: leg '$1', see ${logs}/$1.log"
    echo "tekit: ${passed} passed, ${failed} failed"
    exit 1
}

# Adds the ctest counts found in a leg's log to the totals.
count_tests() {
    local line total failures
    while read -r line; do
        failures=$(sed -E 's/.* ([0-9]+) tests? failed out of ([0-9]+).*/\1/' <<<"$line")
        total=$(sed -E 's/.* ([0-9]+) tests? failed out of ([0-9]+).*/\2/' <<<"$line")
        passed=$((passed + total - failures))
        failed=$((failed + failures))
    done < <(grep -E "tests? passed, [0-9]+ tests? failed out of [0-9]+" "$1" || true)
}

# run_leg <name> <command>...: runs one leg with its output also in build/test-logs/<name>.log.
run_leg() {
    local name=$1 start=$SECONDS
    shift
    echo ""
    echo "==== ${name}"
    "$@" 2>&1 | tee "${logs}/${name}.log" || fail "$name"
    count_tests "${logs}/${name}.log"
    summary+=("$(printf '%-14s ok  %4ds' "$name" $((SECONDS - start)))")
}

linux_leg() {
    local preset=$1
    shift
    cmake --preset "$preset" "$@" &&
        cmake --build --preset "$preset" --parallel "$jobs" &&
        ctest --preset "$preset"
}

scripts/install-deps.sh
mkdir -p "$logs"

run_leg dev linux_leg dev -DTEKIT_WERROR=ON
ASAN_OPTIONS=allocator_may_return_null=1:detect_leaks=1 run_leg asan linux_leg asan
# Locks and copy-on-write strings shared across threads, under the race detector.
TSAN_OPTIONS=halt_on_error=1 run_leg tsan linux_leg tsan

if [[ "${TEKIT_SKIP_WINDOWS:-0}" == 1 ]]; then
    summary+=("windows        skipped (TEKIT_SKIP_WINDOWS=1)")
elif [[ -x scripts/test-windows.sh ]]; then
    run_leg windows scripts/test-windows.sh
else
    summary+=("windows        skipped (no scripts/test-windows.sh)")
fi

echo ""
echo "==== summary"
printf '%s\n' "${summary[@]}"
echo "tekit: ${passed} passed, ${failed} failed"
