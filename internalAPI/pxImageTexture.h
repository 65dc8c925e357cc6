#pragma once
// Cache blocking of image work. Loops over pixels that touch several per-pixel arrays at once
// (output tile, depth, fragment lists) walk the image in blocks of this size so that the block
// of every array stays in cache while it is worked on.
namespace Zr {

class PxImageTexture {
public:
    // The width of a block, in pixels.
    static int getAvgCacheBlockingSizeX();
    // The height of a block, in pixels (scanlines).
    static int getAvgCacheBlockingSizeY();
};

}  // namespace Zr
