// Scanline views and the unpremultiplication of a row.
#include <gtest/gtest.h>

#include <cmath>

#include "exBase.h"
#include "ixScanlineUtil.h"
#include "ixTestFormats.h"

namespace Zr {
namespace {

using Scanline = IxScanline<CoRgbaColorTyped<float>>;

TEST(IxScanline, ViewsOneRowByTheTilesOwnColumnsAndRefusesOtherRowsAndFormats) {
    IxTile tile({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, {-2, 3, 5, 8}, {0, 0, 0, 0});
    const IxWriteGuard guard(tile);
    Scanline line(guard, 6);
    EXPECT_EQ(line.end() - line.begin(), 5);
    for (int x = -2; x < 3; ++x) line[x] = Rgba{float(x), 6.0f, 0.0f, 1.0f};
    for (int x = -2; x < 3; ++x) EXPECT_EQ(IxTestFormats::readPixel(guard, x, 6), (Rgba{float(x), 6.0f, 0.0f, 1.0f}));

    IxTile rgbFloat({IxPixelFormat::RGB, IxPixelFormat::FLOAT32}, {0, 4, 2, 4}, {0, 0, 0, 0});
    IxTile rgbaByte({IxPixelFormat::RGBA, IxPixelFormat::UINT8}, {0, 4, 2, 4}, {0, 0, 0, 0});
    EXPECT_THROW(Scanline(IxWriteGuard(), 0), ExAssertionFailed);
    EXPECT_THROW(Scanline(IxWriteGuard(rgbFloat), 2), ExAssertionFailed);
    EXPECT_THROW(Scanline(IxWriteGuard(rgbaByte), 2), ExAssertionFailed);
    EXPECT_THROW(Scanline(guard, 4), ExAssertionFailed);
    EXPECT_THROW(Scanline(guard, 8), ExAssertionFailed);
}

TEST(IxScanlineUtil, DivideByAlphaUnpremultipliesTheChosenColumns) {
    const Rgba premultiplied[] = {
        {0.25f, 0.5f, 0.125f, 0.5f}, {0.3f, 0.2f, 0.1f, 0.4f},    {0.5f, 0.5f, 0.5f, 0.0f},
        {0.5f, 0.5f, 0.5f, 1e-9f},   {-0.5f, 0.25f, 1.0f, -0.5f}, {0.7f, 0.6f, 0.5f, 1.0f},
    };
    // Straight colour computed in double; alpha at most 1e-8 in magnitude gives black.
    auto straight = [](const Rgba& p) {
        const double f = std::fabs(p.a) <= 1e-8 ? 0.0 : 1.0 / p.a;
        return Rgba{float(p.r * f), float(p.g * f), float(p.b * f), p.a};
    };
    const GeInterval<int> inner{11, 12}, overhanging{8, 13}, beyond{14, 20}, empty{12, 11};
    const struct {
        const GeInterval<int>* range;
        int first, last;  // the columns expected to change
    } cases[] = {{nullptr, 10, 15}, {&inner, 11, 12}, {&overhanging, 10, 13}, {&beyond, 14, 15}, {&empty, 1, 0}};
    for (const auto& c : cases) {
        IxTile tile({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, {10, 16, 0, 1}, {0, 0, 0, 0});
        Scanline line(IxWriteGuard(tile), 0);
        for (int x = 10; x < 16; ++x) line[x] = premultiplied[x - 10];
        IxScanlineUtil::divideByAlpha(line, c.range);
        for (int x = 10; x < 16; ++x) {
            const Rgba& before = premultiplied[x - 10];
            const Rgba want = x >= c.first && x <= c.last ? straight(before) : before;
            EXPECT_NEAR(line[x].r, want.r, 1e-6f) << x;
            EXPECT_NEAR(line[x].g, want.g, 1e-6f) << x;
            EXPECT_NEAR(line[x].b, want.b, 1e-6f) << x;
            EXPECT_EQ(line[x].a, before.a) << x;
        }
    }
}

}  // namespace
}  // namespace Zr
