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
# Large enough for eight regions, so that what crosses region borders is compared too.
"$build/tools/zrender" --size 400x300 -o "$golden/sample-400x300.png"
"$build/tools/zrender" --size 400x300 --no-zbuffer -o "$golden/sample-400x300-no-zbuffer.png"

# The two other shadow map types (the pictures above have depth maps).
"$build/tools/zrender" --size 160x120 --shadows midpoint -o "$golden/sample-160x120-midpoint.png"
"$build/tools/zrender" --size 160x120 --shadows deep -o "$golden/sample-160x120-deep.png"
# Antialiased, through a kernel of support 1 and one of support 2 (several regions each).
"$build/tools/zrender" --size 160x120 --antialias --filter gaussian -o "$golden/sample-160x120-aa-gaussian.png"
"$build/tools/zrender" --size 160x120 --antialias --filter cubic-bspline -o "$golden/sample-160x120-aa-cubic-bspline.png"
# Motion blur (frame 6 at 24 frames a second: the sphere swings, the torus turns) and depth of field.
"$build/tools/zrender" --size 160x120 --frames 6 --motion-blur --samples 6 -o "$golden/sample-160x120-motion-blur.png"
"$build/tools/zrender" --size 160x120 --dof --aperture 0.5 --samples 8 -o "$golden/sample-160x120-dof.png"
# Real model files from the assimp-testmodels package: OBJ with textures, glTF 2.0 and PLY.
models=/usr/share/assimp/models
"$build/tools/zrender" "$models/OBJ/spider.obj" --size 160x120 -o "$golden/model-spider-obj.png"
"$build/tools/zrender" "$models/glTF2/BoxTextured-glTF/BoxTextured.gltf" --size 160x120 -o "$golden/model-box-gltf.png"
"$build/tools/zrender" "$models/PLY/Wuson.ply" --size 160x120 -o "$golden/model-wuson-ply.png"
echo "wrote the three pictures model-*.png in $golden"
