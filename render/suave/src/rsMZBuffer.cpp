#include "rsMZBuffer.h"

#include <algorithm>
#include <cstddef>

namespace Zr {

RsMZBuffer::RsMZBuffer(int width, int height, double* depth)
    : RsDepthMapBuffer(width, height, depth, static_cast<Rasterizer::DrawSpan>(&RsMZBuffer::drawSpan)) {
    const std::size_t pixels = getPixelCount();
    _secondDepth = std::make_unique_for_overwrite<double[]>(pixels);
    std::fill_n(_secondDepth.get(), pixels, kEmptyDepth);
}

void RsMZBuffer::drawSpan(const Context&, int row, const Span& span, RsPixelData<RsDepthVertex>& data) {
    const std::ptrdiff_t rowStart = std::ptrdiff_t(row) * _width;
    double* const first = _depth + rowStart;
    double* const second = _secondDepth.get() + rowStart;
    for (int x = span._x1; x < span._x2; ++x) {
        const double depth = data._eyeZ._q / data._w._q;
        if (depth > second[x]) {
            // A surface level with the nearest becomes the second one.
            if (depth > first[x]) {
                second[x] = first[x];
                first[x] = depth;
            } else {
                second[x] = depth;
            }
        }
        data.stepX();
    }
}

void RsMZBuffer::finalize() {
    const std::size_t pixels = getPixelCount();
    const double* const second = _secondDepth.get();
    // Halved before adding: two lowest doubles would overflow their sum.
    for (std::size_t i = 0; i < pixels; ++i) _depth[i] = _depth[i] * 0.5 + second[i] * 0.5;
}

void RsMZBuffer::dump(std::ostream& os) const {
    RsDepthMapBuffer::dump(os);
    os << " _secondDepth: " << static_cast<const void*>(_secondDepth.get());
}

}  // namespace Zr
