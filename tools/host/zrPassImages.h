#pragma once
// The compositing passes of a picture rendered as tiles: the surface channels and deep samples of
// each tile, gathered by the library beside the tile's colour, put together into whole images.
//
//   ZrPassImages passes(ZrPassImages::parse("z,n,p,uv,id"), "deep.exr" != "", width, height);
//   settings.passes = &passes;                         // the tile renderer hands each tile on
//   ZrPassImages::writeExr("out.exr", passes.layers(picture));
//   ZrPassImages::writeExr("deep.exr", passes.deepImage());
//
// The layered image holds the picture's R, G, B, A and then, in this order, Z; N.X, N.Y, N.Z;
// P.X, P.Y, P.Z; UV.U, UV.V; ObjectID, MaterialID; motion.u, motion.v for the passes asked for;
// then for crypto the ID mattes by object and by material name (zrCryptomatte.h), made from the
// deep samples, which the tiles then gather even without a deep image. The motion of a pixel is
// in pixels towards where its surface is one frame later: u to the right, v upwards in the
// picture as it is viewed (against the file's rows). The deep image holds per pixel every
// fragment, nearest first, as R, G, B, A (premultiplied), Z, ZBack, ObjectID and MaterialID. Rows
// run from the top down, as in the pictures.
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include <OpenImageIO/imagebuf.h>

#include "geRectangle.h"
#include "rsAuxOutputs.h"

namespace Zr {

class ZrPassImages {
public:
    // clang-format off
    enum Pass : unsigned { depth = 0x1, normal = 0x2, position = 0x4, texCoord = 0x8, ids = 0x10,
                           crypto = 0x20, motion = 0x40 };
    // clang-format on

    // The passes of a comma-separated list of z, n, p, uv, id, motion and crypto. Throws
    // ZrHostError for any other name.
    static unsigned parse(const std::string& list);

    ZrPassImages(unsigned passes, bool deep, int width, int height);

    // The outputs that the render of a tile fills; null when nothing is asked for.
    std::unique_ptr<RsAuxOutputs> makeTileOutputs(const GeRectangle<int>& tile) const;
    // Whether the tiles' outputs are to be given a motion target.
    bool wantsMotion() const { return (_passes & motion) != 0; }
    // Keeps what a tile's render gathered. Safe from several threads.
    void keepTile(std::unique_ptr<RsAuxOutputs> outputs);

    // The picture with the pass channels after its own, float.
    OIIO::ImageBuf layers(const OIIO::ImageBuf& picture) const;
    // The deep image of the picture.
    OIIO::ImageBuf deepImage() const;

    // Writes an image, flat or deep, as a float OpenEXR file. Throws ZrHostError naming it.
    static void writeExr(const std::string& path, const OIIO::ImageBuf& image);

private:
    unsigned _passes;
    bool _deep;
    int _width;
    int _height;
    std::mutex _lock;
    std::vector<std::unique_ptr<RsAuxOutputs>> _tiles;
};

}  // namespace Zr
