#include "pxImageTexture.h"

namespace Zr {

namespace {

// 64 x 64 pixels: with a float RGBA output (16 bytes), a depth (4) and a list head (8) per pixel
// a block takes about 112 KiB, which stays within a typical second-level cache.
constexpr int blockWidth = 64;
constexpr int blockHeight = 64;

}  // namespace

int PxImageTexture::getAvgCacheBlockingSizeX() { return blockWidth; }

int PxImageTexture::getAvgCacheBlockingSizeY() { return blockHeight; }

}  // namespace Zr
