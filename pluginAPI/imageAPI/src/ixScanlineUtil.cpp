#include "ixScanlineUtil.h"

#include <cmath>

namespace Zr {

void IxScanlineUtil::divideByAlpha(IxScanline<CoRgbaColorTyped<float>>& scanline,
                                   const GeInterval<int>* range) {
    int first = scanline.getX0();
    int last = scanline.getX1() - 1;
    if (range != nullptr) {
        if (range->min > first) first = range->min;
        if (range->max < last) last = range->max;
    }
    // The same threshold as the resolve of fragments, so that both give the same straight colour.
    constexpr float tinyAlpha = 1e-8f;
    for (int x = first; x <= last; ++x) {
        CoRgbaColorTyped<float>& pixel = scanline[x];
        const float factor = std::fabs(pixel.a) <= tinyAlpha ? 0.0f : 1.0f / pixel.a;
        pixel.r *= factor;
        pixel.g *= factor;
        pixel.b *= factor;
    }
}

}  // namespace Zr
