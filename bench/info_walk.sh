#!/usr/bin/env bash
# Times `tekit info -r` over a tree of 10 000 small product files and reports files per second.
# Run by scripts/bench.sh; runs on its own too:
#
#   bench/info_walk.sh [TOOL [FILES]]
#
# TOOL defaults to the release build's tekit. The tree (100 directories of FILES / 100 files,
# default 10 000) holds the example product files of examples/files/ (binary, XML and INI text)
# and as many files of no known form, in turn. Each run is timed RUNS times (default 3) after
# one warm-up run, so the files are in the page cache; the baseline reads the first 1296 bytes
# of every file with `head` (one process for all).
set -euo pipefail
cd "$(dirname "$0")/.."

tool=${1:-build/release/tools/tekit/tekit}
count=${2:-10000}
runs=${RUNS:-3}

tree=$(mktemp -d "${TMPDIR:-/tmp}/tekit-info-walk.XXXXXX")
trap 'rm -rf "$tree"' EXIT
samples=(examples/files/sequence.seq examples/files/sequence.xml examples/files/sequence.ini)
unknown="$tree/unknown.txt"
printf 'Station log\nStep 1 passed\n' >"$unknown"
for ((d = 0; d < 100; d++)); do
    mkdir -p "$tree/d$d"
    for ((f = 0; f < count / 100; f++)); do
        i=$((d * 100 + f))
        if ((i % 4 == 3)); then
            cp "$unknown" "$tree/d$d/f$f.txt"
        else
            cp "${samples[$((i % 4))]}" "$tree/d$d/f$f.${samples[$((i % 4))]##*.}"
        fi
    done
done
rm "$unknown"
files=$(find "$tree" -type f | wc -l)

# "WALL CPU" seconds for RUNS runs of the command, its output thrown away.
timed() {
    "$@" >/dev/null 2>&1 || true
    local TIMEFORMAT='%3R %3U %3S' report
    report=$({ time (for ((i = 0; i < runs; i++)); do "$@" >/dev/null 2>&1 || true; done); } 2>&1)
    read -r wall user system <<<"$report"
    echo "$wall $(bc -l <<<"$user + $system")"
}

read -r text text_cpu <<<"$(timed "$tool" info -r "$tree")"
read -r json json_cpu <<<"$(timed "$tool" info --json -r "$tree")"
head_all() { find "$tree" -type f -print0 | xargs -0 head -q -c 1296; }
read -r base base_cpu <<<"$(timed head_all)"
shown=$("$tool" info --json -r "$tree" 2>/dev/null | grep -c '"file"' || true)

rate() { printf '%8.0f' "$(bc -l <<<"$files * $runs / ($1 + 0.0001)")"; }
echo "$files files ($shown shown), $runs runs each; files per second (wall, CPU):"
echo "  tekit info -r          $(rate "$text")  $(rate "$text_cpu")"
echo "  tekit info --json -r   $(rate "$json")  $(rate "$json_cpu")"
echo "  head -c 1296 (baseline) $(rate "$base")  $(rate "$base_cpu")"
printf '  ratio tekit/head wall  %6.2f\n' "$(bc -l <<<"$text / ($base + 0.0001)")"
echo "  seconds for $runs runs (wall / CPU): text $text / $text_cpu, JSON $json / $json_cpu," \
    "head $base / $base_cpu"
