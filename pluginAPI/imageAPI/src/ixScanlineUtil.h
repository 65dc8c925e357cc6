#pragma once
// Operations on whole scanlines.
#include "coRgbaColorTyped.h"
#include "geInterval.h"
#include "ixScanline.h"

namespace Zr {

class IxScanlineUtil {
public:
    // Turns premultiplied colours into straight ones in place: r, g, b are divided by a, and a
    // stays. An alpha of at most 1e-8 in magnitude gives black with that alpha kept, rather
    // than a division. range is a closed interval of columns, clipped to the row; null means the
    // whole row.
    static void divideByAlpha(IxScanline<CoRgbaColorTyped<float>>& scanline,
                              const GeInterval<int>* range);
};

}  // namespace Zr
