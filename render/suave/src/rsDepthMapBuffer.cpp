#include "rsDepthMapBuffer.h"

#include <algorithm>

namespace Zr {

RsDepthMapBuffer::RsDepthMapBuffer(int width, int height, double* depth, Rasterizer::DrawSpan drawSpan)
    : _width(width), _height(height), _depth(depth), _rasterizer(*this, drawSpan) {
    std::fill_n(_depth, getPixelCount(), kEmptyDepth);
}

void RsDepthMapBuffer::dump(std::ostream& os) const {
    os << " _width: " << _width << " _height: " << _height << " _depth: " << static_cast<const void*>(_depth);
}

}  // namespace Zr
