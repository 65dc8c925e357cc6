// Pixel formats, tiles, the guards on them with the addressing rule of the base pointer and their
// shared holds, the guard proxy, scanline views and the unpremultiplication of a row.
#include <gtest/gtest.h>

#include <cmath>
#include <memory>
#include <string>

#include "exBase.h"
#include "ixGuardProxy.h"
#include "ixScanlineUtil.h"
#include "ixTestFormats.h"

namespace Zr {
namespace {

using IxTestFormats::expectNear;
using IxTestFormats::presentChannels;
using IxTestFormats::readPixel;
using Scanline = IxScanline<CoRgbaColorTyped<float>>;

// The message of the failure of constructing a format; empty if none.
std::string constructionFailure(int comps, int depth, Rational ratio = Rational{1, 1}) {
    try {
        (void)IxPixelFormat(static_cast<IxPixelFormat::Comps>(comps), static_cast<IxPixelFormat::Depth>(depth), ratio);
    } catch (const ExAssertionFailed& failure) {
        return failure.getMessage();
    }
    return {};
}

// Known channel counts and depths with a positive aspect ratio construct; the channel count is
// checked first, then the depth, then the ratio.
TEST(IxPixelFormat, OnlyKnownLayoutsWithPositiveRatiosConstruct) {
    for (int comps : {1, 3, 4})
        for (int depth : {8, 16, 32, 64}) {
            EXPECT_EQ(constructionFailure(comps, depth, {2, 1}) + constructionFailure(comps, depth, {-2, -3}), "");
            const IxPixelFormat format{IxPixelFormat::Comps(comps), IxPixelFormat::Depth(depth)};
            EXPECT_EQ(format.getBytesPerPixel(), comps * depth / 8);
        }
    EXPECT_EQ(IxPixelFormat::getRawMemoryFormat(), IxPixelFormat(IxPixelFormat::ALPHA, IxPixelFormat::UINT8));
    const std::string comps = "_comps == ALPHA", depth = "_depth == UINT8", ratio = "aspectRatio.getFloat()";
    const struct {
        int comps, depth;
        Rational ratio;
        const std::string& starts;
    } cases[] = {{0, 8, {1, 1}, comps},  {2, 16, {1, 1}, comps},  {5, 32, {1, 1}, comps}, {-1, 8, {1, 1}, comps},
                 {1, 0, {1, 1}, depth},  {3, 7, {1, 1}, depth},   {4, 128, {1, 1}, depth}, {4, 32, {0, 1}, ratio},
                 {4, 32, {-1, 2}, ratio}, {1, 8, {3, -4}, ratio}, {3, 16, {0, 0}, ratio}, {2, 7, {0, 1}, comps},
                 {4, 7, {0, 1}, depth}};
    for (const auto& c : cases)
        EXPECT_EQ(constructionFailure(c.comps, c.depth, c.ratio).rfind(c.starts, 0), 0u) << c.comps << " " << c.depth;
}

// Tiles at the origin, off it along one axis, along both, at negative coordinates.
const GeRectangle<int> rectangles[] = {{0, 4, 0, 3}, {5, 9, 0, 2}, {0, 3, 7, 10}, {-3, 2, 11, 13},
                                       {100, 103, 200, 204}};

// Every pixel starts with the fill colour; pixel (x, y) lies at base + y * stride + x * bytes, so
// the base addresses pixel (0, 0), not the corner; rows are contiguous and unpadded; a read guard
// from a write guard shares its base and sees what is written through it.
TEST(IxTile, GuardsAddressTheFilledPixelsByTheTilesOwnCoordinates) {
    const Rgba fill{0.25f, 0.5f, 0.75f, 0.625f};
    for (const IxPixelFormat& format : IxTestFormats::all()) {
        for (const GeRectangle<int>& rect : rectangles) {
            IxTile tile(format, rect, fill);
            const IxWriteGuard writer(tile);
            const IxReadGuard reader(writer), separate(tile);
            const int bpp = format.getBytesPerPixel();
            const unsigned char* first = tile.getStorage()->getPixels();
            EXPECT_EQ(writer._rowStride, rect.getWidth() * bpp);
            EXPECT_EQ(reader._basePointer, writer._basePointer);
            EXPECT_EQ(separate._basePointer, writer._basePointer);
            EXPECT_EQ(writer._basePointer + rect.y0 * writer._rowStride + rect.x0 * bpp, first);
            EXPECT_EQ(writer.getPixelAddress(rect.x1 - 1, rect.y1 - 1) + bpp, first + tile.getStorage()->getByteSize());
            const auto colourAt = [](int x, int y) { return Rgba{0.125f * (x & 7), 0.5f, 0.25f * (y & 3), 0.75f}; };
            for (int y = rect.y0; y < rect.y1; ++y)
                for (int x = rect.x0; x < rect.x1; ++x) {
                    expectNear(readPixel(separate, x, y), presentChannels(fill, format._comps), format._depth);
                    IxTestFormats::writePixel(writer, x, y, colourAt(x, y));
                    expectNear(readPixel(reader, x, y), presentChannels(colourAt(x, y), format._comps), format._depth);
                }
        }
    }
}

TEST(IxTile, GuardsShareOneHoldThatKeepsThePixelsAfterTheTileIsGone) {
    EXPECT_FALSE(IxReadGuard(IxWriteGuard()).holdsTile());
    for (const GeRectangle<int>& rect : {GeRectangle<int>{0, 0, 0, 3}, GeRectangle<int>{0, 3, 0, 0}, {5, 2, 3, 1}}) {
        IxTile empty({IxPixelFormat::ALPHA, IxPixelFormat::UINT8}, rect, {0, 0, 0, 0});
        const IxReadGuard full(empty);  // even a tile with no pixels gives a guard with a handle
        EXPECT_TRUE(full.holdsTile() && full._tileHandle == empty.getStorage().get() && full._rectangle == rect);
    }
    auto tile = std::make_unique<IxTile>(IxPixelFormat(IxPixelFormat::RGBA, IxPixelFormat::FLOAT32),
                                         GeRectangle<int>{10, 14, 20, 23}, Rgba{1, 2, 3, 4});
    const RCShdPtr<IxTileStorage> storage = tile->getStorage();
    EXPECT_EQ(storage->getMemoryLockCount(), 0);
    IxWriteGuard writer(*tile);
    {
        const IxWriteGuard copy = writer;  // copies share the hold
        const IxReadGuard reader(writer);
        EXPECT_EQ(storage->getMemoryLockCount(), 1);
        const IxReadGuard separate(*tile);  // a guard of its own is another hold
        EXPECT_EQ(storage->getMemoryLockCount(), 2);
    }
    EXPECT_EQ(storage->getMemoryLockCount(), 1);
    tile.reset();
    IxReadGuard reader(writer);
    IxTestFormats::writePixel(writer, 13, 22, {5, 6, 7, 8});  // the sanitizer would see freed pixels
    EXPECT_EQ(readPixel(reader, 10, 20), (Rgba{1, 2, 3, 4}));
    EXPECT_EQ(readPixel(reader, 13, 22), (Rgba{5, 6, 7, 8}));
    IxTile other({IxPixelFormat::RGB, IxPixelFormat::UINT8}, {0, 1, 0, 1}, {0, 0, 0, 0});
    writer = IxWriteGuard(other);  // reassigned guards drop their hold on the old tile
    reader = IxReadGuard();
    EXPECT_EQ(storage->getMemoryLockCount(), 0);
    EXPECT_EQ(other.getStorage()->getMemoryLockCount(), 1);
}

TEST(IxGuardProxy, TakesAndDropsTheGuardsOfAllRegisteredTilesTogether) {
    IxTile a({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, {0, 2, 0, 2}, {0, 0, 0, 0});
    IxTile b({IxPixelFormat::ALPHA, IxPixelFormat::UINT8}, {4, 6, 1, 3}, {0, 0, 0, 0});
    IxTile c({IxPixelFormat::RGB, IxPixelFormat::FLOAT16}, {0, 1, 0, 1}, {0, 0, 0, 0});
    const auto locks = [&] {
        return a.getStorage()->getMemoryLockCount() * 100 + b.getStorage()->getMemoryLockCount() * 10 +
               c.getStorage()->getMemoryLockCount();
    };
    IxGuardProxy proxy;
    proxy.addTile(a);
    proxy.addTile(b);
    proxy.addTile(a);  // once only
    EXPECT_EQ(proxy.getTileCount(), 2);
    EXPECT_THROW(proxy.getGuard(0), ExAssertionFailed);  // not taken yet
    proxy.takeGuards();
    proxy.takeGuards();  // no second hold
    EXPECT_EQ(locks(), 110);
    EXPECT_EQ(proxy.getGuard(1)._tileHandle, b.getStorage().get());
    EXPECT_THROW(proxy.getGuard(2), ExAssertionFailed);
    EXPECT_THROW(proxy.getGuard(-1), ExAssertionFailed);
    proxy.addTile(c);  // joins the guards already held
    EXPECT_EQ(locks(), 111);
    proxy.releaseGuards();
    EXPECT_FALSE(proxy.holdsGuards());
    EXPECT_EQ(locks(), 0);
}

TEST(IxScanline, ViewsOneRowByTheTilesOwnColumnsAndRefusesOtherRowsAndFormats) {
    IxTile tile({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, {-2, 3, 5, 8}, {0, 0, 0, 0});
    const IxWriteGuard guard(tile);
    Scanline line(guard, 7);
    EXPECT_EQ(line.end() - line.begin(), 5);
    for (int x = -2; x < 3; ++x) line[x] = Rgba{float(x), 7.0f, 0.0f, 1.0f};
    for (int x = -2; x < 3; ++x) EXPECT_EQ(readPixel(guard, x, 7), (Rgba{float(x), 7.0f, 0.0f, 1.0f}));
    IxTile rgbFloat({IxPixelFormat::RGB, IxPixelFormat::FLOAT32}, {0, 4, 2, 4}, {0, 0, 0, 0});
    IxTile rgbaByte({IxPixelFormat::RGBA, IxPixelFormat::UINT8}, {0, 4, 2, 4}, {0, 0, 0, 0});
    EXPECT_THROW(Scanline(IxWriteGuard(), 0), ExAssertionFailed);
    EXPECT_THROW(Scanline(IxWriteGuard(rgbFloat), 2), ExAssertionFailed);
    EXPECT_THROW(Scanline(IxWriteGuard(rgbaByte), 2), ExAssertionFailed);
    EXPECT_THROW(Scanline(guard, 4), ExAssertionFailed);
    EXPECT_THROW(Scanline(guard, 8), ExAssertionFailed);
    EXPECT_NO_THROW(Scanline(guard, 5));
}

// Straight colour computed in double; an alpha of at most 1e-8 in magnitude gives black. Only the
// columns of the range, clipped to the row, change.
TEST(IxScanlineUtil, DivideByAlphaUnpremultipliesTheChosenColumns) {
    const Rgba premultiplied[] = {{0.25f, 0.5f, 0.125f, 0.5f}, {0.3f, 0.2f, 0.1f, 0.4f},    {0.5f, 0.5f, 0.5f, 0.0f},
                                  {0.5f, 0.5f, 0.5f, 1e-8f},   {-0.5f, 0.25f, 1.0f, -0.5f}, {0.7f, 0.6f, 0.5f, 1.0f}};
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
            const Rgba& p = premultiplied[x - 10];
            const double f = x < c.first || x > c.last ? 1.0 : std::fabs(p.a) <= 1e-8 ? 0.0 : 1.0 / p.a;
            IxTestFormats::expectNear(line[x], Rgba(float(p.r * f), float(p.g * f), float(p.b * f), p.a), 1e-6f);
        }
    }
}

}  // namespace
}  // namespace Zr
