#include "coHsvColor.h"

#include <cmath>

namespace Zr {

CoHsvColor CoHsvColor::convertFromRgb(const CoRgbColorTyped<float>& rgb) {
    const float max = rgb.getMax();
    const float min = rgb.getMin();
    const float delta = max - min;
    CoHsvColor hsv(0.0F, 0.0F, max);
    if (!(max > 0.0F) || !(delta > 0.0F)) return hsv;  // black or grey: no hue
    hsv.s = delta / max;
    // The hue's sector is named by the largest channel; within it the position is the
    // difference of the other two relative to the spread.
    float sector;
    if (rgb.r == max) {
        sector = (rgb.g - rgb.b) / delta;  // between magenta (-1) and yellow (1)
    } else if (rgb.g == max) {
        sector = 2.0F + (rgb.b - rgb.r) / delta;  // between yellow (1) and cyan (3)
    } else {
        sector = 4.0F + (rgb.r - rgb.g) / delta;  // between cyan (3) and magenta (5)
    }
    hsv.h = sector * 60.0F;
    if (hsv.h < 0.0F) hsv.h += 360.0F;
    if (hsv.h >= 360.0F) hsv.h -= 360.0F;  // -tiny + 360 may round up to 360
    return hsv;
}

CoRgbColorTyped<float> CoHsvColor::convertToRgb() const {
    float hue = std::fmod(h, 360.0F);
    if (hue < 0.0F) hue += 360.0F;
    const float sector = hue / 60.0F;
    int index = static_cast<int>(sector);
    if (index > 5) index = 5;  // 359.99997 / 60 may round to 6
    const float fraction = sector - static_cast<float>(index);
    // The three levels of the hexcone: the largest channel is v, the smallest p, and the one in
    // between runs from one towards the other across the sector.
    const float p = v * (1.0F - s);
    const float q = v * (1.0F - s * fraction);
    const float t = v * (1.0F - s * (1.0F - fraction));
    switch (index) {
        case 0: return {v, t, p};
        case 1: return {q, v, p};
        case 2: return {p, v, t};
        case 3: return {p, q, v};
        case 4: return {t, p, v};
        default: return {v, p, q};
    }
}

void CoHsvColor::dump(std::ostream& os) const { os << " h: " << h << " s: " << s << " v: " << v; }

}  // namespace Zr
