#!/usr/bin/env bash
# Builds everything with the given preset (default: opt) and runs the whole test suite.
set -euo pipefail
cd "$(dirname "$0")/.."
preset=${1:-opt}
tools/install-deps.sh
cmake --preset "$preset" >/dev/null
cmake --build --preset "$preset"
ctest --preset "$preset"
