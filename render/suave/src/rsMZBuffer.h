#pragma once
// A buffer of depths for midpoint shadow maps: it keeps the two nearest surfaces of each pixel and
// leaves their mean in the caller's array when finalised. A surface lies between the two nearest
// ones of a closed caster, so a receiver never shadows itself, and no bias is needed; where a
// single surface was drawn the mean lies at half the lowest double, far behind everything, so
// that a lone card shadows what lies behind it but never itself.
//
// Drawing is that of RsZBuffer (eye z, one division per pixel, larger is nearer) with a second
// array of its own for the second nearest depth.
#include <memory>
#include <ostream>

#include "geRectangle.h"
#include "rcBase.h"
#include "rsDrawContext.h"
#include "rsPixelData.h"
#include "rsPixelSpan.h"
#include "rsRasterizer.h"
#include "rsVertices.h"

namespace Zr {

class RsMZBuffer : public RCObject {
public:
    using Context = RsDrawContext;
    // The region renderer draws depth alone into this buffer, with no material.
    static constexpr bool kDepthOnly = true;
    using Span = RsPixelSpan<0, 0>;
    using Rasterizer = RsRasterizer<RsMZBuffer, RsDepthVertex, Span, RsPixelData<RsDepthVertex>>;

    // The depth of a pixel that no surface covers: the lowest double.
    static constexpr double kEmptyDepth = -1.7976931348623157e308;

    // A buffer of width x height pixels whose nearest depths go into depth, row by row; both
    // depth and the buffer's second array start at the empty depth. depth must outlive the buffer.
    RsMZBuffer(int width, int height, double* depth);
    RsMZBuffer(const RsMZBuffer&) = delete;
    RsMZBuffer& operator=(const RsMZBuffer&) = delete;

    GeRectangle<int> getPixelRegion() const { return {0, _width, 0, _height}; }
    template <class Vertex>
    const Rasterizer& getRasterizer() const {
        static_assert(std::is_same_v<Vertex, RsDepthVertex>, "a depth buffer draws depth vertices only");
        return _rasterizer;
    }
    // Replaces each nearest depth by the mean of it and the second nearest.
    void finalize();

    // Files the surface's depth among each pixel's two nearest over [span._x1, span._x2) of row.
    void drawSpan(const Context& context, int row, const Span& span, RsPixelData<RsDepthVertex>& data);

    void dump(std::ostream& os) const;

private:
    int _width;
    int _height;
    double* _depth;
    Rasterizer _rasterizer;
    std::unique_ptr<double[]> _secondDepth;
};

}  // namespace Zr
