#pragma once
// The pixel writers of flat 2D fills: one colour laid straight into a tile's own format, a run of
// whole pixels at a time or a row of sub-pixel spans at a time.
//
// There is one writer per channel type (bytes, half floats, floats), channel count (1: alpha only,
// 3: colour without alpha, 4: both) and mode, in a plain and a sub-pixel kind: eighteen of each.
// A caller picks its pair once per colour and mode and calls them per span through plain function
// pointers.
//
// Replacing writers store the colour, converted for the format (bytes by v * 255 + 0.5, clamped
// and truncated; halves by the plain conversion), and never read the pixel. Blending writers lay
// the colour over the pixel with premultiplied "over": source = colour * alpha (alpha itself in
// the alpha channel), pixel = source + pixel * (1 - alpha). Bytes scale the source by 255, add
// and truncate, clamped to 0..255, with no rounding term; halves go through float for the sum.
//
// Sub-pixel writers take the coverage of each pixel from its 8 x 4 samples: a replacing writer
// stores the colour with its alpha times the coverage, a blending one blends with alpha times the
// coverage. A sub-scanline covers the samples from its start up to and including the sample its
// end lands on, within the pixel: a right end inside a pixel counts one sample more than an
// exclusive end would.
#include <cstdint>

#include "coRgbaColorTyped.h"
#include "ixPixelFormat.h"
#include "ixWriteGuard.h"
#include "rsPixelSpan.h"

namespace Zr {

class Rs2DSpanWriter {
public:
    using Rgba = CoRgbaColorTyped<float>;
    using AASpan = RsPixelSpan<3, 2>;
    // Pixels x1 up to, not including, x2 of row y, in the tile's coordinates.
    using FillSpan = void (*)(const IxWriteGuard& guard, int y, int x1, int x2, const Rgba& colour);
    // Row y of the tile; the span's sub-pixel positions count from the tile's left edge.
    using FillAASpan = void (*)(const IxWriteGuard& guard, int y, const AASpan& span, const Rgba& colour);

    // The writers of the format; an unknown depth or channel count aborts
    // (Assertions::throwProgramAborted) with the source path given.
    static FillSpan selectFillSpan(const IxPixelFormat& format, bool blending, const char* sourcePath);
    static FillAASpan selectFillAASpan(const IxPixelFormat& format, bool blending, const char* sourcePath);

    // Masks of one sub-scanline of a pixel, bit 7 for its first sample: the samples from a start
    // at sample i, and those up to and including sample i.
    static constexpr std::uint8_t kLeftMask[8] = {0xff, 0x7f, 0x3f, 0x1f, 0x0f, 0x07, 0x03, 0x01};
    static constexpr std::uint8_t kRightMask[8] = {0x80, 0xc0, 0xe0, 0xf0, 0xf8, 0xfc, 0xfe, 0xff};

    // The 32 samples of the pixel whose first sub-pixel is px that the span covers, one byte per
    // sub-scanline (byte r for sub-scanline r).
    static std::uint32_t coverageMask(const AASpan& span, int px) {
        std::uint32_t mask = 0;
        for (int r = 0; r < AASpan::kSubScanlines; ++r) {
            const int x1 = span._x1[r];
            const int x2 = span._x2[r];
            const std::uint32_t left = x1 < px ? 0xffu : x1 >= px + 8 ? 0u : kLeftMask[x1 & 7];
            const std::uint32_t right = x2 >= px + 8 ? 0xffu : x2 < px ? 0u : kRightMask[x2 & 7];
            mask |= (left & right) << (8 * r);
        }
        return mask;
    }

    Rs2DSpanWriter() = delete;
};

}  // namespace Zr
