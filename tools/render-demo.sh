#!/usr/bin/env bash
# Builds everything (optimised preset) and runs the main job: the zrender host.
set -euo pipefail
cd "$(dirname "$0")/.."
tools/install-deps.sh
cmake --preset opt >/dev/null
cmake --build --preset opt
./build/opt/tools/zrender "$@"
