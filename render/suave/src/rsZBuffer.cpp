#include "rsZBuffer.h"

#include <algorithm>
#include <cstddef>

namespace Zr {

RsZBuffer::RsZBuffer(int width, int height, double* depth)
    : _width(width), _height(height), _depth(depth), _rasterizer(*this, &RsZBuffer::drawSpan) {
    std::fill_n(_depth, static_cast<std::size_t>(width) * static_cast<std::size_t>(height), kEmptyDepth);
}

void RsZBuffer::drawSpan(const Context&, int row, const Span& span, RsPixelData<RsDepthVertex>& data) {
    double* const depths = _depth + std::ptrdiff_t(row) * _width;
    for (int x = span._x1; x < span._x2; ++x) {
        const double depth = data._eyeZ._q / data._w._q;
        if (depth > depths[x]) depths[x] = depth;
        data.stepX();
    }
}

void RsZBuffer::dump(std::ostream& os) const {
    os << " _width: " << _width << " _height: " << _height << " _depth: " << static_cast<const void*>(_depth);
}

}  // namespace Zr
