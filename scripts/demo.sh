#!/usr/bin/env bash
# Sets up what is missing, builds the tekit tool (dev preset) and runs its demo.
#
#   scripts/demo.sh            # text
#   scripts/demo.sh --json     # the same as JSON
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh --linux
cmake --preset dev >/dev/null
cmake --build --preset dev --parallel "$(nproc)" --target tekit_cli
echo ""
exec build/dev/tools/tekit/tekit demo "$@"
