#!/usr/bin/env bash
# Builds everything (optimised preset) and runs the main job: zrender renders the sample scene to
# zrender.png and a textured model of the assimp-testmodels package to spider.png, in the root of
# the tree. Arguments, when given, go to zrender instead (see zrender --help).
set -euo pipefail
cd "$(dirname "$0")/.."
tools/install-deps.sh
cmake --preset opt >/dev/null
cmake --build --preset opt
if (($#)); then
  exec ./build/opt/tools/zrender "$@"
fi
./build/opt/tools/zrender -o zrender.png
./build/opt/tools/zrender /usr/share/assimp/models/OBJ/spider.obj -o spider.png
echo "wrote zrender.png (the sample scene) and spider.png (a model file)"
