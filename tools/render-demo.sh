#!/usr/bin/env bash
# Builds everything (optimised preset) and runs the main job: the zrender host, which renders its
# sample scene to zrender.png in the root of the tree. Arguments go to zrender (see --help).
set -euo pipefail
cd "$(dirname "$0")/.."
tools/install-deps.sh
cmake --preset opt >/dev/null
cmake --build --preset opt
./build/opt/tools/zrender "$@"
