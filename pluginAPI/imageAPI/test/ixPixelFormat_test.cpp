#include <gtest/gtest.h>

#include <string>

#include "exBase.h"
#include "ixPixelFormat.h"

namespace Zr {
namespace {

const char* const formatFile = ".\\pluginAPI/imageAPI/src/ixPixelFormat.inline";
const char* const compsText = "_comps == ALPHA || _comps == RGB || _comps == RGBA";
const char* const depthText =
    "_depth == UINT8 || _depth == FLOAT16 || _depth == FLOAT32 || _depth == COMPLEX";
const char* const ratioText = "aspectRatio.getFloat() is greater than 0.F";

// Constructs the format and returns the failure's message, file and line; empty if none.
struct Failure {
    std::string message;
    std::string file;
    int line = 0;
};

Failure construct(int comps, int depth, Rational ratio = Rational{1, 1}) {
    try {
        IxPixelFormat format(static_cast<IxPixelFormat::Comps>(comps),
                             static_cast<IxPixelFormat::Depth>(depth), ratio);
        static_cast<void>(format);
    } catch (const ExAssertionFailed& failure) {
        return {failure.getMessage(), failure.getFile(), failure.getLine()};
    }
    return {};
}

TEST(IxPixelFormat, KnownCombinationsConstructAndTheRawFormatIsOneByte) {
    for (int comps : {1, 3, 4}) {
        for (int depth : {8, 16, 32, 64}) {
            EXPECT_EQ(construct(comps, depth).message, "") << comps << " " << depth;
            EXPECT_EQ(IxPixelFormat(static_cast<IxPixelFormat::Comps>(comps),
                                    static_cast<IxPixelFormat::Depth>(depth))
                          .getBytesPerPixel(),
                      comps * depth / 8);
        }
    }
    const IxPixelFormat raw = IxPixelFormat::getRawMemoryFormat();
    EXPECT_EQ(raw, IxPixelFormat(IxPixelFormat::ALPHA, IxPixelFormat::UINT8, Rational{1, 1}, 0));
    EXPECT_EQ(raw.getBytesPerPixel(), 1);
}

TEST(IxPixelFormat, BadArgumentsFailWithTheirConditionAtTheFixedPosition) {
    struct Case {
        int comps;
        int depth;
        Rational ratio;
        const char* text;
    };
    const Case cases[] = {
        {0, 8, {1, 1}, compsText},     {2, 16, {1, 1}, compsText},   {5, 32, {1, 1}, compsText},
        {-1, 8, {1, 1}, compsText},    {1, 0, {1, 1}, depthText},    {3, 7, {1, 1}, depthText},
        {4, 24, {1, 1}, depthText},    {4, 128, {1, 1}, depthText},  {4, 32, {0, 1}, ratioText},
        {4, 32, {-1, 2}, ratioText},   {1, 8, {3, -4}, ratioText},   {3, 16, {0, 0}, ratioText},
        // The channel count is checked first, then the depth, then the ratio.
        {2, 7, {0, 1}, compsText},     {4, 7, {0, 1}, depthText},
    };
    for (const Case& c : cases) {
        const Failure failure = construct(c.comps, c.depth, c.ratio);
        EXPECT_EQ(failure.message, c.text) << c.comps << " " << c.depth;
        EXPECT_EQ(failure.file, formatFile);
        EXPECT_EQ(failure.line, 44);
    }
    // Any positive ratio is accepted, also a non-square one.
    EXPECT_EQ(construct(4, 32, {2, 1}).message, "");
    EXPECT_EQ(construct(4, 32, {1, 3}).message, "");
    EXPECT_EQ(construct(4, 32, {-2, -1}).message, "");
}

}  // namespace
}  // namespace Zr
