// Row readers and writers: the memory layout of each format and which channels take part.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <vector>

#include "exBase.h"
#include "ixPixelConvert.h"
#include "ixRowCodec.h"

namespace Zr {
namespace {

// Encodes one channel value as the bytes of a channel of the given depth.
void appendChannel(std::vector<unsigned char>& out, IxPixelFormat::Depth depth, float v) {
    auto append = [&out](const void* p, std::size_t n) {
        const auto* bytes = static_cast<const unsigned char*>(p);
        out.insert(out.end(), bytes, bytes + n);
    };
    switch (depth) {
    case IxPixelFormat::UINT8: {
        const std::uint8_t b = IxPixelConvert::floatToByte(v);
        append(&b, 1);
        break;
    }
    case IxPixelFormat::FLOAT16: {
        const std::uint16_t h = IxPixelConvert::floatToHalf(v);
        append(&h, 2);
        break;
    }
    case IxPixelFormat::FLOAT32: append(&v, 4); break;
    case IxPixelFormat::COMPLEX: {
        const float pair[2] = {v, 0.0f};
        append(pair, 8);
        break;
    }
    }
}

// The channels a format stores, in memory order.
std::vector<float> storedChannels(const Rgba& c, IxPixelFormat::Comps comps) {
    if (comps == IxPixelFormat::ALPHA) return {c.a};
    if (comps == IxPixelFormat::RGB) return {c.r, c.g, c.b};
    return {c.r, c.g, c.b, c.a};
}

const Rgba row[3] = {{0.0f, 0.25f, 0.5f, 1.0f}, {1.0f, 0.75f, 0.125f, 0.5f}, {0.375f, 0.0f, 1.0f, 0.0f}};

const IxPixelFormat::Depth depths[] = {IxPixelFormat::UINT8, IxPixelFormat::FLOAT16,
                                       IxPixelFormat::FLOAT32, IxPixelFormat::COMPLEX};
const IxPixelFormat::Comps compsList[] = {IxPixelFormat::ALPHA, IxPixelFormat::RGB, IxPixelFormat::RGBA};

TEST(IxRowCodec, WritersStoreThePresentChannelsInOrderWithoutPadding) {
    for (auto depth : depths) {
        for (auto comps : compsList) {
            const IxPixelFormat format(comps, depth);
            std::vector<unsigned char> expected;
            for (const Rgba& c : row) {
                for (float v : storedChannels(c, comps)) appendChannel(expected, depth, v);
            }
            // One guard byte past the row must stay untouched.
            std::vector<unsigned char> memory(expected.size() + 1, 0xa5);
            IxRowCodec::selectWriter(format)(memory.data(), row, 3);
            EXPECT_EQ(std::vector<unsigned char>(memory.begin(), memory.end() - 1), expected)
                << comps << " " << depth;
            EXPECT_EQ(memory.back(), 0xa5);
        }
    }
}

TEST(IxRowCodec, ReadersFillAllFourChannelsWithDefaultsForMissingOnes) {
    for (auto depth : depths) {
        for (auto comps : compsList) {
            const IxPixelFormat format(comps, depth);
            std::vector<unsigned char> memory;
            for (const Rgba& c : row) {
                for (float v : storedChannels(c, comps)) appendChannel(memory, depth, v);
            }
            Rgba got[3];
            IxRowCodec::selectReader(format)(memory.data(), got, 3);
            const float tolerance = depth == IxPixelFormat::UINT8 ? 0.5f / 255.0f + 1e-6f : 0.0f;
            for (int i = 0; i < 3; ++i) {
                const bool colour = comps != IxPixelFormat::ALPHA;
                EXPECT_NEAR(got[i].r, colour ? row[i].r : 0.0f, tolerance);
                EXPECT_NEAR(got[i].g, colour ? row[i].g : 0.0f, tolerance);
                EXPECT_NEAR(got[i].b, colour ? row[i].b : 0.0f, tolerance);
                EXPECT_NEAR(got[i].a, comps == IxPixelFormat::RGB ? 1.0f : row[i].a, tolerance);
            }
        }
    }
}

TEST(IxRowCodec, UnknownChannelCountsAndDepthsAbort) {
    IxPixelFormat badComps(IxPixelFormat::RGBA, IxPixelFormat::UINT8);
    badComps._comps = static_cast<IxPixelFormat::Comps>(2);
    IxPixelFormat badDepth(IxPixelFormat::RGBA, IxPixelFormat::UINT8);
    badDepth._depth = static_cast<IxPixelFormat::Depth>(12);
    for (const IxPixelFormat& bad : {badComps, badDepth}) {
        EXPECT_THROW(IxRowCodec::selectReader(bad), ExProgramAborted);
        EXPECT_THROW(IxRowCodec::selectWriter(bad), ExProgramAborted);
    }
}

}  // namespace
}  // namespace Zr
