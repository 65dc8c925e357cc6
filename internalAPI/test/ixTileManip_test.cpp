// The unchecked guards as the library stores them: members that are assigned, copied and dropped.
#include <gtest/gtest.h>

#include <cstring>
#include <memory>

#include "ixTileManip.h"
#include "pxImageTexture.h"

namespace Zr {
namespace {

using ReadGuardNoCheck = IxTileManip::ReadGuardNoCheck;
using WriteGuardNoCheck = IxTileManip::WriteGuardNoCheck;

int locks(const IxTile& tile) { return tile.getStorage()->getMemoryLockCount(); }

// A holder of guards such as the renderer's buffers: an output and a background.
class GuardHolder : public IxTileManip {
public:
    WriteGuardNoCheck _output;
    ReadGuardNoCheck _background;
};

TEST(IxTileManip, DefaultGuardsAreEmpty) {
    const GuardHolder holder;
    EXPECT_FALSE(holder._output.holdsTile());
    EXPECT_EQ(holder._output._tileHandle, nullptr);
    EXPECT_EQ(holder._output._basePointer, nullptr);
    EXPECT_FALSE(holder._background.holdsTile());
    EXPECT_EQ(holder._background._tileHandle, nullptr);
}

TEST(IxTileManip, AWriteGuardOnAConstTileWritesItsPixels) {
    const IxTile tile({IxPixelFormat::RGBA, IxPixelFormat::FLOAT32}, {3, 5, 7, 8}, {0, 0, 0, 0});
    const WriteGuardNoCheck writer(tile);
    const float value[4] = {1, 2, 3, 4};
    std::memcpy(writer.getPixelAddress(4, 7), value, sizeof value);

    const ReadGuardNoCheck reader(tile);
    float got[4];
    std::memcpy(got, reader.getPixelAddress(4, 7), sizeof got);
    EXPECT_EQ(std::memcmp(got, value, sizeof got), 0);
    EXPECT_EQ(writer._basePointer, reader._basePointer);
    EXPECT_EQ(writer._basePointer + 7 * writer._rowStride + 3 * 16, tile.getStorage()->getPixels());
}

TEST(IxTileManip, CopiesAndAssignmentsShareAndMoveTheHold) {
    auto first = std::make_unique<IxTile>(IxPixelFormat(IxPixelFormat::RGB, IxPixelFormat::UINT8),
                                          GeRectangle<int>{0, 2, 0, 2}, Rgba{1, 0, 0, 1});
    const IxTile second({IxPixelFormat::ALPHA, IxPixelFormat::FLOAT16}, {1, 3, 1, 3}, {0, 0, 0, 1});
    const RCShdPtr<IxTileStorage> firstPixels = first->getStorage();

    GuardHolder holder;
    holder._output = WriteGuardNoCheck(*first);
    holder._background = ReadGuardNoCheck(*first);
    EXPECT_EQ(locks(*first), 2);

    {
        const WriteGuardNoCheck copy(holder._output);
        GuardHolder other = holder;  // copies of both members share their holds
        EXPECT_EQ(locks(*first), 2);
        EXPECT_EQ(other._output._tileHandle, holder._output._tileHandle);
    }
    EXPECT_EQ(locks(*first), 2);

    holder._output = holder._output;  // self-assignment keeps the hold
    EXPECT_EQ(locks(*first), 2);
    EXPECT_TRUE(holder._output.holdsTile());

    // The tile object may go; the guards still hold its pixels.
    first.reset();
    EXPECT_EQ(firstPixels->getMemoryLockCount(), 2);
    EXPECT_EQ(holder._output._basePointer[0], 255);

    holder._output = WriteGuardNoCheck(second);
    EXPECT_EQ(firstPixels->getMemoryLockCount(), 1);
    EXPECT_EQ(locks(second), 1);
    EXPECT_EQ(holder._output._pixelFormat, second.getPixelFormat());
    EXPECT_EQ(holder._output._rectangle, second.getRectangle());

    holder._background = ReadGuardNoCheck();
    EXPECT_EQ(firstPixels->getMemoryLockCount(), 0);
}

TEST(IxTileManip, GuardsFromPublicGuardsShareTheirHold) {
    IxTile tile({IxPixelFormat::RGBA, IxPixelFormat::UINT8}, {0, 1, 0, 1}, {0, 0, 0, 0});
    const IxWriteGuard output(tile);
    const IxReadGuard background(tile);
    EXPECT_EQ(locks(tile), 2);

    GuardHolder holder;
    holder._output = output;
    holder._background = ReadGuardNoCheck(background);
    EXPECT_EQ(locks(tile), 2);
    EXPECT_EQ(holder._output._basePointer, output._basePointer);

    const ReadGuardNoCheck fromWriter(output);
    EXPECT_EQ(fromWriter._tileHandle, output._tileHandle);
    EXPECT_EQ(locks(tile), 2);
}

TEST(PxImageTexture, CacheBlocksAreAFewKilopixels) {
    const int x = PxImageTexture::getAvgCacheBlockingSizeX();
    const int y = PxImageTexture::getAvgCacheBlockingSizeY();
    EXPECT_GE(x, 8);
    EXPECT_GE(y, 8);
    EXPECT_LE(x * y, 1 << 16);
}

}  // namespace
}  // namespace Zr
