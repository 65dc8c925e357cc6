// Tiles and the public guards: filling, the addressing rule of the base pointer, empty guards,
// shared holds on the pixels.
#include <gtest/gtest.h>

#include <memory>

#include "ixReadGuard.h"
#include "ixTestFormats.h"
#include "ixWriteGuard.h"

namespace Zr {
namespace {

using IxTestFormats::expectNear;
using IxTestFormats::presentChannels;
using IxTestFormats::readPixel;

// Tiles at the origin, off it along one axis, along both, at negative coordinates.
const GeRectangle<int> rectangles[] = {
    {0, 4, 0, 3}, {5, 9, 0, 2}, {0, 3, 7, 10}, {-3, 2, 11, 13}, {100, 103, 200, 204},
};

TEST(IxTile, EveryPixelStartsWithTheFillColourInEveryFormat) {
    const Rgba fill{0.25f, 0.5f, 0.75f, 0.625f};
    for (const IxPixelFormat& format : IxTestFormats::all()) {
        for (const GeRectangle<int>& rect : rectangles) {
            IxTile tile(format, rect, fill);
            const IxReadGuard guard(tile);
            for (int y = rect.y0; y < rect.y1; ++y)
                for (int x = rect.x0; x < rect.x1; ++x)
                    expectNear(readPixel(guard, x, y), presentChannels(fill, format._comps), format._depth);
        }
    }
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
            EXPECT_EQ(reader._basePointer, writer._basePointer);
            EXPECT_EQ(writer._basePointer + rect.y0 * writer._rowStride + rect.x0 * bpp, first);
            EXPECT_EQ(writer._basePointer == first, rect.x0 == 0 && rect.y0 == 0);
            // Rows are contiguous and unpadded: the last pixel ends the block.
            EXPECT_EQ(writer.getPixelAddress(rect.x1 - 1, rect.y1 - 1) + bpp,
                      first + tile.getStorage()->getByteSize());
        }
    }
}

TEST(IxGuards, AnEmptyGuardIsToldFromAFullOneByItsTileHandle) {
    EXPECT_FALSE(IxReadGuard(IxWriteGuard()).holdsTile());
    // Even a tile with no pixels gives a guard with a handle.
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
    auto colourAt = [](int x, int y) { return Rgba{0.125f * (x + 2), 0.5f, 0.25f * (y - 4), 0.75f}; };
    for (const IxPixelFormat& format : IxTestFormats::all()) {
        IxTile tile(format, {-2, 3, 4, 6}, {0, 0, 0, 0});
        const IxWriteGuard writer(tile);
        const IxReadGuard reader(writer);  // taken before the writes; both live at once
        EXPECT_EQ(reader._tileHandle, writer._tileHandle);
        for (int y = 4; y < 6; ++y)
            for (int x = -2; x < 3; ++x) IxTestFormats::writePixel(writer, x, y, colourAt(x, y));
        for (int y = 4; y < 6; ++y)
            for (int x = -2; x < 3; ++x)
                expectNear(readPixel(reader, x, y), presentChannels(colourAt(x, y), format._comps),
                           format._depth);
    }
}

TEST(IxGuards, GuardsShareOneHoldThatKeepsThePixelsAfterTheTileIsGone) {
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
    // The sanitizer would catch a use of freed pixels here.
    IxTestFormats::writePixel(writer, 13, 22, {5, 6, 7, 8});
    EXPECT_EQ(readPixel(reader, 10, 20), (Rgba{1, 2, 3, 4}));
    EXPECT_EQ(readPixel(reader, 13, 22), (Rgba{5, 6, 7, 8}));

    // Reassigning the guards drops their hold on the old tile.
    IxTile other({IxPixelFormat::RGB, IxPixelFormat::UINT8}, {0, 1, 0, 1}, {0, 0, 0, 0});
    writer = IxWriteGuard(other);
    reader = IxReadGuard();
    EXPECT_EQ(storage->getMemoryLockCount(), 0);
    EXPECT_EQ(other.getStorage()->getMemoryLockCount(), 1);
}

}  // namespace
}  // namespace Zr
