#!/usr/bin/env bash
# Builds the benchmarks optimised (release preset) and runs them. Each program ends with its
# figures as ratios of its peer's in the same run. A first argument that does not start with
# "-" picks the programs whose name contains it; the other arguments go to every program:
#
#   scripts/bench.sh                                  # every benchmark program
#   scripts/bench.sh strings --benchmark_filter=Copy  # bench_strings only
#   scripts/bench.sh --benchmark_repetitions=5
set -euo pipefail
cd "$(dirname "$0")/.."

filter=
if [[ $# -gt 0 && "$1" != -* ]]; then
    filter=$1
    shift
fi

scripts/install-deps.sh --linux >&2
cmake --preset release >/dev/null
cmake --build --preset release --parallel "$(nproc)" >&2

status=0
for program in $(find build/release/bench -type f -name 'bench_*' -perm -u+x | sort); do
    name=$(basename "$program")
    [[ -n "$filter" && "$name" != *"$filter"* ]] && continue
    echo "==== $name"
    "$program" "$@" || status=1
done
exit $status
