// Format changes: the region rules, conversion through the codec, and bit copies of one format.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <memory>
#include <vector>

#include "ipFormatChange.h"
#include "ixRowCodec.h"

namespace Zr {
namespace {

Rgba readPixel(const IxReadGuard& guard, int x, int y) {
    Rgba c;
    IxRowCodec::selectReader(guard._pixelFormat)(guard.getPixelAddress(x, y), &c, 1);
    return c;
}

// How finely a depth keeps values in 0..1.
float precision(IxPixelFormat::Depth depth) {
    const bool byte = depth == IxPixelFormat::UINT8, half = depth == IxPixelFormat::FLOAT16;
    return byte ? 0.5f / 255.0f + 1e-6f : half ? 1.0f / 2048.0f : 0.0f;
}

// A distinct colour per pixel, every channel a byte value within 0..1.
Rgba pattern(int x, int y) {
    const auto channel = [](int seed) { return float(seed & 255) / 255.0f; };
    return {channel(x * 37 + y * 11), channel(x * 5 + y * 91), channel(x * 13 + y * 7 + 100),
            channel(x * 29 + y * 3 + 50)};
}

const GeRectangle<int> region{-3, 5, 2, 6};

std::unique_ptr<IxTile> patternTile(const IxPixelFormat& format, const GeRectangle<int>& rect) {
    auto tile = std::make_unique<IxTile>(format, rect, Rgba{0, 0, 0, 0});
    const IxWriteGuard guard(*tile);
    for (int y = rect.y0; y < rect.y1; ++y)
        for (int x = rect.x0; x < rect.x1; ++x) {
            const Rgba colour = pattern(x, y);
            IxRowCodec::selectWriter(format)(guard.getPixelAddress(x, y), &colour, 1);
        }
    return tile;
}

TEST(IpFormatChange, OnlyTheCommonPartOfTheRectangleAndBothRegionsChanges) {
    const Rgba sentinel{0.5f, 0.5f, 0.5f, 0.5f};
    const struct {
        GeRectangle<int> toRegion;
        bool useRect;
        GeRectangle<int> rect, changed;  // the expected changed pixels of the target
    } cases[] = {
        {{-10, 10, -10, 10}, false, {}, region},                      // null: all of from's region
        {{-10, 10, -10, 10}, true, {0, 2, 3, 5}, {0, 2, 3, 5}},      // a rectangle inside
        {{-10, 10, -10, 10}, true, {-20, 1, 4, 30}, {-3, 1, 4, 6}},  // clipped by from's region
        {{0, 3, 0, 4}, false, {}, {0, 3, 2, 4}},                      // clipped by to's region
        {{20, 25, 0, 4}, false, {}, {0, 0, 0, 0}},                    // disjoint: nothing
        {{-10, 10, -10, 10}, true, {2, 1, 3, 5}, {0, 0, 0, 0}},      // an inverted rectangle
    };
    IxTile untouched({IxPixelFormat::RGB, IxPixelFormat::UINT8}, region, sentinel);  // empty guards convert nothing
    ipFormatChange(IxWriteGuard(untouched), IxReadGuard(), nullptr);
    ipFormatChange(IxWriteGuard(), IxReadGuard(untouched), nullptr);
    EXPECT_NEAR(readPixel(IxReadGuard(untouched), 0, 3).r, 0.5f, precision(IxPixelFormat::UINT8));
    const auto source = patternTile({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, region);
    for (const auto& c : cases)
        for (auto depth : {IxPixelFormat::FLOAT16, IxPixelFormat::FLOAT32}) {  // converted and copied
            IxTile target({IxPixelFormat::RGBA, depth}, c.toRegion, sentinel);
            ipFormatChange(IxWriteGuard(target), IxReadGuard(*source), c.useRect ? &c.rect : nullptr);
            for (int y = c.toRegion.y0; y < c.toRegion.y1; ++y)
                for (int x = c.toRegion.x0; x < c.toRegion.x1; ++x) {
                    const Rgba want = c.changed.contains(x, y) ? pattern(x, y) : sentinel;
                    const Rgba got = readPixel(IxReadGuard(target), x, y);
                    ASSERT_NEAR(got.r, want.r, precision(depth)) << x << "," << y;
                    ASSERT_NEAR(got.a, want.a, precision(depth)) << x << "," << y;
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
