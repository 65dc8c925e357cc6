// How the rasterizer hands spans over: blocks of rows, column tiles, the sub-scanlines a triangle
// misses, the extents of sub-pixel spans, and the rows of 8 x 4 spans.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <sstream>
#include <vector>

#include "rsRasterTestSupport.h"

namespace Zr {
namespace {

using namespace RsRasterTest;

constexpr i64 u = kPixelUnit;

// A triangle taller than a block and wider than a column tile, at whole pixels. Compared with the
// same triangle delivered in one piece per row: blocks start at the triangle's first row and hold
// _blockHeight rows (the last one fewer); a block comes tile by tile from its leftmost pixel, each
// tile _blockWidth wide, each row clamped to the tile; the pieces of a row make up its whole span;
// the rows run without gap to the bottom.
TEST(RsRasterizerSpans, BlocksAndColumnTilesPartitionTheTriangle) {
    const GeRectangle<int> region{0, 200, 0, 150};
    const Pt a{2 * u + 100, 3 * u}, b{190 * u, 60 * u + 77}, c{40 * u + 5, 120 * u + 3};
    Harness<RsPlainVertex, RsPixelSpan<0, 0>> whole(region, 100000, 100000);
    whole.buffer().keepDeliveries(true);
    whole.draw(a, b, c);
    std::map<int, RsPixelSpan<0, 0>> full;
    for (const auto& d : whole.buffer().deliveries()) full[d.row] = d.span;
    const ReferenceTriangle ref = whole.reference(a, b, c);
    ASSERT_EQ(full.size(), static_cast<std::size_t>(ref.rowEnd() - ref.rowBegin()));

    for (const auto& [blockWidth, blockHeight] : {std::pair{7, 5}, std::pair{16, 16}, std::pair{1, 1},
                                                 std::pair{64, 3}, std::pair{500, 500}}) {
        Harness<RsPlainVertex, RsPixelSpan<0, 0>> h(region, blockWidth, blockHeight);
        h.buffer().keepDeliveries(true);
        h.draw(a, b, c);
        EXPECT_EQ(h.buffer().wrongContext(), 0);
        EXPECT_EQ(h.buffer().counts(), whole.buffer().counts());
        const auto& got = h.buffer().deliveries();
        std::size_t next = 0;
        for (int blockStart = static_cast<int>(ref.rowBegin()); blockStart < ref.rowEnd();
             blockStart += blockHeight) {
            const int rows = std::min<int>(blockHeight, static_cast<int>(ref.rowEnd()) - blockStart);
            int left = INT_MAX, right = INT_MIN;
            for (int y = blockStart; y < blockStart + rows; ++y) {
                left = std::min(left, full.at(y)._x1);
                right = std::max(right, full.at(y)._x2);
            }
            std::map<int, int> covered;  // per row, the pixels the pieces cover
            for (int tile = left; tile < right; tile += blockWidth) {
                for (int y = blockStart; y < blockStart + rows; ++y, ++next) {
                    ASSERT_LT(next, got.size());
                    ASSERT_EQ(got[next].row, y);
                    const RsPixelSpan<0, 0>& piece = got[next].span;
                    if (piece._x1 >= piece._x2) continue;
                    EXPECT_GE(piece._x1, tile);
                    EXPECT_LE(piece._x2, tile + blockWidth);
                    EXPECT_EQ(piece._x1, std::max(full.at(y)._x1, tile));
                    covered[y] += piece._x2 - piece._x1;
                }
            }
            for (int y = blockStart; y < blockStart + rows; ++y)
                EXPECT_EQ(covered[y], std::max(0, full.at(y)._x2 - full.at(y)._x1)) << "row " << y;
        }
        EXPECT_EQ(next, got.size()) << "deliveries beyond the triangle's rows";
    }
}

// Sub-pixel spans: the sub-scanlines of the first and last pixel rows that lie outside the
// triangle hold -1 in both ends, all others are walked; the four extents are the smallest and
// largest starts and ends of the walked ones; one span per pixel row.
TEST(RsRasterizerSpans, SubPixelSpansMarkMissedSubScanlines) {
    const GeRectangle<int> region{10, 40, 20, 44};
    Harness<RsNormalVertex, RsPixelSpan<4, 4>> h(region, 1000, 1000);
    h.buffer().keepDeliveries(true);
    // Top at sub-row 5 of pixel row 2 (y = 22 + 5.5/16), bottom inside pixel row 9.
    const Pt a{12 * u, 22 * u + 88}, b{35 * u + 3, 26 * u + 17}, c{20 * u + 9, 29 * u + 201};
    h.draw(a, b, c);
    const ReferenceTriangle ref = h.reference(a, b, c);
    ASSERT_EQ(ref.rowBegin(), 2 * 16 + 5);
    const auto& deliveries = h.buffer().deliveries();
    const int firstRow = static_cast<int>(ref.rowBegin() >> 4);
    const int lastRow = static_cast<int>((ref.rowEnd() - 1) >> 4);
    ASSERT_EQ(static_cast<int>(deliveries.size()), lastRow - firstRow + 1);
    for (std::size_t i = 0; i < deliveries.size(); ++i) {
        const auto& d = deliveries[i];
        EXPECT_EQ(d.row, firstRow + static_cast<int>(i));
        int minX1 = INT_MAX, maxX1 = INT_MIN, minX2 = INT_MAX, maxX2 = INT_MIN;
        for (int slot = 0; slot < 16; ++slot) {
            const i64 subRow = i64(d.row) * 16 + slot;
            const bool walked = subRow >= ref.rowBegin() && subRow < ref.rowEnd();
            if (!walked) {
                EXPECT_EQ(d.span._x1[slot], -1) << "row " << d.row << " slot " << slot;
                EXPECT_EQ(d.span._x2[slot], -1) << "row " << d.row << " slot " << slot;
                continue;
            }
            EXPECT_GE(d.span._x1[slot], 0);
            minX1 = std::min(minX1, d.span._x1[slot]);
            maxX1 = std::max(maxX1, d.span._x1[slot]);
            minX2 = std::min(minX2, d.span._x2[slot]);
            maxX2 = std::max(maxX2, d.span._x2[slot]);
        }
        EXPECT_EQ(d.span._minX1, minX1);
        EXPECT_EQ(d.span._maxX1, maxX1);
        EXPECT_EQ(d.span._minX2, minX2);
        EXPECT_EQ(d.span._maxX2, maxX2);
    }
}

// Column tiles of sub-pixel spans clamp the extents to the tile, in sub-pixels, and leave the
// sub-scanline ends whole; the pieces of a row meet without overlap.
TEST(RsRasterizerSpans, SubPixelTilesClampOnlyTheExtents) {
    const GeRectangle<int> region{0, 40, 0, 20};
    Harness<RsPlainVertex, RsPixelSpan<4, 4>> whole(region, 1000, 1000);
    Harness<RsPlainVertex, RsPixelSpan<4, 4>> tiled(region, 3, 2);
    whole.buffer().keepDeliveries(true);
    tiled.buffer().keepDeliveries(true);
    const Pt a{1 * u + 7, 1 * u + 40}, b{38 * u + 100, 9 * u + 3}, c{6 * u + 222, 18 * u + 99};
    whole.draw(a, b, c);
    tiled.draw(a, b, c);
    std::map<int, RsPixelSpan<4, 4>> byRow;
    for (const auto& d : whole.buffer().deliveries()) byRow[d.row] = d.span;
    std::map<int, std::vector<std::pair<int, int>>> pieces;
    for (const auto& d : tiled.buffer().deliveries()) {
        const RsPixelSpan<4, 4>& full = byRow.at(d.row);
        for (int slot = 0; slot < 16; ++slot) {
            EXPECT_EQ(d.span._x1[slot], full._x1[slot]);
            EXPECT_EQ(d.span._x2[slot], full._x2[slot]);
        }
        const int lo = d.span._minX1, hi = d.span._maxX2;
        EXPECT_LE(d.span._minX1, d.span._maxX1);
        EXPECT_LE(d.span._minX2, d.span._maxX2);
        if (lo >= hi) continue;
        EXPECT_EQ(lo % 16 == 0 || lo == full._minX1, true) << "a piece starts inside a pixel";
        EXPECT_LE(hi - (lo & ~15), 3 * 16);
        pieces[d.row].push_back({lo, hi});
    }
    for (auto& [row, list] : pieces) {
        std::sort(list.begin(), list.end());
        EXPECT_EQ(list.front().first, byRow.at(row)._minX1);
        EXPECT_EQ(list.back().second, byRow.at(row)._maxX2);
        for (std::size_t i = 1; i < list.size(); ++i) EXPECT_EQ(list[i].first, list[i - 1].second);
    }
    EXPECT_EQ(whole.buffer().counts(), tiled.buffer().counts());
}

// A triangle smaller than a pixel that covers no sub-sample still comes as a span, whose
// sub-scanlines are missed or empty, and covers nothing.
TEST(RsRasterizerSpans, SpeckBetweenSamplesCoversNothing) {
    const GeRectangle<int> region{0, 8, 0, 8};
    Harness<RsPlainVertex, RsPixelSpan<4, 4>> h(region, 64, 64);
    h.buffer().keepDeliveries(true);
    // Within one sub-cell row band and between two sub-sample columns: x in (3 + 1/16, 3 + 1.4/16).
    h.draw({3 * u + 17, 2 * u + 1}, {3 * u + 22, 2 * u + 30}, {3 * u + 18, 2 * u + 60});
    EXPECT_EQ(h.buffer().hits(), 0);
    ASSERT_FALSE(h.buffer().deliveries().empty());
    for (const auto& d : h.buffer().deliveries())
        for (int slot = 0; slot < 16; ++slot)
            EXPECT_TRUE(d.span._x1[slot] == -1 || d.span._x1[slot] >= d.span._x2[slot]);
}

// 8 x 4 spans come at the row their last sub-scanline gives when shifted by the x bits, minus the
// rows before it in the block: a one-row triangle at pixel row r arrives at row r / 2, where a
// whole-pixel triangle of the same corners arrives at r.
TEST(RsRasterizerSpans, EightByFourSpansTakeTheXShiftForRows) {
    const GeRectangle<int> region{0, 32, 0, 64};
    using Buffer = RecordingBuffer<Rs2DVertex, RsPixelSpan<3, 2>>;
    using PlainBuffer = RecordingBuffer<Rs2DVertex, RsPixelSpan<0, 0>>;
    struct Case {
        int topRow, bottomRow;                // pixel rows the triangle's samples lie in
        int deliveredFirst, deliveredLast;    // rows at which its spans arrive
    };
    // Last sub-scanline 4 * bottom + 3 shifted by 3, minus the other rows.
    for (const Case& c : {Case{10, 10, 5, 5}, Case{11, 11, 5, 5}, Case{0, 0, 0, 0}, Case{10, 13, 3, 6},
                          Case{21, 30, 6, 15}}) {
        Buffer buffer(region);
        PlainBuffer plainBuffer(region);
        buffer.keepDeliveries(true);
        plainBuffer.keepDeliveries(true);
        Buffer::Rasterizer rasterizer(buffer, &Buffer::drawSpan, region, 64, 64);
        PlainBuffer::Rasterizer plain(plainBuffer, &PlainBuffer::drawSpan, region, 64, 64);
        // Corners from the top of the pixel row to the bottom of the bottom one, a little inside.
        Rs2DVertex a{2.0f, c.topRow + 0.05f}, b{30.0f, c.topRow + 0.05f},
            d{16.0f, c.bottomRow + 0.95f};
        rasterizer.rasterizeTriangle({}, a, b, d);
        plain.rasterizeTriangle({}, a, b, d);
        const auto& got = buffer.deliveries();
        ASSERT_EQ(static_cast<int>(got.size()), c.bottomRow - c.topRow + 1);
        EXPECT_EQ(got.front().row, c.deliveredFirst);
        EXPECT_EQ(got.back().row, c.deliveredLast);
        EXPECT_EQ(plainBuffer.deliveries().front().row, c.topRow);
        EXPECT_EQ(plainBuffer.deliveries().back().row, c.bottomRow);
    }
}

// The construction from the buffer takes its rectangle and the block sizes of the image cache.
TEST(RsRasterizerSpans, TakesRegionFromBufferAndBlocksFromImageCache) {
    using Buffer = RecordingBuffer<RsDepthVertex, RsPixelSpan<0, 0>>;
    Buffer buffer(GeRectangle<int>{5, 70, -3, 40});
    Buffer::Rasterizer rasterizer(buffer, &Buffer::drawSpan);
    EXPECT_EQ(rasterizer.getRegion(), (GeRectangle<int>{5, 70, -3, 40}));
    EXPECT_EQ(rasterizer.getBlockWidth(), PxImageTexture::getAvgCacheBlockingSizeX());
    EXPECT_EQ(rasterizer.getBlockHeight(), PxImageTexture::getAvgCacheBlockingSizeY());
    EXPECT_THROW(Buffer::Rasterizer(buffer, &Buffer::drawSpan, buffer.getPixelRegion(), 0, 4),
                 ExAssertionFailed);
    EXPECT_THROW(Buffer::Rasterizer(buffer, &Buffer::drawSpan, buffer.getPixelRegion(), 4, 0),
                 ExAssertionFailed);
}

TEST(RsRasterizerSpans, EdgeDumpNamesItsMembers) {
    const RsEdge<float> edge(0.0, 0.0, 4.0, 2.0, 1);
    std::ostringstream os;
    edge.dump(os);
    EXPECT_EQ(os.str(), " _currentX: 2 _dx_dy: 2");
}

}  // namespace
}  // namespace Zr
