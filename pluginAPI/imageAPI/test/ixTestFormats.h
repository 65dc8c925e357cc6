#pragma once
// The pixel formats the image tests run through, and a way to read one pixel of a guard.
#include <vector>

#include "coRgbaColorTyped.h"
#include "ixPixelFormat.h"
#include "ixReadGuard.h"
#include "ixRowCodec.h"

namespace Zr::IxTestFormats {

// The nine formats of one, three or four channels of bytes, halves and floats, plus COMPLEX.
inline std::vector<IxPixelFormat> all(bool withComplex = true) {
    std::vector<IxPixelFormat> formats;
    for (auto depth : {IxPixelFormat::UINT8, IxPixelFormat::FLOAT16, IxPixelFormat::FLOAT32,
                       IxPixelFormat::COMPLEX}) {
        if (depth == IxPixelFormat::COMPLEX && !withComplex) continue;
        for (auto comps : {IxPixelFormat::ALPHA, IxPixelFormat::RGB, IxPixelFormat::RGBA}) {
            formats.emplace_back(comps, depth);
        }
    }
    return formats;
}

inline Rgba readPixel(const IxReadGuard& guard, int x, int y) {
    Rgba colour;
    IxRowCodec::selectReader(guard._pixelFormat)(guard.getPixelAddress(x, y), &colour, 1);
    return colour;
}

// The largest error a channel of this depth may add to a value of magnitude up to 1.
inline float tolerance(IxPixelFormat::Depth depth) {
    switch (depth) {
    case IxPixelFormat::UINT8: return 0.5f / 255.0f + 1e-6f;
    case IxPixelFormat::FLOAT16: return 1.0f / 2048.0f;
    default: return 0.0f;
    }
}

}  // namespace Zr::IxTestFormats
