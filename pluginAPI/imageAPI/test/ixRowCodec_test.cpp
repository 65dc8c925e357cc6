// Row writers: the memory layout of each format. (Readers are checked through tiles.)
#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <vector>

#include "exBase.h"
#include "ixPixelConvert.h"
#include "ixTestFormats.h"

namespace Zr {
namespace {

// The bytes of one channel of the depth holding v.
void appendChannel(std::vector<unsigned char>& out, IxPixelFormat::Depth depth, float v) {
    auto append = [&out](const auto& value) {
        const auto* bytes = reinterpret_cast<const unsigned char*>(&value);
        out.insert(out.end(), bytes, bytes + sizeof value);
    };
    if (depth == IxPixelFormat::UINT8) append(IxPixelConvert::floatToByte(v));
    if (depth == IxPixelFormat::FLOAT16) append(IxPixelConvert::floatToHalf(v));
    if (depth == IxPixelFormat::FLOAT32) append(v);
    if (depth == IxPixelFormat::COMPLEX) append(std::array<float, 2>{v, 0.0f});
}

TEST(IxRowCodec, WritersStoreThePresentChannelsInOrderWithoutPadding) {
    const Rgba row[3] = {{0.0f, 0.25f, 0.5f, 1.0f}, {1.0f, 0.75f, 0.125f, 0.5f}, {0.375f, 0.0f, 1.0f, 0.0f}};
    for (const IxPixelFormat& format : IxTestFormats::all()) {
        std::vector<unsigned char> expected;
        for (const Rgba& c : row) {
            if (format._comps != IxPixelFormat::ALPHA)
                for (float v : {c.r, c.g, c.b}) appendChannel(expected, format._depth, v);
            if (format._comps != IxPixelFormat::RGB) appendChannel(expected, format._depth, c.a);
        }
        std::vector<unsigned char> memory(expected.size() + 1, 0xa5);  // one byte past the row
        IxRowCodec::selectWriter(format)(memory.data(), row, 3);
        EXPECT_EQ(std::vector<unsigned char>(memory.begin(), memory.end() - 1), expected)
            << format._comps << " " << format._depth;
        EXPECT_EQ(memory.back(), 0xa5);
    }
}

TEST(IxRowCodec, UnknownChannelCountsAndDepthsAbort) {
    IxPixelFormat badComps, badDepth;
    badComps._comps = static_cast<IxPixelFormat::Comps>(2);
    badDepth._depth = static_cast<IxPixelFormat::Depth>(12);
    for (const IxPixelFormat& bad : {badComps, badDepth}) {
        EXPECT_THROW(IxRowCodec::selectReader(bad), ExProgramAborted);
        EXPECT_THROW(IxRowCodec::selectWriter(bad), ExProgramAborted);
    }
}

}  // namespace
}  // namespace Zr
