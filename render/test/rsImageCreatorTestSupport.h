#pragma once
// Helpers of the image creator tests: the nine pixel formats, tiles made and filled through raw
// channel bits, and the per-channel conversions that tell what a reader or writer must produce.
#include <bit>
#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

#include "coRgbaColorTyped.h"
#include "geRectangle.h"
#include "ixPixelConvert.h"
#include "ixPixelFormat.h"
#include "ixReadGuard.h"
#include "ixTile.h"
#include "ixWriteGuard.h"

namespace Zr::RsImageTest {

using Rgba = CoRgbaColorTyped<float>;

struct Format {
    int comps;
    int depth;
    IxPixelFormat pixelFormat() const {
        return IxPixelFormat(static_cast<IxPixelFormat::Comps>(comps), static_cast<IxPixelFormat::Depth>(depth));
    }
};

inline const std::vector<Format>& allFormats() {
    static const std::vector<Format> formats{{1, 8}, {3, 8}, {4, 8}, {1, 16}, {3, 16},
                                             {4, 16}, {1, 32}, {3, 32}, {4, 32}};
    return formats;
}

// The channel of an RGBA colour that channel c of a pixel of comps channels holds.
inline int rgbaIndexOf(int comps, int c) { return comps == 1 ? 3 : c; }
inline float& channelOf(Rgba& colour, int i) {
    return i == 0 ? colour.r : i == 1 ? colour.g : i == 2 ? colour.b : colour.a;
}
inline float channelOf(const Rgba& colour, int i) {
    return i == 0 ? colour.r : i == 1 ? colour.g : i == 2 ? colour.b : colour.a;
}

// A write guard on a new tile; the guard keeps the pixels after the tile object is gone.
inline IxWriteGuard makeTile(const Format& format, const GeRectangle<int>& rectangle) {
    IxTile tile(format.pixelFormat(), rectangle, Rgba(0.0f, 0.0f, 0.0f, 0.0f));
    return IxWriteGuard(tile);
}

// Raw bits of channel c of pixel (x, y), in the tile's own coordinates, widened to 32 bits.
inline std::uint32_t rawChannel(const IxWriteGuard& g, int x, int y, int c) {
    const int bytes = g._pixelFormat._depth / 8;
    const unsigned char* p = g.getPixelAddress(x, y) + c * bytes;
    std::uint32_t v = 0;
    if (bytes == 1) v = *p;
    if (bytes == 2) { std::uint16_t h; std::memcpy(&h, p, 2); v = h; }
    if (bytes == 4) std::memcpy(&v, p, 4);
    return v;
}

inline void setRawChannel(const IxWriteGuard& g, int x, int y, int c, std::uint32_t v) {
    const int bytes = g._pixelFormat._depth / 8;
    unsigned char* p = g.getPixelAddress(x, y) + c * bytes;
    if (bytes == 1) *p = static_cast<unsigned char>(v);
    if (bytes == 2) { const std::uint16_t h = static_cast<std::uint16_t>(v); std::memcpy(p, &h, 2); }
    if (bytes == 4) std::memcpy(p, &v, 4);
}

// A channel's raw bits read as a float, by the conversions of its depth.
inline float bitsToFloat(int depth, std::uint32_t bits) {
    if (depth == 8) return IxPixelConvert::byteToFloat(static_cast<std::uint8_t>(bits));
    if (depth == 16) return IxPixelConvert::halfToFloat(static_cast<std::uint16_t>(bits));
    return std::bit_cast<float>(bits);
}

// The raw bits that a replacing writer stores for v.
inline std::uint32_t floatToBits(int depth, float v) {
    if (depth == 8) return IxPixelConvert::floatToByte(v);
    if (depth == 16) return IxPixelConvert::floatToHalf(v);
    return std::bit_cast<std::uint32_t>(v);
}

// The raw bits after an adding writer added v to a channel holding bits: per pass rounding and,
// for bytes, saturation.
inline std::uint32_t addToBits(int depth, std::uint32_t bits, float v) {
    if (depth == 8) {
        const unsigned sum = bits + IxPixelConvert::floatToByte(v);
        return sum > 255 ? 255 : sum;
    }
    if (depth == 16) {
        const float rounded = IxPixelConvert::halfToFloat(IxPixelConvert::floatToHalf(v));
        return IxPixelConvert::floatToHalf(IxPixelConvert::halfToFloat(static_cast<std::uint16_t>(bits)) + rounded);
    }
    return std::bit_cast<std::uint32_t>(std::bit_cast<float>(bits) + v);
}

// The straight colour that a pixel's stored channels stand for: missing alpha 1, missing colour 0.
inline Rgba pixelColour(const IxWriteGuard& g, int x, int y) {
    const int comps = g._pixelFormat._comps;
    const int depth = g._pixelFormat._depth;
    Rgba colour(0.0f, 0.0f, 0.0f, 1.0f);
    for (int c = 0; c < comps; ++c)
        channelOf(colour, rgbaIndexOf(comps, c)) = bitsToFloat(depth, rawChannel(g, x, y, c));
    return colour;
}

// Random raw bits for every channel of the tile: any bits, or (finite) values in [lo, hi).
inline void fillRandomBits(const IxWriteGuard& g, std::mt19937& rng) {
    const GeRectangle<int>& r = g._rectangle;
    for (int y = r.y0; y < r.y1; ++y)
        for (int x = r.x0; x < r.x1; ++x)
            for (int c = 0; c < g._pixelFormat._comps; ++c) setRawChannel(g, x, y, c, static_cast<std::uint32_t>(rng()));
}

inline void fillRandomValues(const IxWriteGuard& g, std::mt19937& rng, float lo, float hi) {
    std::uniform_real_distribution<float> value(lo, hi);
    const GeRectangle<int>& r = g._rectangle;
    for (int y = r.y0; y < r.y1; ++y)
        for (int x = r.x0; x < r.x1; ++x)
            for (int c = 0; c < g._pixelFormat._comps; ++c)
                setRawChannel(g, x, y, c, floatToBits(g._pixelFormat._depth, value(rng)));
}

// All bytes of the tile's block, for checks that nothing outside a range changed.
inline std::vector<unsigned char> snapshot(const IxWriteGuard& g) {
    const unsigned char* first = g.getPixelAddress(g._rectangle.x0, g._rectangle.y0);
    return std::vector<unsigned char>(first, first + std::size_t(g._rowStride) * g._rectangle.getHeight());
}

}  // namespace Zr::RsImageTest
