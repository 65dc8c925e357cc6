// The row readers and writers of the image creators, for each of the nine pixel formats, checked
// channel by channel against the scalar conversions; their selection and its failures; and the
// relative float tolerance that gates weights, opaque alphas and additions.
#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>
#include <random>
#include <vector>

#include "exBase.h"
#include "rsImageCreatorTestSupport.h"
#include "rsImageCreatorUtil.h"
#include "rsTolerance.h"

namespace Zr {
namespace {

using namespace RsImageTest;
using Util = RsImageCreatorUtil;

Util::RowReader readerOf(const Format& f) {
    Util::RowFunctions table;
    Util::selectRowReader(table, f.comps, f.depth);
    return table._reader;
}

Util::RowWriter writerOf(const Format& f, bool accumulate) {
    Util::RowFunctions table;
    Util::selectRowWriter(table, f.comps, f.depth, accumulate);
    return table._writer;
}

// Colours that exercise the conversions: in range, out of range both ways, tiny, huge, infinite.
std::vector<Rgba> awkwardColours(std::mt19937& rng, int count) {
    const float specials[] = {0.0f, -0.0f, 1.0f, 0.5f, 1.0f / 255.0f, -3.0f, 2.5f, 1e-7f, 6e-5f,
                              65504.0f, 65520.0f, 1e9f, std::numeric_limits<float>::infinity(),
                              -std::numeric_limits<float>::infinity()};
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

// A reader fills exactly the colours of its range, all four floats of each, from the pixels that
// start at its pointer: each stored channel through the conversion of its depth, a missing alpha
// as 1, the colour of an alpha-only pixel as 0. The raw channels hold arbitrary bits.
TEST(RsImageCreatorUtil, ReadersFillTheirRangeFromEachFormat) {
    std::mt19937 rng(7);
    const Rgba sentinel(-7.0f, -7.0f, -7.0f, -7.0f);
    for (const Format& f : allFormats()) {
        const IxWriteGuard tile = makeTile(f, {-4, 6, 2, 5});  // not at the origin
        fillRandomBits(tile, rng);
        std::vector<Rgba> row(9, sentinel);
        // Pixels x = -2 .. 3 of row 3 into row[2] .. row[7].
        readerOf(f)(row.data() + 2, row.data() + 8, tile.getPixelAddress(-2, 3));
        for (int i = 0; i < 9; ++i) {
            const Rgba& got = row[std::size_t(i)];
            if (i < 2 || i >= 8) {
                EXPECT_EQ(got, sentinel) << "outside the range, format " << f.comps << "x" << f.depth;
                continue;
            }
            Rgba expected(0.0f, 0.0f, 0.0f, 1.0f);
            for (int c = 0; c < f.comps; ++c)
                channelOf(expected, rgbaIndexOf(f.comps, c)) = bitsToFloat(f.depth, rawChannel(tile, i - 4, 3, c));
            for (int k = 0; k < 4; ++k)
                EXPECT_EQ(std::bit_cast<std::uint32_t>(channelOf(got, k)),
                          std::bit_cast<std::uint32_t>(channelOf(expected, k)))
                    << "format " << f.comps << "x" << f.depth << " pixel " << i << " channel " << k;
        }
    }
}

// A replacing writer stores the channels its format has (RGB drops alpha, ALPHA keeps alpha
// only), each converted, pixel after pixel with no padding, and touches no other byte.
TEST(RsImageCreatorUtil, ReplacingWritersStoreTheFormatsChannelsOnly) {
    std::mt19937 rng(11);
    for (const Format& f : allFormats()) {
        const IxWriteGuard tile = makeTile(f, {3, 12, -2, 2});
        fillRandomBits(tile, rng);
        const std::vector<unsigned char> before = snapshot(tile);
        const std::vector<Rgba> colours = awkwardColours(rng, 6);
        // Pixels x = 5 .. 10 of row 0.
        writerOf(f, false)(colours.data(), colours.data() + colours.size(), tile.getPixelAddress(5, 0));

        for (int y = -2; y < 2; ++y)
            for (int x = 3; x < 12; ++x)
                for (int c = 0; c < f.comps; ++c) {
                    const bool written = y == 0 && x >= 5 && x < 11;
                    std::uint32_t expected;
                    if (written) {
                        expected = floatToBits(f.depth, channelOf(colours[std::size_t(x - 5)], rgbaIndexOf(f.comps, c)));
                    } else {
                        const std::size_t offset = std::size_t(y + 2) * tile._rowStride +
                                                   std::size_t(x - 3) * f.comps * (f.depth / 8) + c * (f.depth / 8);
                        expected = 0;
                        std::memcpy(&expected, before.data() + offset, std::size_t(f.depth / 8));
                    }
                    ASSERT_EQ(rawChannel(tile, x, y, c), expected)
                        << "format " << f.comps << "x" << f.depth << " at " << x << "," << y << " channel " << c;
                }
        // The same writer comes straight from the replacing selector.
        EXPECT_EQ(Util::getReplacingRowWriter(f.comps, f.depth), writerOf(f, false));
        EXPECT_NE(writerOf(f, true), writerOf(f, false));
    }
}

// An adding writer adds each channel that its format has: floats without clamp, halves in float
// of the rounded half, bytes as the rounded byte with saturation. A colour whose alpha is zero
// (+0 or -0, and no other value, however small) leaves its pixel alone, even where alpha is not
// stored.
TEST(RsImageCreatorUtil, AddingWritersAddPerPassAndSkipZeroAlpha) {
    std::mt19937 rng(13);
    const float alphas[] = {0.0f, -0.0f, 1e-30f, -1e-30f, 0.3f, 1.0f, 2.0f, -0.5f,
                            std::numeric_limits<float>::infinity()};
    for (const Format& f : allFormats()) {
        for (int pass = 0; pass < 3; ++pass) {
            const IxWriteGuard tile = makeTile(f, {-1, 10, 4, 5});
            fillRandomValues(tile, rng, -1.0f, 2.0f);
            std::vector<Rgba> colours = awkwardColours(rng, int(std::size(alphas)));
            for (std::size_t i = 0; i < colours.size(); ++i) colours[i].a = alphas[i];
            std::vector<std::uint32_t> before;
            for (int x = -1; x < 10; ++x)
                for (int c = 0; c < f.comps; ++c) before.push_back(rawChannel(tile, x, 4, c));

            writerOf(f, true)(colours.data(), colours.data() + colours.size(), tile.getPixelAddress(0, 4));
            for (int x = -1; x < 10; ++x)
                for (int c = 0; c < f.comps; ++c) {
                    const std::uint32_t old = before[std::size_t((x + 1) * f.comps + c)];
                    std::uint32_t expected = old;
                    if (x >= 0 && x < int(colours.size()) && colours[std::size_t(x)].a != 0.0f)
                        expected = addToBits(f.depth, old, channelOf(colours[std::size_t(x)], rgbaIndexOf(f.comps, c)));
                    ASSERT_EQ(rawChannel(tile, x, 4, c), expected)
                        << "format " << f.comps << "x" << f.depth << " pixel " << x << " channel " << c;
                }
        }
    }
}

// Bytes round each pass on its own: ten passes of a value below half a step add nothing, where
// their sum in one pass would; and a pass that overflows saturates before the next is added.
TEST(RsImageCreatorUtil, ByteAdditionRoundsAndSaturatesEachPass) {
    const Format f{4, 8};
    const IxWriteGuard tile = makeTile(f, {0, 2, 0, 1});
    const Rgba small(0.0019f, 0.0019f, 0.0019f, 0.0019f);
    const Rgba big(0.9f, 0.9f, 0.9f, 0.9f);
    const Rgba pair[] = {small, big};
    for (int pass = 0; pass < 10; ++pass) writerOf(f, true)(pair, pair + 1, tile.getPixelAddress(0, 0));
    EXPECT_EQ(rawChannel(tile, 0, 0, 0), 0u);
    const Rgba tenfold = small * 10.0f;
    writerOf(f, true)(&tenfold, &tenfold + 1, tile.getPixelAddress(0, 0));
    EXPECT_EQ(rawChannel(tile, 0, 0, 0), 5u);
    for (int pass = 0; pass < 2; ++pass) writerOf(f, true)(pair + 1, pair + 2, tile.getPixelAddress(1, 0));
    EXPECT_EQ(rawChannel(tile, 1, 0, 3), 255u);
}

// No writer ever stores a half infinity or NaN, however large or infinite the colour or the sum.
TEST(RsImageCreatorUtil, HalfOutputsNeverHoldInfinity) {
    std::mt19937 rng(17);
    for (const Format& f : allFormats()) {
        if (f.depth != 16) continue;
        for (bool accumulate : {false, true}) {
            const IxWriteGuard tile = makeTile(f, {0, 40, 0, 1});
            fillRandomValues(tile, rng, 60000.0f, 65504.0f);
            std::vector<Rgba> colours = awkwardColours(rng, 40);
            for (Rgba& c : colours) c = c * 1e6f;
            writerOf(f, accumulate)(colours.data(), colours.data() + colours.size(), tile.getPixelAddress(0, 0));
            for (int x = 0; x < 40; ++x)
                for (int c = 0; c < f.comps; ++c) ASSERT_NE(rawChannel(tile, x, 0, c) & 0x7c00u, 0x7c00u);
        }
    }
}

// Writers abort for a channel count outside 1, 3, 4 or a depth outside 8, 16, 32, in both
// families and from the replacing selector. The reader aborts for a bad channel count at a known
// depth, while an unknown depth leaves the table's reader as it was.
TEST(RsImageCreatorUtil, SelectorsAbortOnUnknownFormats) {
    const int goodComps[] = {1, 3, 4}, badComps[] = {0, 2, 5};
    const int goodDepths[] = {8, 16, 32}, badDepths[] = {0, 7, 64};
    const Util::RowReader marker = readerOf({4, 32});
    for (bool accumulate : {false, true}) {
        for (int d : goodDepths)
            for (int c : badComps) {
                Util::RowFunctions table;
                EXPECT_THROW(Util::selectRowWriter(table, c, d, accumulate), ExProgramAborted);
                EXPECT_EQ(table._writer, nullptr);
                EXPECT_THROW(Util::getReplacingRowWriter(c, d), ExProgramAborted);
                EXPECT_THROW(Util::selectRowReader(table, c, d), ExProgramAborted);
            }
        for (int d : badDepths)
            for (int c : goodComps) {
                Util::RowFunctions table;
                EXPECT_THROW(Util::selectRowWriter(table, c, d, accumulate), ExProgramAborted);
                EXPECT_THROW(Util::getReplacingRowWriter(c, d), ExProgramAborted);
                table._reader = marker;
                EXPECT_NO_THROW(Util::selectRowReader(table, c, d));
                EXPECT_EQ(table._reader, marker);
            }
    }
    // Every known format selects a reader and both writers.
    for (const Format& f : allFormats()) {
        EXPECT_NE(readerOf(f), nullptr);
        EXPECT_NE(writerOf(f, false), nullptr);
        EXPECT_NE(writerOf(f, true), nullptr);
    }
}

// The tolerance against a constant: within one epsilon scaled by the larger magnitude, decided as
// the float sum from the smaller side reaching the larger value; an infinite magnitude gives no
// tolerance; NaN equals nothing.
TEST(RsTolerance, ComparesWithinScaledEpsilon) {
    const float inf = std::numeric_limits<float>::infinity();
    const float nan = std::numeric_limits<float>::quiet_NaN();
    const float up1 = std::nextafter(1.0f, 2.0f), up2 = std::nextafter(up1, 2.0f);
    const float down1 = std::nextafter(1.0f, 0.0f), down2 = std::nextafter(down1, 0.0f);
    struct Case {
        float v, c;
        bool equal;
    };
    const Case cases[] = {
        {1.0f, 1.0f, true},        {1.0000001f, 1.0f, true}, {up1, 1.0f, true},
        {up2, 1.0f, false},        {down1, 1.0f, true},      {down2, 1.0f, true},
        {0.9999997f, 1.0f, false}, {1.5f, 1.0f, false},      {0.5f, 1.0f, false},
        {inf, 1.0f, false},        {-inf, 1.0f, false},      {nan, 1.0f, false},
        {0.0f, 0.0f, true},        {-0.0f, 0.0f, true},      {1e-38f, 0.0f, false},
        {-1e-38f, 0.0f, false},    {1e-45f, 0.0f, false},    {inf, 0.0f, false},
        {nan, 0.0f, false},        {1000.0f, 1000.0001f, true}, {1000.0f, 1000.001f, false},
    };
    for (const Case& k : cases) {
        EXPECT_EQ(RsTolerance::isEqual(k.v, k.c), k.equal) << k.v << " vs " << k.c;
        if (k.c == 1.0f) {
            EXPECT_EQ(RsTolerance::isOne(k.v), k.equal) << k.v;
        }
        if (k.c == 0.0f) {
            EXPECT_EQ(RsTolerance::isZero(k.v), k.equal) << k.v;
        }
    }
}

}  // namespace
}  // namespace Zr
