#pragma once
// A buffer of depths for midpoint shadow maps: it keeps the two nearest surfaces of each pixel and
// leaves their mean in the caller's array when finalised. A surface lies between the two nearest
// ones of a closed caster, so a receiver never shadows itself, and no bias is needed; where a
// single surface was drawn the mean lies at half the lowest double, far behind everything, so
// that a lone card shadows what lies behind it but never itself.
//
// Drawing is that of RsZBuffer (eye z, one division per pixel, larger is nearer; rsDepthMapBuffer.h)
// with a second array of its own for the second nearest depth.
#include <memory>
#include <ostream>

#include "rsDepthMapBuffer.h"

namespace Zr {

class RsMZBuffer : public RsDepthMapBuffer {
public:
    // A buffer of width x height pixels whose nearest depths go into depth, row by row; both
    // depth and the buffer's second array start at the empty depth. depth must outlive the buffer.
    RsMZBuffer(int width, int height, double* depth);

    // Replaces each nearest depth by the mean of it and the second nearest.
    void finalize();

    // Files the surface's depth among each pixel's two nearest over [span._x1, span._x2) of row.
    void drawSpan(const Context& context, int row, const Span& span, RsPixelData<RsDepthVertex>& data);

    void dump(std::ostream& os) const;

private:
    std::unique_ptr<double[]> _secondDepth;
};

}  // namespace Zr
