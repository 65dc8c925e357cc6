#pragma once
// A buffer of depths alone, for the plain shadow maps of the lights: the nearest surface's eye z
// at each pixel, written straight into an array of doubles that the caller owns.
//
// Triangles come in through one rasterizer of depth vertices, whose pixel data carries eye z and
// 1/w, both multiplied by 1/w after the perspective division; a pixel's eye z is their quotient,
// one division per pixel. Eye z is negative in front of the eye, so the nearest surface has the
// largest value: a surface is kept where its depth is greater than what the pixel holds. A new
// buffer fills the array with the lowest double, so that any surface is nearer and a pixel that no
// surface covers lights everything behind it.
#include <ostream>

#include "geRectangle.h"
#include "rcBase.h"
#include "rsDrawContext.h"
#include "rsPixelData.h"
#include "rsPixelSpan.h"
#include "rsRasterizer.h"
#include "rsVertices.h"

namespace Zr {

class RsZBuffer : public RCObject {
public:
    using Context = RsDrawContext;
    // The region renderer draws depth alone into this buffer, with no material.
    static constexpr bool kDepthOnly = true;
    using Span = RsPixelSpan<0, 0>;
    using Rasterizer = RsRasterizer<RsZBuffer, RsDepthVertex, Span, RsPixelData<RsDepthVertex>>;

    // The depth of a pixel that no surface covers: the lowest double.
    static constexpr double kEmptyDepth = -1.7976931348623157e308;

    // A buffer of width x height pixels writing into depth, row by row, which it fills with the
    // empty depth; depth must outlive the buffer.
    RsZBuffer(int width, int height, double* depth);
    RsZBuffer(const RsZBuffer&) = delete;
    RsZBuffer& operator=(const RsZBuffer&) = delete;

    GeRectangle<int> getPixelRegion() const { return {0, _width, 0, _height}; }
    template <class Vertex>
    const Rasterizer& getRasterizer() const {
        static_assert(std::is_same_v<Vertex, RsDepthVertex>, "a depth buffer draws depth vertices only");
        return _rasterizer;
    }
    // The depths are final as drawn.
    void finalize() {}

    // Keeps the nearer of each pixel's depth and the surface's over [span._x1, span._x2) of row.
    void drawSpan(const Context& context, int row, const Span& span, RsPixelData<RsDepthVertex>& data);

    void dump(std::ostream& os) const;

private:
    int _width;
    int _height;
    double* _depth;
    Rasterizer _rasterizer;
};

}  // namespace Zr
