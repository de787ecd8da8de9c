#!/usr/bin/env bash
# Tests against code: non-blank lines of the C++ files (.cpp .h .inc .def) in tests/ against
# those in src/, include/ and tools/, overall and one line per subsystem (tests/<name> against
# src/<name> and include/tekit/<name>; the tool's tests against tools/; the shared test helpers
# count in the total only). The aim is about a third.
#
#   scripts/test-ratio.sh
set -euo pipefail
cd "$(dirname "$0")/.."

# lines <path>...: the non-blank lines of the C++ files below the paths that exist.
lines() {
    local paths=()
    for path in "$@"; do
        [[ -e $path ]] && paths+=("$path")
    done
    ((${#paths[@]})) || { echo 0; return; }
    find "${paths[@]}" -type f \( -name '*.cpp' -o -name '*.h' -o -name '*.inc' \
        -o -name '*.def' \) -exec cat {} + | grep -cv '^[[:space:]]*$' || true
}

# row <name> <tests> <code>
row() {
    awk -v name="$1" -v tests="$2" -v code="$3" 'BEGIN {
        printf "  %-15s %6d / %6d  %s\n", name, tests, code,
            code ? sprintf("%.2f", tests / code) : "-" }'
}

for dir in src/*/; do
    name=$(basename "$dir")
    row "$name" "$(lines "tests/$name")" "$(lines "src/$name" "include/tekit/$name")"
done
row tools "$(lines tests/tools)" "$(lines tools)"
row "(test support)" "$(lines tests/support tests/package tests/layering)" 0
tests=$(lines tests)
code=$(lines src include tools)
awk -v tests="$tests" -v code="$code" \
    'BEGIN { printf "ratio: %.2f (%d test lines / %d code lines)\n", tests / code, tests, code }'
