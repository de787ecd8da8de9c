#!/bin/sh
# Runs a Windows program under Wine: the cross-compiling emulator of the MinGW builds.
#
#   scripts/wine-run.sh <wine prefix> <program.exe> [arguments...]
#   scripts/wine-run.sh <wine prefix> --init      # only create the prefix
#
# The prefix is created on first use (wineboot, serialised by a lock so that parallel tests
# do not race); Wine's own diagnostics are silenced so a test's output is the program's.
set -eu

if [ $# -lt 2 ]; then
    echo "usage: $0 <wine prefix> <program> [arguments...] | --init" >&2
    exit 2
fi
prefix=$1
shift

export WINEPREFIX="$prefix"
export WINEDEBUG=-all
export WINEARCH=win64
# No Mono or Gecko installation prompts: the tests need neither.
export WINEDLLOVERRIDES="mscoree,mshtml=${WINEDLLOVERRIDES:+;$WINEDLLOVERRIDES}"

if [ ! -f "$prefix/system.reg" ]; then
    mkdir -p "$(dirname "$prefix")"
    (
        flock 9
        if [ ! -f "$prefix/system.reg" ]; then
            wineboot --init >/dev/null 2>&1
            wineserver --wait
        fi
    ) 9>"$prefix.lock"
fi

if [ "$1" = "--init" ]; then
    exit 0
fi
exec wine "$@"
