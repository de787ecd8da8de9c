#!/usr/bin/env bash
# The Windows legs of the test run: cross-build the DLL with MinGW-w64 for x86_64 and i686.
#
#   x86_64  configure, build, run every test under Wine (an Xvfb display for window tests)
#   i686    configure, build, check the export table on the host: these machines run no
#           32-bit program, so the 64-bit leg stands in for running the Win32 code
#
# Both export checks read the DLLs with the host's tekit program, built first (build/dev).
#
# TEKIT_SKIP_WINDOWS=1 skips both legs. Extra arguments are passed to ctest of the x86_64 leg.
# Called by scripts/test.sh; runs on its own as well.
set -euo pipefail

if [[ "${TEKIT_SKIP_WINDOWS:-0}" == 1 ]]; then
    echo "windows: skipped (TEKIT_SKIP_WINDOWS=1)"
    exit 0
fi

root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
cd "$root" # presets are read from the source folder
jobs=${TEKIT_JOBS:-2}

require() {
    local missing=()
    for cmd in x86_64-w64-mingw32-g++-posix i686-w64-mingw32-g++-posix wine wineserver Xvfb; do
        command -v "$cmd" >/dev/null || missing+=("$cmd")
    done
    [[ -f /usr/src/googletest/CMakeLists.txt ]] || missing+=("/usr/src/googletest")
    if ((${#missing[@]})); then
        echo "windows: missing ${missing[*]} (packages: g++-mingw-w64-x86-64-posix" \
             "g++-mingw-w64-i686-posix wine wine64 xvfb googletest libz-mingw-w64-dev)" >&2
        exit 1
    fi
}

# Prints "<label>: <seconds> s" for the step run as "$@".
timed() {
    local label=$1 start=$SECONDS status=0
    shift
    "$@" || status=$?
    echo "windows: ${label}: $((SECONDS - start)) s$( ((status)) && echo " (failed)")"
    return $status
}

# The host's tekit program (of the dev build) reads the DLLs' export tables for the export
# check: the library checks itself, without binutils.
host_tool="$root/build/dev/tools/tekit/tekit"
build_host_tool() {
    cmake --preset dev >/dev/null && cmake --build --preset dev --target tekit_cli -j "$jobs"
}

build() {
    local preset=$1
    cmake --preset "$preset" -DTEKIT_WERROR=ON -DTEKIT_HOST_TOOL="$host_tool" >/dev/null &&
        cmake --build --preset "$preset" -j "$jobs"
}

# An X display of our own for the tests that open windows; stopped when the script ends.
xvfb_pid=
start_display() {
    local n=90
    while [[ -e /tmp/.X$n-lock || -e /tmp/.X11-unix/X$n ]]; do
        n=$((n + 1))
    done
    Xvfb ":$n" -screen 0 1024x768x24 -nolisten tcp >/dev/null 2>&1 &
    xvfb_pid=$!
    export DISPLAY=":$n"
    for _ in $(seq 50); do
        [[ -e /tmp/.X11-unix/X$n ]] && return 0
        sleep 0.1
    done
    echo "windows: Xvfb did not start on $DISPLAY" >&2
    return 1
}

prefix64="$root/build/mingw-x86_64/wineprefix"
cleanup() {
    if [[ -d "$prefix64" ]]; then
        WINEPREFIX="$prefix64" wineserver -k 2>/dev/null || true
    fi
    if [[ -n "$xvfb_pid" ]]; then
        kill "$xvfb_pid" 2>/dev/null || true
    fi
}
trap cleanup EXIT

# The legs run in "||" context, where errexit is off: each step's failure ends the leg.
leg_x86_64() {
    timed "x86_64 build" build mingw-x86_64 || return 1
    start_display || return 1
    timed "x86_64 wine prefix" "$root/scripts/wine-run.sh" "$prefix64" --init || return 1
    timed "x86_64 tests under Wine" \
        ctest --test-dir "$root/build/mingw-x86_64" --output-on-failure -j "$jobs" "$@"
}

leg_i686() {
    timed "i686 build" build mingw-i686 || return 1
    timed "i686 export table" ctest --test-dir "$root/build/mingw-i686" --output-on-failure \
        --no-tests=error -L exports
}

require
status=0
timed "host tool" build_host_tool || exit 1
timed "x86_64 leg" leg_x86_64 "$@" || status=1
timed "i686 leg" leg_i686 || status=1
exit $status
