#!/usr/bin/env bash
# Sets up what is missing, builds the tekit tool (dev preset) and runs its demo.
#
#   scripts/demo.sh            # text
#   scripts/demo.sh --json     # the same as JSON: standard output is the demo alone
#
# Installing and building report on standard error, so the demo's output can be piped
# (scripts/demo.sh --json | python3 -m json.tool).
set -euo pipefail
cd "$(dirname "$0")/.."

{
    scripts/install-deps.sh --linux
    cmake --preset dev >/dev/null
    cmake --build --preset dev --parallel "$(nproc)" --target tekit_cli
    echo ""
} >&2
exec build/dev/tools/tekit/tekit demo "$@"
