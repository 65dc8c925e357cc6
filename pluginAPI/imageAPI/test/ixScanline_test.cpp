// Scanline views and the unpremultiplication of a row.
#include <gtest/gtest.h>

#include <cmath>
#include <string>

#include "exBase.h"
#include "ixReadGuard.h"
#include "ixScanline.h"
#include "ixScanlineUtil.h"
#include "ixTestFormats.h"
#include "ixTile.h"

namespace Zr {
namespace {

using Scanline = IxScanline<CoRgbaColorTyped<float>>;

TEST(IxScanline, ViewsOneRowByTheTilesOwnColumns) {
    IxTile tile({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, {-2, 3, 5, 8}, {0, 0, 0, 0});
    const IxWriteGuard guard(tile);
    for (int y = 5; y < 8; ++y) {
        Scanline line(guard, y);
        EXPECT_EQ(line.getY(), y);
        EXPECT_EQ(line.getWidth(), 5);
        EXPECT_EQ(line.end() - line.begin(), 5);
        for (int x = -2; x < 3; ++x) {
            EXPECT_EQ(reinterpret_cast<unsigned char*>(&line[x]), guard.getPixelAddress(x, y));
            line[x] = Rgba{float(x), float(y), 0.0f, 1.0f};
        }
    }
    const IxReadGuard reader(tile);
    for (int y = 5; y < 8; ++y) {
        for (int x = -2; x < 3; ++x) {
            EXPECT_EQ(IxTestFormats::readPixel(reader, x, y), (Rgba{float(x), float(y), 0.0f, 1.0f}));
        }
    }
}

TEST(IxScanline, RefusesEmptyGuardsOtherFormatsAndRowsOutside) {
    IxTile rgbaFloat({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, {0, 4, 2, 4}, {0, 0, 0, 0});
    IxTile rgbFloat({IxPixelFormat::RGB, IxPixelFormat::FLOAT32}, {0, 4, 2, 4}, {0, 0, 0, 0});
    IxTile rgbaByte({IxPixelFormat::RGBA, IxPixelFormat::UINT8}, {0, 4, 2, 4}, {0, 0, 0, 0});
    struct Case {
        IxWriteGuard guard;
        int y;
    };
    const Case refused[] = {
        {IxWriteGuard(), 0},       {IxWriteGuard(rgbFloat), 2}, {IxWriteGuard(rgbaByte), 2},
        {IxWriteGuard(rgbaFloat), 1}, {IxWriteGuard(rgbaFloat), 4},
    };
    for (const Case& c : refused) EXPECT_THROW(Scanline(c.guard, c.y), ExAssertionFailed) << c.y;
    EXPECT_NO_THROW(Scanline(IxWriteGuard(rgbaFloat), 3));
    // Other colour types view the formats they stand for.
    EXPECT_NO_THROW(IxScanline<CoRgbColorTyped<float>>(IxWriteGuard(rgbFloat), 2));
}

// Straight colour from a premultiplied one, computed in double.
Rgba straight(const Rgba& p) {
    if (std::fabs(p.a) <= 1e-8) return {0.0f, 0.0f, 0.0f, p.a};
    const double a = p.a;
    return {float(p.r / a), float(p.g / a), float(p.b / a), p.a};
}

TEST(IxScanlineUtil, DivideByAlphaUnpremultipliesTheChosenColumns) {
    const Rgba premultiplied[] = {
        {0.25f, 0.5f, 0.125f, 0.5f}, {0.3f, 0.2f, 0.1f, 0.4f},    {0.5f, 0.5f, 0.5f, 0.0f},
        {0.5f, 0.5f, 0.5f, 1e-9f},   {-0.5f, 0.25f, 1.0f, -0.5f}, {0.7f, 0.6f, 0.5f, 1.0f},
    };
    struct Case {
        const GeInterval<int>* range;
        int first;  // the columns expected to change
        int last;
    };
    const GeInterval<int> inner{11, 12}, overhanging{8, 13}, beyond{14, 20}, empty{12, 11};
    const Case cases[] = {
        {nullptr, 10, 15}, {&inner, 11, 12}, {&overhanging, 10, 13}, {&beyond, 14, 15}, {&empty, 1, 0},
    };
    for (const Case& c : cases) {
        IxTile tile({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, {10, 16, 0, 1}, {0, 0, 0, 0});
        const IxWriteGuard guard(tile);
        Scanline line(guard, 0);
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
