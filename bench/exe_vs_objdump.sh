#!/usr/bin/env bash
# Times `tekit exe --exports` against binutils' `objdump -p` on the same DLL, and checks that
# both read the same export names. Run by scripts/bench.sh; runs on its own too:
#
#   bench/exe_vs_objdump.sh [TOOL [DLL [OBJDUMP]]]
#
# TOOL defaults to the release build's tekit, DLL to the x86_64 Windows build's tekit.dll (built
# first when missing), OBJDUMP to x86_64-w64-mingw32-objdump. Each command runs RUNS times
# (default 20) after one warm-up run; the line "ratio" is objdump's time over tekit's, for the
# wall-clock and for the CPU time of the whole process (start-up included).
set -euo pipefail
cd "$(dirname "$0")/.."

tool=${1:-build/release/tools/tekit/tekit}
dll=${2:-build/mingw-x86_64/bin/tekit.dll}
objdump=${3:-x86_64-w64-mingw32-objdump}
runs=${RUNS:-20}

if ! command -v "$objdump" >/dev/null; then
    echo "exe_vs_objdump: skipped: no $objdump (binutils-mingw-w64-x86-64)"
    exit 0
fi
if [[ ! -f "$dll" && "$dll" == build/mingw-x86_64/* ]]; then
    cmake --preset mingw-x86_64 >/dev/null && cmake --build --preset mingw-x86_64 --target tekit >&2
fi

# "WALL CPU" milliseconds (CPU: user + system) for RUNS runs of the command, its output thrown
# away. CPU time is the fairer figure on a busy machine.
timed() {
    "$@" >/dev/null
    local TIMEFORMAT='%3R %3U %3S' report
    report=$({ time (for ((i = 0; i < runs; i++)); do "$@" >/dev/null; done); } 2>&1)
    read -r wall user system <<<"$report"
    echo "$(bc -l <<<"$wall * 1000") $(bc -l <<<"($user + $system) * 1000")"
}

read -r ours ours_cpu <<<"$(timed "$tool" exe --exports "$dll")"
read -r theirs theirs_cpu <<<"$(timed "$objdump" -p "$dll")"

# The export names each reads: tekit's JSON, objdump's [Ordinal/Name Pointer] Table.
"$tool" exe --exports --json "$dll" |
    python3 -c 'import json, sys
for f in json.load(sys.stdin)[0]["exports"]["functions"]:
    if f["name"]: print(f["name"])' | sort >/tmp/exe_vs_objdump.tekit.$$
"$objdump" -p "$dll" | sed -n '/\[Ordinal\/Name Pointer\] Table/,/^$/p' |
    sed -n 's/^\t\[ *[0-9]*\] \(.*\)$/\1/p' | sort >/tmp/exe_vs_objdump.objdump.$$
count=$(wc -l </tmp/exe_vs_objdump.tekit.$$)
if cmp -s /tmp/exe_vs_objdump.tekit.$$ /tmp/exe_vs_objdump.objdump.$$; then
    agree="the export lists agree ($count names)"
    status=0
else
    agree="the export lists DIFFER: $(diff /tmp/exe_vs_objdump.tekit.$$ /tmp/exe_vs_objdump.objdump.$$ | head -5)"
    status=1
fi
rm -f /tmp/exe_vs_objdump.tekit.$$ /tmp/exe_vs_objdump.objdump.$$

echo "$dll, $runs runs each (wall, CPU):"
printf '  tekit exe --exports  %6.2f ms  %6.2f ms a run\n' "$(bc -l <<<"$ours / $runs")" \
    "$(bc -l <<<"$ours_cpu / $runs")"
printf '  objdump -p           %6.2f ms  %6.2f ms a run\n' "$(bc -l <<<"$theirs / $runs")" \
    "$(bc -l <<<"$theirs_cpu / $runs")"
printf '  ratio                %6.1fx     %6.1fx faster\n' "$(bc -l <<<"$theirs / ($ours + 0.001)")" \
    "$(bc -l <<<"$theirs_cpu / ($ours_cpu + 0.001)")"
echo "  $agree"
exit $status
