// Format changes between every pair of formats, the region rules and untouched surroundings.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <memory>
#include <vector>

#include "ipFormatChange.h"
#include "ixReadGuard.h"
#include "ixRowCodec.h"
#include "ixTile.h"
#include "ixWriteGuard.h"

namespace Zr {
namespace {

std::vector<IxPixelFormat> allFormats() {
    std::vector<IxPixelFormat> formats;
    for (auto depth : {IxPixelFormat::UINT8, IxPixelFormat::FLOAT16, IxPixelFormat::FLOAT32, IxPixelFormat::COMPLEX})
        for (auto comps : {IxPixelFormat::ALPHA, IxPixelFormat::RGB, IxPixelFormat::RGBA})
            formats.emplace_back(comps, depth);
    return formats;
}

// A rank of exactness: a format of higher or equal rank keeps every value of a lower one.
int rank(IxPixelFormat::Depth depth) {
    return depth == IxPixelFormat::UINT8 ? 0 : depth == IxPixelFormat::FLOAT16 ? 1 : 2;
}

// How finely a depth keeps values in 0..1.
float precision(IxPixelFormat::Depth depth) {
    const float byRank[] = {0.5f / 255.0f + 1e-6f, 1.0f / 2048.0f, 0.0f};
    return byRank[rank(depth)];
}

bool keepsColour(IxPixelFormat::Comps c) { return c != IxPixelFormat::ALPHA; }
bool keepsAlpha(IxPixelFormat::Comps c) { return c != IxPixelFormat::RGB; }

Rgba readPixel(const IxReadGuard& guard, int x, int y) {
    Rgba c;
    IxRowCodec::selectReader(guard._pixelFormat)(guard.getPixelAddress(x, y), &c, 1);
    return c;
}

void writePixel(const IxWriteGuard& guard, int x, int y, const Rgba& c) {
    IxRowCodec::selectWriter(guard._pixelFormat)(guard.getPixelAddress(x, y), &c, 1);
}

// A distinct colour per pixel, every channel a byte value within 0..1.
float channel(int seed) { return float(((seed % 256) + 256) % 256) / 255.0f; }

Rgba pattern(int x, int y) {
    return {channel(x * 37 + y * 11), channel(x * 5 + y * 91), channel(x * 13 + y * 7 + 100),
            channel(x * 29 + y * 3 + 50)};
}

const GeRectangle<int> region{-3, 5, 2, 6};

// Makes a tile of the format holding the pattern, as the format stores it.
std::unique_ptr<IxTile> patternTile(const IxPixelFormat& format, const GeRectangle<int>& rect) {
    auto tile = std::make_unique<IxTile>(format, rect, Rgba{0, 0, 0, 0});
    const IxWriteGuard guard(*tile);
    for (int y = rect.y0; y < rect.y1; ++y)
        for (int x = rect.x0; x < rect.x1; ++x) writePixel(guard, x, y, pattern(x, y));
    return tile;
}

TEST(IpFormatChange, EveryPairConvertsByChannelPresenceWithinTheCoarserPrecision) {
    for (const IxPixelFormat& fromFormat : allFormats()) {
        const auto source = patternTile(fromFormat, region);
        const IxReadGuard from(*source);
        for (const IxPixelFormat& toFormat : allFormats()) {
            IxTile target(toFormat, region, {0, 0, 0, 0});
            const IxWriteGuard to(target);
            ipFormatChange(to, from, nullptr);
            const float tolerance = std::max(precision(fromFormat._depth), precision(toFormat._depth));
            const IxReadGuard result(to);
            for (int y = region.y0; y < region.y1; ++y) {
                for (int x = region.x0; x < region.x1; ++x) {
                    const Rgba want = pattern(x, y);
                    const Rgba got = readPixel(result, x, y);
                    const bool colour = keepsColour(fromFormat._comps) && keepsColour(toFormat._comps);
                    const bool alpha = keepsAlpha(fromFormat._comps) && keepsAlpha(toFormat._comps);
                    // A channel missing on either side reads as its default: 0 colour, 1 alpha.
                    ASSERT_NEAR(got.r, colour ? want.r : 0.0f, tolerance);
                    ASSERT_NEAR(got.g, colour ? want.g : 0.0f, tolerance);
                    ASSERT_NEAR(got.b, colour ? want.b : 0.0f, tolerance);
                    ASSERT_NEAR(got.a, alpha ? want.a : 1.0f, tolerance);
                }
            }
        }
    }
}

TEST(IpFormatChange, RoundTripsThroughARicherFormatAreExact) {
    for (const IxPixelFormat& a : allFormats()) {
        for (const IxPixelFormat& b : allFormats()) {
            const bool richer = rank(b._depth) >= rank(a._depth) &&
                                (!keepsColour(a._comps) || keepsColour(b._comps)) &&
                                (!keepsAlpha(a._comps) || keepsAlpha(b._comps));
            if (!richer) continue;
            const auto original = patternTile(a, region);
            IxTile middle(b, region, {0, 0, 0, 0});
            IxTile back(a, region, {0, 0, 0, 0});
            ipFormatChange(IxWriteGuard(middle), IxReadGuard(*original), nullptr);
            ipFormatChange(IxWriteGuard(back), IxReadGuard(middle), nullptr);
            const auto& bytes = *original->getStorage();
            ASSERT_EQ(std::memcmp(bytes.getPixels(), back.getStorage()->getPixels(), bytes.getByteSize()), 0)
                << a._comps << "/" << a._depth << " through " << b._comps << "/" << b._depth;
        }
    }
}

TEST(IpFormatChange, OnlyTheCommonPartOfTheRectangleAndBothRegionsChanges) {
    const Rgba sentinel{0.5f, 0.5f, 0.5f, 0.5f};
    struct Case {
        GeRectangle<int> toRegion;
        bool useRect;
        GeRectangle<int> rect;
        GeRectangle<int> changed;  // expected changed pixels of the target
    };
    const Case cases[] = {
        {{-10, 10, -10, 10}, false, {}, region},                      // null: all of from's region
        {{-10, 10, -10, 10}, true, {0, 2, 3, 5}, {0, 2, 3, 5}},      // a rectangle inside
        {{-10, 10, -10, 10}, true, {-20, 1, 4, 30}, {-3, 1, 4, 6}},  // clipped by from's region
        {{0, 3, 0, 4}, false, {}, {0, 3, 2, 4}},                      // clipped by to's region
        {{20, 25, 0, 4}, false, {}, {0, 0, 0, 0}},                    // disjoint: nothing
        {{-10, 10, -10, 10}, true, {2, 1, 3, 5}, {0, 0, 0, 0}},      // an inverted rectangle
    };
    // Empty guards on either side convert nothing.
    IxTile untouched({IxPixelFormat::RGB, IxPixelFormat::UINT8}, region, sentinel);
    ipFormatChange(IxWriteGuard(untouched), IxReadGuard(), nullptr);
    ipFormatChange(IxWriteGuard(), IxReadGuard(untouched), nullptr);
    EXPECT_NEAR(readPixel(IxReadGuard(untouched), 0, 3).r, 0.5f, precision(IxPixelFormat::UINT8));

    const auto source = patternTile({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, region);
    for (const Case& c : cases) {
        IxTile target({IxPixelFormat::RGBA, IxPixelFormat::FLOAT16}, c.toRegion, sentinel);
        ipFormatChange(IxWriteGuard(target), IxReadGuard(*source), c.useRect ? &c.rect : nullptr);
        const IxReadGuard result(target);
        for (int y = c.toRegion.y0; y < c.toRegion.y1; ++y) {
            for (int x = c.toRegion.x0; x < c.toRegion.x1; ++x) {
                const Rgba want = c.changed.contains(x, y) ? pattern(x, y) : sentinel;
                const Rgba got = readPixel(result, x, y);
                ASSERT_NEAR(got.r, want.r, 1.0f / 2048.0f) << x << "," << y;
                ASSERT_NEAR(got.a, want.a, 1.0f / 2048.0f) << x << "," << y;
            }
        }
    }
}

TEST(IpFormatChange, TheSameFormatCopiesBitsExactly) {
    // Half bit patterns that a conversion through float would not keep: infinities and NaNs.
    IxTile source({IxPixelFormat::ALPHA, IxPixelFormat::FLOAT16}, {0, 4, 0, 1}, {0, 0, 0, 0});
    const std::uint16_t halves[4] = {0x7c00, 0xfc00, 0x7e01, 0x0001};
    std::memcpy(source.getStorage()->getPixels(), halves, sizeof halves);
    IxTile target({IxPixelFormat::ALPHA, IxPixelFormat::FLOAT16}, {0, 4, 0, 1}, {0, 0, 0, 0});
    ipFormatChange(IxWriteGuard(target), IxReadGuard(source), nullptr);
    EXPECT_EQ(std::memcmp(target.getStorage()->getPixels(), halves, sizeof halves), 0);
}

}  // namespace
}  // namespace Zr
