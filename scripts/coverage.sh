#!/usr/bin/env bash
# Line coverage of the library's sources (src/) by the unit tests.
#
#   scripts/coverage.sh                 # builds everything, runs every ctest case
#   scripts/coverage.sh '_tests$'       # only the ctest cases matching the regular expression
#   TEKIT_COVERAGE_TARGETS="strings_tests paths_tests" scripts/coverage.sh '^(strings|paths)_'
#                                       # builds only those targets
#
# Builds the dev configuration with g++ --coverage -O0 in build/coverage, runs ctest there,
# then reports with gcovr: one line per src/ folder and the summary line
# "coverage: NN.N% of src/ lines". gcovr is installed with apt-get when missing and root.
# TEKIT_COVERAGE_JOBS sets the build's parallel jobs (default: the number of cores).
set -euo pipefail
cd "$(dirname "$0")/.."

build=build/coverage
jobs=${TEKIT_COVERAGE_JOBS:-$(nproc)}
tests=${1:-}
targets=${TEKIT_COVERAGE_TARGETS:-}

if ! command -v gcovr >/dev/null; then
    if [[ $(id -u) -ne 0 ]]; then
        echo "coverage: gcovr is missing; run as root, or: sudo apt-get install gcovr" >&2
        exit 1
    fi
    echo "coverage: installing gcovr"
    export DEBIAN_FRONTEND=noninteractive
    apt-get update
    apt-get install -y --no-install-recommends gcovr
fi

# Atomic counters: the tests run threads, and racing counters can wrap to negative values that
# gcov then writes and gcovr cannot read.
cmake --preset dev -B "$build" -DCMAKE_CXX_FLAGS="--coverage -O0 -fprofile-update=atomic" \
    -DCMAKE_EXE_LINKER_FLAGS=--coverage -DCMAKE_SHARED_LINKER_FLAGS=--coverage >/dev/null
# shellcheck disable=SC2086 # the target list is split on purpose
cmake --build "$build" --parallel "$jobs" ${targets:+--target $targets}

# Counters of an earlier run would add to this one's.
find "$build" -name '*.gcda' -delete
# Notes of objects that are no longer built (a removed or renamed source) describe old line
# numbers of shared headers, which gcovr cannot merge with the current ones.
while IFS= read -r notes; do
    [[ -f "${notes%.gcno}.o" ]] || rm -f "$notes"
done < <(find "$build" -name '*.gcno')
ctest --test-dir "$build" --output-on-failure ${tests:+-R "$tests"} || {
    echo "coverage: some tests failed; the figures below count the lines they reached" >&2
}

# One gcovr run per subsystem's objects: gcovr 5 cannot merge a function that two objects of
# different subsystems report at different lines. A header's lines take the best of the runs.
summaries=()
for objects in "$build"/src/*/; do
    summary=$build/coverage-$(basename "$objects").json
    gcovr --root . --filter 'src/' --object-directory "$build" \
        --exclude-directories '.*/CMakeFiles/[0-9.]+' --json-summary "$summary" "$objects" >/dev/null
    summaries+=("$summary")
done

python3 - "${summaries[@]}" <<'EOF'
import json, sys
from collections import defaultdict

best = {}
for path in sys.argv[1:]:
    for f in json.load(open(path))["files"]:
        known = best.get(f["filename"])
        if known is None or f["line_covered"] > known["line_covered"]:
            best[f["filename"]] = f
files = best.values()
folders = defaultdict(lambda: [0, 0])
for f in files:
    parts = f["filename"].split("/")
    folder = "/".join(parts[:2]) if len(parts) > 2 else parts[0]
    folders[folder][0] += f["line_covered"]
    folders[folder][1] += f["line_total"]
for folder, (covered, total) in sorted(folders.items()):
    print(f"  {folder + '/':<20} {100.0 * covered / max(total, 1):5.1f}%  ({covered}/{total})")
covered = sum(c for c, _ in folders.values())
total = sum(t for _, t in folders.values())
print(f"coverage: {100.0 * covered / max(total, 1):.1f}% of src/ lines")
EOF
