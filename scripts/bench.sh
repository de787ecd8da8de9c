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
# The peers of the comparisons, installed here only, never by the test command: Qt 5 Core
# (QString, bench_strings), RE2 and PCRE2 (bench_patterns), POCO (bench_sync, bench_ini), cereal
# (bench_streams), inih and SimpleIni (bench_ini). A program whose peer is missing leaves that
# column out.
peers=()
for package in qtbase5-dev libre2-dev libpcre2-dev libpoco-dev libcereal-dev \
    libinih-dev libsimpleini-dev; do
    dpkg-query -W -f='${Status}' "$package" 2>/dev/null | grep -q "install ok installed" ||
        peers+=("$package")
done
if [[ ${#peers[@]} -gt 0 ]]; then
    if [[ $(id -u) -eq 0 ]]; then
        echo "bench: installing ${peers[*]}" >&2
        apt-get update >&2 && apt-get install -y --no-install-recommends "${peers[@]}" >&2
    else
        echo "bench: missing ${peers[*]} (sudo apt-get install ...): their columns are left out" >&2
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
# The reader of Windows executables against binutils, whole processes on tekit.dll.
if [[ -z "$filter" || exe_vs_objdump == *"$filter"* ]]; then
    echo "==== exe_vs_objdump"
    bench/exe_vs_objdump.sh build/release/tools/tekit/tekit || status=1
fi
# tekit info over a tree of 10 000 small product files: files per second.
if [[ -z "$filter" || info_walk == *"$filter"* ]]; then
    echo "==== info_walk"
    bench/info_walk.sh build/release/tools/tekit/tekit || status=1
fi
exit $status
