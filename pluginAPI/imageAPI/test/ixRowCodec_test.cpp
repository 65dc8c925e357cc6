// Row readers and writers for every pixel format, checked channel by channel against the scalar
// conversions of IxPixelConvert: what each reads and writes, where in memory, and nothing beyond.
#include <gtest/gtest.h>

#include <bit>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "exBase.h"
#include "ixPixelConvert.h"
#include "ixTestFormats.h"

namespace Zr {
namespace {

using Depth = IxPixelFormat::Depth;

// The colour channel (0 r, 1 g, 2 b, 3 a) that channel c of a pixel of comps channels holds.
int rgbaIndex(int comps, int c) { return comps == IxPixelFormat::ALPHA ? 3 : c; }
float& channelOf(Rgba& colour, int i) { return i == 0 ? colour.r : i == 1 ? colour.g : i == 2 ? colour.b : colour.a; }
float channelOf(const Rgba& colour, int i) { return channelOf(const_cast<Rgba&>(colour), i); }

// The channel at p as a reader gives it: a COMPLEX channel by its real part.
float channelValue(Depth depth, const unsigned char* p) {
    if (depth == IxPixelFormat::UINT8) return IxPixelConvert::byteToFloat(*p);
    if (depth == IxPixelFormat::FLOAT16) {
        std::uint16_t h;
        std::memcpy(&h, p, sizeof h);
        return IxPixelConvert::halfToFloat(h);
    }
    float f;
    std::memcpy(&f, p, sizeof f);
    return f;
}

// The bytes that a replacing writer leaves for v.
void storeChannel(Depth depth, unsigned char* p, float v) {
    if (depth == IxPixelFormat::UINT8) *p = IxPixelConvert::floatToByte(v);
    if (depth == IxPixelFormat::FLOAT16) {
        const std::uint16_t h = IxPixelConvert::floatToHalf(v);
        std::memcpy(p, &h, sizeof h);
    }
    if (depth == IxPixelFormat::FLOAT32) std::memcpy(p, &v, sizeof v);
    if (depth == IxPixelFormat::COMPLEX) {
        const float pair[2] = {v, 0.0f};
        std::memcpy(p, pair, sizeof pair);
    }
}

// The bytes that an adding writer leaves after adding v: bytes and halves round v first, bytes
// saturate, a COMPLEX channel keeps its imaginary part.
void addChannel(Depth depth, unsigned char* p, float v) {
    if (depth == IxPixelFormat::UINT8) {
        const unsigned sum = unsigned{*p} + IxPixelConvert::floatToByte(v);
        *p = static_cast<unsigned char>(sum > 255 ? 255 : sum);
    } else if (depth == IxPixelFormat::FLOAT16) {
        storeChannel(depth, p, channelValue(depth, p) + IxPixelConvert::halfToFloat(IxPixelConvert::floatToHalf(v)));
    } else {
        const float sum = channelValue(depth, p) + v;
        std::memcpy(p, &sum, sizeof sum);
    }
}

// Pixels of arbitrary bits. With finite, a float channel that would be a NaN gets a finite
// exponent, so that sums compare bit for bit whatever the order of their operands.
std::vector<unsigned char> randomPixels(const IxPixelFormat& format, int count, std::mt19937& rng, bool finite) {
    std::vector<unsigned char> memory(std::size_t(count) * format.getBytesPerPixel());
    for (unsigned char& b : memory) b = static_cast<unsigned char>(rng());
    if (finite && format._depth >= IxPixelFormat::FLOAT32)
        for (std::size_t i = 0; i < memory.size(); i += 4) {
            std::uint32_t bits;
            std::memcpy(&bits, &memory[i], sizeof bits);
            if ((bits & 0x7f800000u) == 0x7f800000u) bits &= ~0x00800000u;  // exponent 255 becomes 254
            std::memcpy(&memory[i], &bits, sizeof bits);
        }
    return memory;
}

// Colours that exercise the conversions: in range, out of range both ways, tiny, huge, infinite.
std::vector<Rgba> awkwardColours(std::mt19937& rng, int count) {
    const float inf = std::numeric_limits<float>::infinity();
    const float specials[] = {0.0f, -0.0f, 1.0f, 0.5f, 1.0f / 255.0f, -3.0f, 2.5f, 1e-7f, 6e-5f,
                              65504.0f, 65520.0f, 1e9f, inf, -inf};
    std::uniform_real_distribution<float> any(-0.5f, 1.5f);
    std::uniform_int_distribution<int> pick(0, 2 * int(std::size(specials)));
    std::vector<Rgba> colours(static_cast<std::size_t>(count));
    for (Rgba& c : colours)
        for (int i = 0; i < 4; ++i) {
            const int k = pick(rng);
            channelOf(c, i) = k < int(std::size(specials)) ? specials[k] : any(rng);
        }
    return colours;
}

// A reader fills exactly its count of colours, all four floats of each, from the pixels at its
// pointer: each stored channel through the conversion of its depth, a missing alpha as 1, the
// colour of an alpha-only pixel as 0.
TEST(IxRowCodec, ReadersFillTheirCountFromAnyBits) {
    std::mt19937 rng(7);
    const Rgba sentinel(-7.0f, -7.0f, -7.0f, -7.0f);
    for (const IxPixelFormat& format : IxTestFormats::all()) {
        const int pixelBytes = format.getBytesPerPixel(), channelBytes = format.getBytesPerChannel();
        const std::vector<unsigned char> memory = randomPixels(format, 6, rng, false);
        std::vector<Rgba> row(9, sentinel);
        IxRowCodec::selectReader(format)(memory.data(), row.data() + 2, 6);
        for (int i = 0; i < 9; ++i) {
            Rgba expected = sentinel;
            if (i >= 2 && i < 8) {
                expected = Rgba(0.0f, 0.0f, 0.0f, 1.0f);
                for (int c = 0; c < format._comps; ++c)
                    channelOf(expected, rgbaIndex(format._comps, c)) =
                        channelValue(format._depth, &memory[std::size_t((i - 2) * pixelBytes + c * channelBytes)]);
            }
            for (int k = 0; k < 4; ++k)
                ASSERT_EQ(std::bit_cast<std::uint32_t>(channelOf(row[std::size_t(i)], k)),
                          std::bit_cast<std::uint32_t>(channelOf(expected, k)))
                    << "format " << format._comps << "x" << format._depth << " colour " << i << " channel " << k;
        }
    }
}

// A replacing writer stores the channels its format has (RGB drops alpha, ALPHA keeps alpha
// only), each converted, pixel after pixel with no padding, and touches no other byte.
TEST(IxRowCodec, WritersStoreThePresentChannelsInOrderAndNothingElse) {
    std::mt19937 rng(11);
    for (const IxPixelFormat& format : IxTestFormats::all()) {
        const int pixelBytes = format.getBytesPerPixel(), channelBytes = format.getBytesPerChannel();
        const std::vector<Rgba> colours = awkwardColours(rng, 6);
        std::vector<unsigned char> memory = randomPixels(format, 8, rng, false);
        std::vector<unsigned char> expected = memory;
        for (int i = 0; i < 6; ++i)
            for (int c = 0; c < format._comps; ++c)
                storeChannel(format._depth, &expected[std::size_t((i + 1) * pixelBytes + c * channelBytes)],
                             channelOf(colours[std::size_t(i)], rgbaIndex(format._comps, c)));
        IxRowCodec::selectWriter(format)(memory.data() + pixelBytes, colours.data(), 6);
        EXPECT_EQ(memory, expected) << "format " << format._comps << "x" << format._depth;
    }
}

// An adding writer adds each channel that its format has, rounded per pass, and touches no other
// byte. A colour whose alpha is zero (+0 or -0, and no other value, however small, nor NaN) leaves
// its pixel alone, even where alpha is not stored.
TEST(IxRowCodec, AddingWritersAddPerPassAndSkipZeroAlpha) {
    std::mt19937 rng(13);
    const float alphas[] = {0.0f, -0.0f, 1e-30f, -1e-30f, 0.3f, 1.0f, 2.0f, -0.5f,
                            std::numeric_limits<float>::infinity(), std::numeric_limits<float>::quiet_NaN()};
    const int count = int(std::size(alphas));
    for (const IxPixelFormat& format : IxTestFormats::all()) {
        const int pixelBytes = format.getBytesPerPixel(), channelBytes = format.getBytesPerChannel();
        for (int pass = 0; pass < 3; ++pass) {
            std::vector<Rgba> colours = awkwardColours(rng, count);
            for (int i = 0; i < count; ++i) colours[std::size_t(i)].a = alphas[i];
            std::vector<unsigned char> memory = randomPixels(format, count + 2, rng, true);
            std::vector<unsigned char> expected = memory;
            for (int i = 0; i < count; ++i) {
                if (alphas[i] == 0.0f) continue;
                for (int c = 0; c < format._comps; ++c)
                    addChannel(format._depth, &expected[std::size_t((i + 1) * pixelBytes + c * channelBytes)],
                               channelOf(colours[std::size_t(i)], rgbaIndex(format._comps, c)));
            }
            IxRowCodec::selectAddingWriter(format)(memory.data() + pixelBytes, colours.data(), count);
            ASSERT_EQ(memory, expected) << "format " << format._comps << "x" << format._depth;
        }
    }
}

TEST(IxRowCodec, UnknownChannelCountsAndDepthsAbort) {
    IxPixelFormat badComps, badDepth;
    badComps._comps = static_cast<IxPixelFormat::Comps>(2);
    badDepth._depth = static_cast<IxPixelFormat::Depth>(12);
    for (const IxPixelFormat& bad : {badComps, badDepth}) {
        EXPECT_THROW(IxRowCodec::selectReader(bad), ExProgramAborted);
        EXPECT_THROW(IxRowCodec::selectWriter(bad), ExProgramAborted);
        EXPECT_THROW(IxRowCodec::selectAddingWriter(bad), ExProgramAborted);
    }
}

}  // namespace
}  // namespace Zr
