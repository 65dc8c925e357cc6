#pragma once
// The description of a tile's pixels: how many channels, how many bits per channel, the pixel
// aspect ratio, and one further integer kept for the host. A plain value.
//
// Channels stand in memory in the order r, g, b, a (ALPHA holds a only, RGB has no a), with no
// padding between pixels.
#include <ostream>

#include "rational.h"

namespace Zr {

class IxPixelFormat {
public:
    enum Comps : int { ALPHA = 1, RGB = 3, RGBA = 4 };
    // Bits per channel. COMPLEX channels are pairs of floats (real, imaginary).
    enum Depth : int { UINT8 = 8, FLOAT16 = 16, FLOAT32 = 32, COMPLEX = 64 };

    // RGBA of floats, square pixels.
    IxPixelFormat();
    // Asserts each argument: a known channel count, a known depth, a positive aspect ratio.
    IxPixelFormat(Comps comps, Depth depth, const Rational& aspectRatio = Rational{1, 1},
                  int reserved = 0);

    // One byte per pixel: the format of raw memory blocks held as tiles.
    static IxPixelFormat getRawMemoryFormat();

    int getBytesPerChannel() const { return static_cast<int>(_depth) / 8; }
    int getBytesPerPixel() const { return static_cast<int>(_comps) * getBytesPerChannel(); }
    bool hasAlpha() const { return _comps != RGB; }

    friend bool operator==(const IxPixelFormat& a, const IxPixelFormat& b) {
        return a._comps == b._comps && a._depth == b._depth &&
               a._aspectRatio == b._aspectRatio && a._reserved == b._reserved;
    }

    void dump(std::ostream& os) const;

    Comps _comps;
    Depth _depth;
    Rational _aspectRatio;  // pixel width over pixel height
    int _reserved;          // the host's own; 0 in the library's formats

private:
    void checkArguments(const Rational& aspectRatio) const;
};

}  // namespace Zr

#include "ixPixelFormat.inline"
