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
# Qt 5 Core (QString) is a peer of the string benchmarks only: installed here when missing,
# never by the tests; without it bench_strings leaves the QString cases out.
if ! dpkg-query -W -f='${Status}' qtbase5-dev 2>/dev/null | grep -q "install ok installed"; then
    if [[ $(id -u) -eq 0 ]]; then
        echo "bench: installing qtbase5-dev" >&2
        apt-get update >&2 && apt-get install -y --no-install-recommends qtbase5-dev >&2
    else
        echo "bench: qtbase5-dev missing (sudo apt-get install qtbase5-dev): no QString column" >&2
    fi
fi
# The pattern benchmark's peers, installed here only (the test command never needs them);
# bench_patterns measures against std::regex alone where they are missing.
missing=()
for package in libre2-dev libpcre2-dev; do
    dpkg -s "$package" >/dev/null 2>&1 || missing+=("$package")
done
if [[ ${#missing[@]} -gt 0 ]]; then
    if [[ $(id -u) -eq 0 ]]; then
        apt-get install -y --no-install-recommends "${missing[@]}" >&2
    else
        echo "bench.sh: not root, so ${missing[*]} stay missing" >&2
    fi
fi
# POCO is a peer of the lock benchmarks only: installed here when missing, never by the tests.
if ! dpkg-query -W -f='${Status}' libpoco-dev 2>/dev/null | grep -q "install ok installed"; then
    if [[ $(id -u) -eq 0 ]]; then
        echo "bench: installing libpoco-dev" >&2
        apt-get update >&2 && apt-get install -y --no-install-recommends libpoco-dev >&2
    else
        echo "bench: libpoco-dev missing (sudo apt-get install libpoco-dev): no POCO column" >&2
    fi
fi
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
