#!/usr/bin/env bash
# Renders the sample scene with every compositing pass and turns each pass into a PNG that the
# README shows: tools/zrender/passes/pass-pictures.sh ZRENDER OUTDIR
# Depth and object IDs go through a colour map, normals and positions are shifted into 0..1,
# texture coordinates are red and green, motion vectors are grey at rest, and the ID matte of the
# semi-transparent torus is picked by its name through the Cryptomatte manifest.
set -euo pipefail
zrender=${1:?usage: pass-pictures.sh ZRENDER OUTDIR}
out=${2:?usage: pass-pictures.sh ZRENDER OUTDIR}
mkdir -p "$out"
exr="$out/passes.exr"
trap 'rm -f "$exr"' EXIT
"$zrender" --size 400x225 --frames 6 --passes z,n,p,uv,id,motion,crypto -o "$exr"
png() { oiiotool "$exr" "$@" -d uint8; }
png --ch R,G,B -o "$out/beauty.png"
png --ch Z --mulc 0.07 --colormap turbo -o "$out/z.png"
png --ch N.X,N.Y,N.Z --mulc 0.5 --addc 0.5 -o "$out/n.png"
png --ch P.X,P.Y,P.Z --addc 6,0.5,6 --mulc 0.083,0.25,0.083 -o "$out/p.png"
png --ch UV.U,UV.V,=0 --mulc 0.125 -o "$out/uv.png"
png --ch ObjectID --mulc 0.2 --colormap turbo -o "$out/id.png"
png --ch motion.u,motion.v,=0 --mulc 0.15 --addc 0.5,0.5,0 -o "$out/motion.png"

# The torus's ID: the manifest's hex bits as a float, written with enough digits to come back
# exactly. Its matte is the sum over the six ranks of the coverage whose ID equals it.
hex=$(oiiotool --info -v "$exr" | sed -n 's/.*cryptomatte\/[0-9a-f]*\/manifest: .*"greenTorus":"\([0-9a-f]*\)".*/\1/p')
id=$(python3 -c "import struct; print('%.9g' % struct.unpack('>f', bytes.fromhex('$hex'))[0])")
rank() {  # the coverage of rank ($1 layer, $2 id channel, $3 coverage channel) where the ID matches
  echo "$exr --ch CryptoObject$1.$2 --subc $id --abs --mulc 1e38 --clamp:min=0:max=1 --mulc -1 --addc 1"
  echo "$exr --ch CryptoObject$1.$3 --mul"
}
oiiotool $(rank 00 R G) $(rank 00 B A) --add $(rank 01 R G) --add $(rank 01 B A) --add \
  $(rank 02 R G) --add $(rank 02 B A) --add --ch 0,0,0 -d uint8 -o "$out/crypto.png"
