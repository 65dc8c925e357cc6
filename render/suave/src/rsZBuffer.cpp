#include "rsZBuffer.h"

#include <cstddef>

namespace Zr {

RsZBuffer::RsZBuffer(int width, int height, double* depth)
    : RsDepthMapBuffer(width, height, depth, static_cast<Rasterizer::DrawSpan>(&RsZBuffer::drawSpan)) {}

void RsZBuffer::drawSpan(const Context&, int row, const Span& span, RsPixelData<RsDepthVertex>& data) {
    double* const depths = _depth + std::ptrdiff_t(row) * _width;
    for (int x = span._x1; x < span._x2; ++x) {
        const double depth = data._eyeZ._q / data._w._q;
        if (depth > depths[x]) depths[x] = depth;
        data.stepX();
    }
}

}  // namespace Zr
