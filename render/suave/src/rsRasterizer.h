#pragma once
// Scan conversion of one screen-space triangle into horizontal spans, delivered in cache-sized
// tiles to a span method of the buffer that the rasterizer serves.
//
// The triangle is sorted by y, cut at its middle vertex and walked by two edges in floating point;
// attributes are not walked along the edges but come from the planes of the pixel data, placed at
// the first pixel of each delivered span. Two strategies, chosen by the span kind:
// - RsPixelSpan<0, 0>: one run of whole pixels per row, walked with float edges;
// - RsPixelSpan<X, Y>: 2^X sub-pixels across and 2^Y sub-scanlines down a pixel, walked with double
//   edges one sub-scanline at a time and gathered into one span per pixel row.
//
// Fill rule. Sample positions are moved onto the integers (pixel centres at whole pixels, sub-cell
// centres at sub-pixel grain). A row is covered from ceil(top) up to but not including
// ceil(bottom), and on a row the samples from ceil(left x) up to but not including ceil(right x):
// a sample on a left or top edge is inside, one on a right or bottom edge outside. An edge shared
// by two triangles is computed from the same vertices, from the same starting row and with the same
// steps in both, so that they agree bit for bit: no sample is covered twice and none is missed.
//
// Spans are stored per block of _blockHeight pixel rows and delivered column tile by column tile,
// so that the tile of every per-pixel array the buffer touches stays in cache for the whole block.
//
// The rasterizer does not clip: the caller clips, and the rectangle only rebases coordinates.
#include <climits>
#include <memory>
#include <type_traits>
#include <utility>

#include "assertions.h"
#include "gePoint2.h"
#include "geRectangle.h"
#include "pxImageTexture.h"
#include "pxRequestMgr.h"
#include "rsCeil.h"
#include "rsEdge.h"
#include "rsPixelData.h"
#include "rsPixelSpan.h"

namespace Zr {

template <class Buffer, class Vertex, class PixelSpan, class PixelData = RsPixelData<Vertex>>
class RsRasterizer {
public:
    using Context = typename Buffer::Context;
    // The buffer's span method: (context, region-relative pixel row, span, placed pixel data).
    using DrawSpan = void (Buffer::*)(const Context&, int, const PixelSpan&, PixelData&);

    static constexpr int kSubPixelBits = PixelSpan::kSubPixelBits;
    static constexpr int kSubScanlineBits = PixelSpan::kSubScanlineBits;
    static constexpr bool kSubPixel = kSubPixelBits != 0 || kSubScanlineBits != 0;
    // Whole pixels are walked in float, sub-pixels in double.
    using EdgeType = std::conditional_t<kSubPixel, double, float>;
    using Edge = RsEdge<EdgeType>;

    // Region from buffer.getPixelRegion(), block sizes from PxImageTexture.
    RsRasterizer(Buffer& buffer, DrawSpan drawSpan)
        : RsRasterizer(buffer, drawSpan, buffer.getPixelRegion()) {}
    RsRasterizer(Buffer& buffer, DrawSpan drawSpan, const GeRectangle<int>& region)
        : RsRasterizer(buffer, drawSpan, region, PxImageTexture::getAvgCacheBlockingSizeX(),
                       PxImageTexture::getAvgCacheBlockingSizeY()) {}
    // With explicit block sizes, in pixels.
    RsRasterizer(Buffer& buffer, DrawSpan drawSpan, const GeRectangle<int>& region, int blockWidth,
                 int blockHeight)
        : _buffer(buffer),
          _drawSpan(drawSpan),
          _x1(region.x0),
          _x2(region.x1),
          _y1(region.y0),
          _y2(region.y1),
          _blockWidth(blockWidth),
          _blockHeight(blockHeight) {
        ZR_ASSERT_AT(blockWidth > 0, "render\\suave\\src\\rsRasterizer", __LINE__);
        ZR_ASSERT_AT(blockHeight > 0, "render\\suave\\src\\rsRasterizer", __LINE__);
        _spans = std::make_unique<PixelSpan[]>(static_cast<std::size_t>(_blockHeight));
    }

    RsRasterizer(const RsRasterizer&) = delete;
    RsRasterizer& operator=(const RsRasterizer&) = delete;

    GeRectangle<int> getRegion() const { return {_x1, _x2, _y1, _y2}; }
    int getBlockWidth() const { return _blockWidth; }
    int getBlockHeight() const { return _blockHeight; }

    // Draws the triangle v0, v1, v2, given in any order and either winding, in the buffer's pixel
    // coordinates. A triangle that covers no row, or whose vertices are collinear, draws nothing.
    // Const, but writes the span store: one rasterizer serves one thread.
    void rasterizeTriangle(const Context& context, const Vertex& v0, const Vertex& v1,
                           const Vertex& v2) const {
        const Point p0 = toWalkCoordinates(v0);
        const Point p1 = toWalkCoordinates(v1);
        const Point p2 = toWalkCoordinates(v2);
        const Point* top = &p0;
        const Point* middle = &p1;
        const Point* bottom = &p2;
        if (middle->y < top->y) std::swap(top, middle);
        if (bottom->y < middle->y) std::swap(middle, bottom);
        if (middle->y < top->y) std::swap(top, middle);

        const int yTop = rsCeil(top->y);
        const int yMiddle = rsCeil(middle->y);
        const int yBottom = rsCeil(bottom->y);
        if (yTop == yBottom) return;

        Edge longEdge(top->x, top->y, bottom->x, bottom->y, yTop);
        Edge lowerEdge(middle->x, middle->y, bottom->x, bottom->y, yMiddle);
        const GePoint2<double> origin(static_cast<double>(v0.pixelX()) - _x1,
                                      static_cast<double>(v0.pixelY()) - _y1);
        int spanCount = 0;
        if (yMiddle != yTop) {
            // Both edges leave the top vertex: the one turning less to the right is the left one.
            Edge upperEdge(top->x, top->y, middle->x, middle->y, yTop);
            if (upperEdge._dx_dy == longEdge._dx_dy) return;
            const bool longIsLeft = longEdge._dx_dy < upperEdge._dx_dy;
            PixelData data = makePixelData(context, origin, v0, v1, v2);
            startFirstSpan(yTop);
            if (longIsLeft) {
                rasterizeHalfTriangle(context, yTop, yMiddle, longEdge, upperEdge, spanCount, data);
                rasterizeHalfTriangle(context, yMiddle, yBottom, longEdge, lowerEdge, spanCount, data);
            } else {
                rasterizeHalfTriangle(context, yTop, yMiddle, upperEdge, longEdge, spanCount, data);
                rasterizeHalfTriangle(context, yMiddle, yBottom, lowerEdge, longEdge, spanCount, data);
            }
            finishLastSpans(context, data, spanCount, yBottom);
        } else {
            // Flat top: the two edges meet below, so the one with the larger slope is the left one.
            if (lowerEdge._dx_dy == longEdge._dx_dy) return;
            const bool longIsLeft = longEdge._dx_dy > lowerEdge._dx_dy;
            PixelData data = makePixelData(context, origin, v0, v1, v2);
            startFirstSpan(yTop);
            if (longIsLeft) {
                rasterizeHalfTriangle(context, yMiddle, yBottom, longEdge, lowerEdge, spanCount, data);
            } else {
                rasterizeHalfTriangle(context, yMiddle, yBottom, lowerEdge, longEdge, spanCount, data);
            }
            finishLastSpans(context, data, spanCount, yBottom);
        }
    }

    // Walks rows (sub-scanlines on the sub-pixel paths) yStart up to but not including yEnd,
    // storing one span per row and delivering each full block. spanCount is the number of spans
    // already stored; the edges are left at row yEnd.
    void rasterizeHalfTriangle(const Context& context, int yStart, int yEnd, Edge& left, Edge& right,
                               int& spanCount, PixelData& data) const {
        if (yStart >= yEnd) return;
        PixelSpan* const spans = _spans.get();
        const int blockHeight = _blockHeight;
        // The manager is a process-wide singleton: looked up once, asked on every row.
        PxRequestMgr* const requests = PxRequestMgr::getInstance();
        int count = spanCount;
        for (int y = yStart; y < yEnd; ++y) {
            // Lets the host stop the work; leaves by exception when it does.
            if (requests) requests->checkInterrupt();
            if constexpr (!kSubPixel) {
                PixelSpan& span = spans[count];
                span._x1 = rsCeil(left._currentX);
                span._x2 = rsCeil(right._currentX);
                if (++count == blockHeight) {
                    drawSpans(context, data, count, y);
                    count = 0;
                }
            } else {
                const int slot = y & kLastSlot;
                spans[count].store(slot, rsCeil(left._currentX), rsCeil(right._currentX));
                if (slot == kLastSlot) {
                    // The pixel row is complete.
                    if (++count == blockHeight) {
                        drawSpans(context, data, count, y);
                        count = 0;
                    }
                    spans[count].resetExtents();
                }
            }
            left.step();
            right.step();
        }
        spanCount = count;
    }

    // Delivers the spanCount stored spans, the last of which lies at lastRow (a sub-scanline on the
    // sub-pixel paths), column tile by column tile, each span clamped to its tile and the pixel
    // data placed at the span's first pixel.
    // The pixel data of a triangle, told the material's needed-context mask where the drawing
    // context carries one, so that it leaves out the planes nobody reads.
    static PixelData makePixelData(const Context& context, const GePoint2<double>& origin, const Vertex& v0,
                                   const Vertex& v1, const Vertex& v2) {
        if constexpr (requires { context._needed; }) return PixelData(origin, v0, v1, v2, context._needed);
        else return PixelData(origin, v0, v1, v2);
    }

    void drawSpans(const Context& context, PixelData& data, int spanCount, int lastRow) const {
        PixelSpan* const spans = _spans.get();
        const int blockWidth = _blockWidth;
        if constexpr (!kSubPixel) {
            int minX = INT_MAX;
            int maxX = INT_MIN;
            for (int i = 0; i < spanCount; ++i) {
                minX = spans[i]._x1 < minX ? spans[i]._x1 : minX;
                maxX = spans[i]._x2 > maxX ? spans[i]._x2 : maxX;
            }
            if (!(minX < maxX)) return;
            const int firstRow = lastRow - spanCount + 1;
            for (int bx = minX; bx < maxX; bx += blockWidth) {
                const int bxEnd = bx + blockWidth;
                for (int i = 0; i < spanCount; ++i) {
                    PixelSpan clamped;
                    clamped._x1 = spans[i]._x1 > bx ? spans[i]._x1 : bx;
                    clamped._x2 = spans[i]._x2 < bxEnd ? spans[i]._x2 : bxEnd;
                    data.place(clamped._x1, firstRow + i);
                    (_buffer.*_drawSpan)(context, firstRow + i, clamped, data);
                }
            }
        } else {
            int minSub = INT_MAX;
            int maxSub = INT_MIN;
            for (int i = 0; i < spanCount; ++i) {
                minSub = spans[i]._minX1 < minSub ? spans[i]._minX1 : minSub;
                maxSub = spans[i]._maxX2 > maxSub ? spans[i]._maxX2 : maxSub;
            }
            const int minX = minSub >> kSubPixelBits;
            const int maxX = (maxSub + (PixelSpan::kSubPixels - 1)) >> kSubPixelBits;
            if (!(minX < maxX)) return;
            // The row is shifted by the x bits, also where a pixel row has fewer sub-scanlines than
            // a pixel has sub-pixels (8 x 4 cells), whose rows thus come out at about half their
            // place. That placement is part of what the consumers of such spans expect: it is
            // deliberate, not to be replaced by the y shift.
            const int firstRow = (lastRow >> kSubPixelBits) - spanCount + 1;
            for (int bx = minX; bx < maxX; bx += blockWidth) {
                // Only the extents are clamped: the consumer tests samples against the whole
                // sub-scanline starts and ends.
                const int lo = bx * PixelSpan::kSubPixels;
                const int hi = (bx + blockWidth) * PixelSpan::kSubPixels;
                for (int i = 0; i < spanCount; ++i) {
                    PixelSpan& span = spans[i];
                    const int minX1 = span._minX1, maxX1 = span._maxX1;
                    const int minX2 = span._minX2, maxX2 = span._maxX2;
                    span._minX1 = clamp(minX1, lo, hi);
                    span._maxX1 = clamp(maxX1, lo, hi);
                    span._minX2 = clamp(minX2, lo, hi);
                    span._maxX2 = clamp(maxX2, lo, hi);
                    data.place(span._minX1 >> kSubPixelBits, firstRow + i);
                    (_buffer.*_drawSpan)(context, firstRow + i, span, data);
                    span._minX1 = minX1;
                    span._maxX1 = maxX1;
                    span._minX2 = minX2;
                    span._maxX2 = maxX2;
                }
            }
        }
    }

private:
    // Positions in the walking frame: relative to the region, in pixels or sub-pixels, with the
    // samples on the integers.
    using Coord = typename Vertex::Coord;
    using WalkCoord = std::conditional_t<kSubPixel, double, Coord>;
    struct Point {
        WalkCoord x;
        WalkCoord y;
    };
    static constexpr int kLastSlot = PixelSpan::kSubScanlines - 1;

    Point toWalkCoordinates(const Vertex& v) const {
        if constexpr (!kSubPixel) {
            return {v.pixelX() - static_cast<Coord>(_x1) - static_cast<Coord>(0.5),
                    v.pixelY() - static_cast<Coord>(_y1) - static_cast<Coord>(0.5)};
        } else {
            // Scaled in the vertex's own precision, then widened for the walk.
            constexpr Coord scaleX = static_cast<Coord>(PixelSpan::kSubPixels);
            constexpr Coord scaleY = static_cast<Coord>(PixelSpan::kSubScanlines);
            return {static_cast<double>((v.pixelX() - static_cast<Coord>(_x1)) * scaleX -
                                        static_cast<Coord>(0.5)),
                    static_cast<double>((v.pixelY() - static_cast<Coord>(_y1)) * scaleY -
                                        static_cast<Coord>(0.5))};
        }
    }

    static int clamp(int v, int lo, int hi) { return v < lo ? lo : (v > hi ? hi : v); }

    // The sub-scanlines of the first pixel row above the triangle's top cover nothing.
    void startFirstSpan(int yTop) const {
        if constexpr (kSubPixel) {
            PixelSpan& span = _spans[0];
            span.resetExtents();
            for (int slot = 0; slot < (yTop & kLastSlot); ++slot) span.markMissed(slot);
        }
    }

    // Completes a last pixel row that the triangle ends inside of, and delivers what is stored.
    void finishLastSpans(const Context& context, PixelData& data, int spanCount, int yBottom) const {
        if constexpr (kSubPixel) {
            const int firstMissed = yBottom & kLastSlot;
            if (firstMissed != 0) {
                PixelSpan& span = _spans[spanCount];
                for (int slot = firstMissed; slot <= kLastSlot; ++slot) span.markMissed(slot);
                ++spanCount;
            }
        }
        if (spanCount != 0) drawSpans(context, data, spanCount, yBottom - 1);
    }

    Buffer& _buffer;
    DrawSpan _drawSpan;
    int _x1;  // the buffer's pixel rectangle: x from _x1 to _x2, y from _y1 to _y2 (ends excluded)
    int _x2;
    int _y1;
    int _y2;
    int _blockWidth;   // width of a column tile, in pixels
    int _blockHeight;  // pixel rows stored before they are delivered
    std::unique_ptr<PixelSpan[]> _spans;
};

}  // namespace Zr
