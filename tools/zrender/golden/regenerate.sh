#!/usr/bin/env bash
# Renders the golden pictures of zrender anew, with the zrender of the given build directory
# (default build/opt). The options must stay those of the zrender_golden_* tests in
# tools/CMakeLists.txt.
set -euo pipefail
root="$(cd "$(dirname "$0")/../../.." && pwd)"
build="${1:-$root/build/opt}"
golden="$root/tools/zrender/golden"
"$build/tools/zrender" --size 96x72 -o "$golden/sample-96x72.png"
"$build/tools/zrender" --size 96x72 --no-zbuffer -o "$golden/sample-96x72-no-zbuffer.png"
echo "wrote $golden/sample-96x72.png and $golden/sample-96x72-no-zbuffer.png"
