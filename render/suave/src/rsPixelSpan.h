#pragma once
// One pixel row of scan conversion, as the rasterizer hands it to a buffer.
//
// RsPixelSpan<X, Y> has X bits of sub-pixel position across a pixel and Y bits of sub-scanline
// position down a pixel row. RsPixelSpan<0, 0> is a plain run of whole pixels; the sub-pixel
// kinds keep the start and end of each sub-scanline plus four extents over them, so that a
// consumer finds at once the pixels that are covered on every sub-scanline (the interior) and
// those that need a test per sample (the fringes).
#include <climits>

namespace Zr {

template <int X, int Y>
struct RsPixelSpan {
    static_assert(X > 0 && X <= 8 && Y > 0 && Y <= 8, "sub-pixel spans have 1 to 8 bits in x and y");

    static constexpr int kSubPixelBits = X;
    static constexpr int kSubScanlineBits = Y;
    static constexpr int kSubPixels = 1 << X;      // sub-pixels across a pixel
    static constexpr int kSubScanlines = 1 << Y;   // sub-scanlines in a pixel row
    // The x of a sub-scanline that the triangle misses, in both _x1 and _x2.
    static constexpr int kMissed = -1;
    // Start values of the extents, so that the first stored sub-scanline sets all four.
    static constexpr int kNoMin = INT_MAX;
    static constexpr int kNoMax = INT_MIN;

    int _x1[kSubScanlines];  // first covered sub-pixel of each sub-scanline
    int _x2[kSubScanlines];  // end (excluded) of each sub-scanline, in sub-pixels
    int _minX1;              // smallest and largest start over the stored sub-scanlines
    int _maxX1;
    int _minX2;              // smallest and largest end over the stored sub-scanlines
    int _maxX2;

    void resetExtents() {
        _minX1 = kNoMin;
        _maxX1 = kNoMax;
        _minX2 = kNoMin;
        _maxX2 = kNoMax;
    }
    void markMissed(int slot) {
        _x1[slot] = kMissed;
        _x2[slot] = kMissed;
    }
    // Stores sub-scanline `slot` and widens the extents by it.
    void store(int slot, int x1, int x2) {
        _x1[slot] = x1;
        _x2[slot] = x2;
        _minX1 = x1 < _minX1 ? x1 : _minX1;
        _maxX1 = x1 > _maxX1 ? x1 : _maxX1;
        _minX2 = x2 < _minX2 ? x2 : _minX2;
        _maxX2 = x2 > _maxX2 ? x2 : _maxX2;
    }
};

// Whole pixels: the run [_x1, _x2) of one row. A run with _x1 >= _x2 covers nothing.
template <>
struct RsPixelSpan<0, 0> {
    static constexpr int kSubPixelBits = 0;
    static constexpr int kSubScanlineBits = 0;
    static constexpr int kSubPixels = 1;
    static constexpr int kSubScanlines = 1;

    int _x1;  // first covered pixel
    int _x2;  // end of the run, excluded
};

// The two sub-pixel kinds in use: 8 x 4 cells per pixel for anti-aliased 2D triangles, and
// 16 x 16 for the A-buffer.
static_assert(sizeof(RsPixelSpan<0, 0>) == 2 * sizeof(int));
static_assert(sizeof(RsPixelSpan<3, 2>) == (2 * 4 + 4) * sizeof(int));
static_assert(sizeof(RsPixelSpan<4, 4>) == (2 * 16 + 4) * sizeof(int));

}  // namespace Zr
