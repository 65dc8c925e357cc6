// Tiles and the public guards: filling, the addressing rule of the base pointer, empty guards,
// shared holds on the pixels.
#include <gtest/gtest.h>

#include <cstring>
#include <memory>

#include "ixReadGuard.h"
#include "ixTestFormats.h"
#include "ixTile.h"
#include "ixWriteGuard.h"

namespace Zr {
namespace {

using IxTestFormats::readPixel;

// The rectangle corners to place tiles at: the origin, off it along one axis, both, negative.
const GeRectangle<int> rectangles[] = {
    {0, 4, 0, 3}, {5, 9, 0, 2}, {0, 3, 7, 10}, {-3, 2, 11, 13}, {100, 103, 200, 204},
};

// What a colour becomes when stored in a format and read back, by channel presence only: a
// missing alpha reads 1, missing colour reads 0.
Rgba presentChannels(const Rgba& c, IxPixelFormat::Comps comps) {
    switch (comps) {
    case IxPixelFormat::ALPHA: return {0.0f, 0.0f, 0.0f, c.a};
    case IxPixelFormat::RGB: return {c.r, c.g, c.b, 1.0f};
    default: return c;
    }
}

void expectNear(const Rgba& got, const Rgba& want, float tolerance) {
    EXPECT_NEAR(got.r, want.r, tolerance);
    EXPECT_NEAR(got.g, want.g, tolerance);
    EXPECT_NEAR(got.b, want.b, tolerance);
    EXPECT_NEAR(got.a, want.a, tolerance);
}

TEST(IxTile, EveryPixelStartsWithTheFillColourInEveryFormat) {
    const Rgba fill{0.25f, 0.5f, 0.75f, 0.625f};
    for (const IxPixelFormat& format : IxTestFormats::all()) {
        for (const GeRectangle<int>& rect : rectangles) {
            IxTile tile(format, rect, fill);
            const IxReadGuard guard(tile);
            for (int y = rect.y0; y < rect.y1; ++y) {
                for (int x = rect.x0; x < rect.x1; ++x) {
                    expectNear(readPixel(guard, x, y), presentChannels(fill, format._comps),
                               IxTestFormats::tolerance(format._depth));
                }
            }
        }
    }
}

TEST(IxTile, FloatFillIsExactAndComplexHasZeroImaginaryParts) {
    IxTile rgba({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, {2, 5, 1, 3}, {0.1f, -2.0f, 3.5f, 0.7f});
    const IxReadGuard r(rgba);
    float pixel[4];
    std::memcpy(pixel, r.getPixelAddress(4, 2), sizeof pixel);
    EXPECT_EQ(pixel[0], 0.1f);
    EXPECT_EQ(pixel[1], -2.0f);
    EXPECT_EQ(pixel[2], 3.5f);
    EXPECT_EQ(pixel[3], 0.7f);

    IxTile complex({IxPixelFormat::RGB, IxPixelFormat::COMPLEX}, {0, 2, 0, 1}, {0.1f, -2.0f, 3.5f, 0.7f});
    const IxReadGuard c(complex);
    float pairs[6];
    std::memcpy(pairs, c.getPixelAddress(1, 0), sizeof pairs);
    EXPECT_EQ(pairs[0], 0.1f);
    EXPECT_EQ(pairs[1], 0.0f);
    EXPECT_EQ(pairs[2], -2.0f);
    EXPECT_EQ(pairs[3], 0.0f);
    EXPECT_EQ(pairs[4], 3.5f);
    EXPECT_EQ(pairs[5], 0.0f);
}

TEST(IxGuards, BasePointerAddressesPixelZeroZeroNotTheCorner) {
    for (const IxPixelFormat& format : IxTestFormats::all()) {
        for (const GeRectangle<int>& rect : rectangles) {
            IxTile tile(format, rect, {0, 0, 0, 0});
            const IxWriteGuard writer(tile);
            const IxReadGuard reader(tile);
            const int bpp = format.getBytesPerPixel();
            const unsigned char* first = tile.getStorage()->getPixels();

            EXPECT_EQ(writer._rowStride, rect.getWidth() * bpp);
            EXPECT_EQ(reader._rowStride, writer._rowStride);
            EXPECT_EQ(reader._basePointer, writer._basePointer);
            // The corner pixel by the rule base + y * stride + x * bpp is the block's first byte.
            EXPECT_EQ(writer._basePointer + rect.y0 * writer._rowStride + rect.x0 * bpp, first);
            EXPECT_EQ(writer._basePointer == first, rect.x0 == 0 && rect.y0 == 0);
            // The last pixel ends the block: rows are contiguous and unpadded.
            EXPECT_EQ(writer.getPixelAddress(rect.x1 - 1, rect.y1 - 1) + bpp,
                      first + tile.getStorage()->getByteSize());
        }
    }
}

TEST(IxGuards, EachPixelWrittenByAddressReadsBackAtTheSameCoordinates) {
    for (const GeRectangle<int>& rect : rectangles) {
        IxTile tile({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, rect, {0, 0, 0, 0});
        const IxWriteGuard writer(tile);
        for (int y = rect.y0; y < rect.y1; ++y) {
            for (int x = rect.x0; x < rect.x1; ++x) {
                const float value[4] = {float(x), float(y), float(x * y), 1.0f};
                std::memcpy(writer._basePointer + y * writer._rowStride + x * 16, value, sizeof value);
            }
        }
        const IxReadGuard reader(tile);
        for (int y = rect.y0; y < rect.y1; ++y) {
            for (int x = rect.x0; x < rect.x1; ++x) {
                EXPECT_EQ(readPixel(reader, x, y), (Rgba{float(x), float(y), float(x * y), 1.0f}));
            }
        }
    }
}

TEST(IxGuards, AnEmptyGuardIsToldFromAFullOneByItsTileHandle) {
    const IxReadGuard emptyRead;
    const IxWriteGuard emptyWrite;
    EXPECT_FALSE(emptyRead.holdsTile());
    EXPECT_EQ(emptyRead._tileHandle, nullptr);
    EXPECT_EQ(emptyRead._basePointer, nullptr);
    EXPECT_TRUE(emptyRead._rectangle.isEmpty());
    EXPECT_FALSE(emptyWrite.holdsTile());
    EXPECT_EQ(emptyWrite._tileHandle, nullptr);
    EXPECT_FALSE(IxReadGuard(emptyWrite).holdsTile());

    // Even a tile at the origin with no pixels gives a guard with a handle.
    for (const GeRectangle<int>& rect : {GeRectangle<int>{0, 1, 0, 1}, GeRectangle<int>{0, 0, 0, 0},
                                         GeRectangle<int>{5, 2, 3, 1}}) {
        IxTile tile({IxPixelFormat::ALPHA, IxPixelFormat::UINT8}, rect, {0, 0, 0, 0});
        const IxReadGuard full(tile);
        EXPECT_TRUE(full.holdsTile());
        EXPECT_EQ(full._tileHandle, tile.getStorage().get());
        EXPECT_EQ(full._rectangle, rect);
    }
}

TEST(IxGuards, AReadGuardFromAWriteGuardReadsWhatIsWrittenThroughIt) {
    for (const IxPixelFormat& format : IxTestFormats::all()) {
        IxTile tile(format, {-2, 3, 4, 6}, {0, 0, 0, 0});
        const IxWriteGuard writer(tile);
        const IxReadGuard reader(writer);  // taken before the writes; both live at once
        EXPECT_EQ(reader._tileHandle, writer._tileHandle);
        EXPECT_EQ(reader._pixelFormat, writer._pixelFormat);
        EXPECT_EQ(reader._rectangle, writer._rectangle);
        const IxRowCodec::Writer write = IxRowCodec::selectWriter(format);
        for (int y = 4; y < 6; ++y) {
            for (int x = -2; x < 3; ++x) {
                const Rgba colour{0.125f * (x + 2), 0.5f, 0.25f * (y - 4), 0.75f};
                write(writer.getPixelAddress(x, y), &colour, 1);
            }
        }
        for (int y = 4; y < 6; ++y) {
            for (int x = -2; x < 3; ++x) {
                const Rgba colour{0.125f * (x + 2), 0.5f, 0.25f * (y - 4), 0.75f};
                expectNear(readPixel(reader, x, y), presentChannels(colour, format._comps),
                           IxTestFormats::tolerance(format._depth));
            }
        }
    }
}

TEST(IxGuards, GuardsShareOneHoldThatKeepsThePixelsAfterTheTileIsGone) {
    auto tile = std::make_unique<IxTile>(IxPixelFormat(IxPixelFormat::RGBA, IxPixelFormat::FLOAT32),
                                         GeRectangle<int>{10, 14, 20, 23}, Rgba{1, 2, 3, 4});
    const RCShdPtr<IxTileStorage> storage = tile->getStorage();
    EXPECT_EQ(storage->getMemoryLockCount(), 0);

    IxWriteGuard writer(*tile);
    EXPECT_EQ(storage->getMemoryLockCount(), 1);
    {
        const IxWriteGuard copy = writer;  // a copy shares the hold
        const IxReadGuard reader(writer);  // so does a read guard made from it
        EXPECT_EQ(storage->getMemoryLockCount(), 1);
        const IxReadGuard separate(*tile);  // a guard of its own is another hold
        EXPECT_EQ(storage->getMemoryLockCount(), 2);
    }
    EXPECT_EQ(storage->getMemoryLockCount(), 1);

    tile.reset();
    IxReadGuard reader(writer);
    // Every pixel is still there; the sanitizer would catch a use of freed memory.
    for (int y = 20; y < 23; ++y) {
        for (int x = 10; x < 14; ++x) {
            EXPECT_EQ(readPixel(reader, x, y), (Rgba{1, 2, 3, 4}));
            const Rgba colour{float(x), float(y), 0, 1};
            IxRowCodec::selectWriter(writer._pixelFormat)(writer.getPixelAddress(x, y), &colour, 1);
            EXPECT_EQ(readPixel(reader, x, y), colour);
        }
    }

    // Reassigning a guard drops its hold on the old tile.
    IxTile other({IxPixelFormat::RGB, IxPixelFormat::UINT8}, {0, 1, 0, 1}, {0, 0, 0, 0});
    writer = IxWriteGuard(other);
    reader = IxReadGuard();
    EXPECT_EQ(storage->getMemoryLockCount(), 0);
    EXPECT_EQ(writer._tileHandle, other.getStorage().get());
    EXPECT_EQ(other.getStorage()->getMemoryLockCount(), 1);
}

TEST(IxTile, ATileWithoutPixelsHasAZeroStride) {
    for (const GeRectangle<int>& rect : {GeRectangle<int>{3, 3, 0, 5}, GeRectangle<int>{0, 4, 2, 2},
                                         GeRectangle<int>{4, 1, 6, 2}}) {
        IxTile tile({IxPixelFormat::RGBA, IxPixelFormat::FLOAT16}, rect, {1, 1, 1, 1});
        EXPECT_EQ(tile.getStorage()->getByteSize(), 0u);
        EXPECT_EQ(tile.getRectangle(), rect);
        EXPECT_EQ(tile.getRowStride(), rect.x1 > rect.x0 ? rect.getWidth() * 8 : 0);
    }
}

}  // namespace
}  // namespace Zr
