#!/usr/bin/env bash
# Tests against code: non-blank lines of the C++ files (.cpp .h .inc .def) in tests/ against
# those in src/, include/ and tools/, overall and one line per subsystem (tests/<name> against
# src/<name> and include/tekit/<name>; the tool's tests against tools/; the shared test helpers
# count in the total only). The aim is about a third.
#
#   scripts/test-ratio.sh
#   scripts/test-ratio.sh --toolbox    # the toolbox split by concept instead
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

# The toolbox's concepts: the tests of each (files of tests/toolbox) and its code (files of
# include/tekit/toolbox and src/toolbox, by name without the extension, or folders). What no
# concept names is counted as "(other)".
toolbox_concepts=(
    # The flat functions: lists and handles, sorting and searching, comparisons, constants and
    # conversions, the data-to-text encoding, text helpers, integer lists, the line reader,
    # memory helpers, random numbers, timer, sound and dates.
    "functions|ListTest NumbersTest DataTextTest LineFileTest ToolboxUtilitiesTest|List Handle Compare CompareFunction Constants Conversions DataText TextHelpers IntegerList LineFile Sort MemoryHelpers Random Timer Sound DateTime BinarySearch DateTimeText FlatGuard HandleAssert ListBlock ListItems ListSearch SwapBytes TextScan TimeAndSound"
    "patterns|RegExprTest RegExprMatcherTest|RegExpr pattern"
    "ranges|IntRangeTest|SimpleIntRange SimpleIntRangeList IntRangeMessages"
)

# concept_files <dir> <name>...: the files of <dir> whose name without extension is one of the
# names, and the folders of that name.
concept_files() {
    local dir=$1 name file
    shift
    for name in "$@"; do
        [[ -d $dir/$name ]] && echo "$dir/$name"
        for file in "$dir/$name".*; do
            [[ -f $file ]] && echo "$file"
        done
    done
    return 0
}

if [[ ${1:-} == --toolbox ]]; then
    named_tests=() named_code=()
    for concept in "${toolbox_concepts[@]}"; do
        IFS='|' read -r name tests code <<<"$concept"
        # shellcheck disable=SC2086 # the name lists are split on purpose
        mapfile -t test_files < <(concept_files tests/toolbox $tests)
        # shellcheck disable=SC2086
        mapfile -t code_files < <(concept_files include/tekit/toolbox $code
            concept_files src/toolbox $code)
        named_tests+=("${test_files[@]}")
        named_code+=("${code_files[@]}")
        row "$name" "$(lines "${test_files[@]}")" "$(lines "${code_files[@]}")"
    done
    all_tests=$(lines tests/toolbox)
    all_code=$(lines src/toolbox include/tekit/toolbox)
    row "(other)" $((all_tests - $(lines "${named_tests[@]}"))) \
        $((all_code - $(lines "${named_code[@]}")))
    row toolbox "$all_tests" "$all_code"
    exit 0
fi

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
