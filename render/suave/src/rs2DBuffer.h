#pragma once
// Flat 2D triangles filled straight into an image tile, in the tile's own pixel format: no depth,
// no material, no fragments, one colour for every pixel of a triangle.
//
//   IxTile tile(format, rectangle, fill);
//   Rs2DBuffer buffer(tile, {1, 0, 0, 0.5f}, true);        // blend red at half alpha
//   buffer.rasterizeUnclippedAATriangle(a, b, c);          // anti-aliased, 8 x 4 samples a pixel
//
// Vertices are in the tile's pixel coordinates. Both triangle operations clip the triangle to the
// tile first (in spite of their names), then draw the fan of the clipped polygon: plain triangles
// through whole-pixel spans, anti-aliased ones through sub-pixel spans whose coverage scales the
// alpha. The pixel writers are chosen once per mode (Rs2DSpanWriter).
//
// Sub-pixel spans arrive at the row that the rasterizer gives them, which for 8 x 4 cells is about
// half the true row (the rasterizer's row shift is the x shift); rows that land outside the tile,
// above it for a tall triangle, are dropped, so that nothing is written outside the tile's pixels.
#include <array>
#include <ostream>

#include "coRgbaColorTyped.h"
#include "geRectangle.h"
#include "ixTile.h"
#include "ixTileManip.h"
#include "rs2DSpanWriter.h"
#include "rsPixelData.h"
#include "rsPixelSpan.h"
#include "rsRasterizer.h"
#include "rsVertices.h"

namespace Zr {

class Rs2DBuffer {
public:
    using Rgba = CoRgbaColorTyped<float>;
    // Spans carry no attributes: the drawing context is empty.
    struct Context {};

    // Holds a write guard on tile until destroyed. A tile format outside 1, 3 or 4 channels of
    // 8, 16 or 32 bits aborts (Assertions::throwProgramAborted).
    Rs2DBuffer(IxTile& tile, const Rgba& colour, bool blending);
    Rs2DBuffer(const Rs2DBuffer&) = delete;
    Rs2DBuffer& operator=(const Rs2DBuffer&) = delete;

    // Source-over the tile when true, replace its pixels when false.
    void setBlending(bool blending);
    bool getBlending() const { return _blending; }
    // The colour of the next triangles, straight (not premultiplied).
    void setColor(const Rgba& colour) { _color = colour; }
    const Rgba& getColor() const { return _color; }

    void rasterizeUnclippedTriangle(const Rs2DVertex& a, const Rs2DVertex& b, const Rs2DVertex& c);
    void rasterizeUnclippedAATriangle(const Rs2DVertex& a, const Rs2DVertex& b, const Rs2DVertex& c);

    // The tile's rectangle, which the rasterizers take as their region.
    const GeRectangle<int>& getPixelRegion() const { return _guard._rectangle; }

    // The rasterizers' span methods.
    void drawSpan(const Context& context, int row, const RsPixelSpan<0, 0>& span, RsPixelData<Rs2DVertex>& data);
    void drawAASpan(const Context& context, int row, const RsPixelSpan<3, 2>& span, RsPixelData<Rs2DVertex>& data);

    void dump(std::ostream& os) const;

private:
    using Rasterizer = RsRasterizer<Rs2DBuffer, Rs2DVertex, RsPixelSpan<0, 0>, RsPixelData<Rs2DVertex>>;
    using AARasterizer = RsRasterizer<Rs2DBuffer, Rs2DVertex, RsPixelSpan<3, 2>, RsPixelData<Rs2DVertex>>;

    // The tile's limits and the limits to clip against (x minimum 1, x maximum 2, y minimum 4,
    // y maximum 8).
    struct Clip {
        float _xMin;
        float _xMax;
        float _yMin;
        float _yMax;
        int _flags = 15;
    };
    // A triangle gains at most one vertex per limit: 3 + 4 in the polygon, 3 + 2 x 4 made.
    static constexpr int kMaxVertices = 11;
    static constexpr int kMaxPolygon = 8;

    // Clips the triangle into _polygon; returns its vertex count.
    int clipTriangle(const Rs2DVertex& a, const Rs2DVertex& b, const Rs2DVertex& c);
    // Clips the count vertices of _polygon against one limit, adding crossings to _vertices from
    // index made on; returns the new count.
    int clipAgainst(int flag, int count, int& made);
    template <class R>
    void drawFan(const R& rasterizer, const Rs2DVertex& a, const Rs2DVertex& b, const Rs2DVertex& c);

    bool _blending;
    Rgba _color;
    IxTile* _tile;
    IxTileManip::WriteGuardNoCheck _guard;
    Clip _clip;
    std::array<Rs2DVertex, kMaxVertices> _vertices;
    std::array<const Rs2DVertex*, kMaxPolygon> _polygon;
    std::array<const Rs2DVertex*, kMaxPolygon> _scratch;
    Rasterizer _rasterizer;
    AARasterizer _aaRasterizer;
    Rs2DSpanWriter::FillSpan _fillSpan = nullptr;
    Rs2DSpanWriter::FillAASpan _fillAASpan = nullptr;
};

}  // namespace Zr
