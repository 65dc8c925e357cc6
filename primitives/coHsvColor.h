#pragma once
// A colour as hue, saturation and value, in the hexcone model: value is the largest channel,
// saturation the spread of the channels relative to it, and hue the angle around the cone in
// degrees, 0 red, 120 green, 240 blue, in [0, 360). Grey and black have hue 0, black also
// saturation 0.
#include <ostream>

#include "coRgbColorTyped.h"

namespace Zr {

class CoHsvColor {
public:
    float h = 0.0F;
    float s = 0.0F;
    float v = 0.0F;

    constexpr CoHsvColor() = default;
    constexpr CoHsvColor(float h_, float s_, float v_) : h(h_), s(s_), v(v_) {}

    // The hexcone decomposition. A colour whose largest channel is not above 0 has saturation 0.
    static CoHsvColor convertFromRgb(const CoRgbColorTyped<float>& rgb);
    // The inverse of convertFromRgb. Hue is taken modulo 360; saturation and value are used as
    // they are, without clamping.
    CoRgbColorTyped<float> convertToRgb() const;

    constexpr bool operator==(const CoHsvColor& o) const { return h == o.h && s == o.s && v == o.v; }
    constexpr bool operator!=(const CoHsvColor& o) const { return !(*this == o); }

    void dump(std::ostream& os) const;
};

inline std::ostream& operator<<(std::ostream& os, const CoHsvColor& c) {
    c.dump(os);
    return os;
}

}  // namespace Zr
