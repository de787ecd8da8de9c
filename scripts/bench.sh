#!/usr/bin/env bash
# Builds the benchmarks optimised (release preset) and runs them; the strings benchmark ends
# with each figure as a ratio of std::string's. Arguments go to the benchmark program:
#
#   scripts/bench.sh
#   scripts/bench.sh --benchmark_filter=Copy --benchmark_repetitions=5
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh --linux
cmake --preset release >/dev/null
cmake --build --preset release --parallel "$(nproc)" --target bench_strings
exec build/release/bench/strings/bench_strings "$@"
