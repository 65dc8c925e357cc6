// The unchecked guards as the library stores them: members that are assigned, copied and dropped.
#include <gtest/gtest.h>

#include <memory>

#include "ixTileManip.h"

namespace Zr {
namespace {

using ReadGuardNoCheck = IxTileManip::ReadGuardNoCheck;
using WriteGuardNoCheck = IxTileManip::WriteGuardNoCheck;

// A holder of guards such as the renderer's buffers: an output and a background.
class GuardHolder : public IxTileManip {
public:
    WriteGuardNoCheck _output;
    ReadGuardNoCheck _background;
};

TEST(IxTileManip, GuardsWriteEvenAConstTile) {
    GuardHolder holder;
    const IxTile tile({IxPixelFormat::RGB, IxPixelFormat::UINT8}, {3, 5, 7, 8}, {0, 0, 0, 0});
    holder._output = WriteGuardNoCheck(tile);
    holder._background = ReadGuardNoCheck(tile);
    holder._output.getPixelAddress(4, 7)[2] = 200;
    EXPECT_EQ(holder._background.getPixelAddress(4, 7)[2], 200);
    EXPECT_EQ(tile.getStorage()->getPixels()[3 + 2], 200);  // second pixel, blue
}

TEST(IxTileManip, CopiesAndAssignmentsShareAndMoveTheHold) {
    auto first = std::make_unique<IxTile>(IxPixelFormat(IxPixelFormat::RGB, IxPixelFormat::UINT8),
                                          GeRectangle<int>{0, 2, 0, 2}, Rgba{1, 0, 0, 1});
    const IxTile second({IxPixelFormat::ALPHA, IxPixelFormat::FLOAT16}, {1, 3, 1, 3}, {0, 0, 0, 1});
    const RCShdPtr<IxTileStorage> pixels = first->getStorage();

    GuardHolder holder;
    holder._output = WriteGuardNoCheck(*first);
    holder._background = ReadGuardNoCheck(IxReadGuard(*first));  // from a caller's guard
    {
        const GuardHolder copy = holder;  // copies share their holds
        EXPECT_EQ(copy._output._tileHandle, pixels.get());
        EXPECT_EQ(pixels->getMemoryLockCount(), 2);
    }
    holder._output = holder._output;
    EXPECT_EQ(pixels->getMemoryLockCount(), 2);

    first.reset();  // the guards still hold the pixels
    EXPECT_EQ(holder._output._basePointer[0], 255);

    holder._output = WriteGuardNoCheck(second);
    EXPECT_EQ(pixels->getMemoryLockCount(), 1);
    EXPECT_EQ(holder._output._pixelFormat, second.getPixelFormat());
    EXPECT_EQ(holder._output._rectangle, second.getRectangle());
    holder._background = ReadGuardNoCheck();
    EXPECT_EQ(pixels->getMemoryLockCount(), 0);
}

}  // namespace
}  // namespace Zr
