#pragma once
// The pixel formats the image tests run through, and pixel access by colour.
#include <gtest/gtest.h>

#include <vector>

#include "ixReadGuard.h"
#include "ixRowCodec.h"
#include "ixWriteGuard.h"

namespace Zr::IxTestFormats {

// The nine formats of one, three or four channels of bytes, halves and floats, then COMPLEX.
inline std::vector<IxPixelFormat> all() {
    std::vector<IxPixelFormat> formats;
    for (auto depth : {IxPixelFormat::UINT8, IxPixelFormat::FLOAT16, IxPixelFormat::FLOAT32, IxPixelFormat::COMPLEX})
        for (auto comps : {IxPixelFormat::ALPHA, IxPixelFormat::RGB, IxPixelFormat::RGBA})
            formats.emplace_back(comps, depth);
    return formats;
}

inline Rgba readPixel(const IxReadGuard& guard, int x, int y) {
    Rgba colour;
    IxRowCodec::selectReader(guard._pixelFormat)(guard.getPixelAddress(x, y), &colour, 1);
    return colour;
}

inline void writePixel(const IxWriteGuard& guard, int x, int y, const Rgba& colour) {
    IxRowCodec::selectWriter(guard._pixelFormat)(guard.getPixelAddress(x, y), &colour, 1);
}

// A colour as a format keeps it: missing alpha reads 1, missing colour reads 0.
inline Rgba presentChannels(const Rgba& c, IxPixelFormat::Comps comps) {
    if (comps == IxPixelFormat::ALPHA) return {0.0f, 0.0f, 0.0f, c.a};
    if (comps == IxPixelFormat::RGB) return {c.r, c.g, c.b, 1.0f};
    return c;
}

inline void expectNear(const Rgba& got, const Rgba& want, float tolerance) {
    EXPECT_NEAR(got.r, want.r, tolerance);
    EXPECT_NEAR(got.g, want.g, tolerance);
    EXPECT_NEAR(got.b, want.b, tolerance);
    EXPECT_NEAR(got.a, want.a, tolerance);
}

// Compares within the error a channel of the depth may add to a value within 0..1.
inline void expectNear(const Rgba& got, const Rgba& want, IxPixelFormat::Depth depth) {
    const bool byte = depth == IxPixelFormat::UINT8, half = depth == IxPixelFormat::FLOAT16;
    expectNear(got, want, byte ? 0.5f / 255.0f + 1e-6f : half ? 1.0f / 2048.0f : 0.0f);
}

}  // namespace Zr::IxTestFormats
