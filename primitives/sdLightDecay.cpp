#include "sdLightDecay.h"

namespace Zr {

SdLightDecay::SdLightDecay(bool quadratic, float parameter) : _hasQuadratic(quadratic) {
    // The comparison is false for NaN too, which therefore also means no falloff.
    if (!(parameter > 0.0f)) return;
    if (quadratic) {
        _quadratic = 1.0f / (parameter * parameter);
    } else {
        _linear = 1.0f / parameter;
    }
}

float SdLightDecay::computeFactor(float distance) const {
    float slope = _linear;
    if (_hasQuadratic) slope += _quadratic * distance;
    return 1.0f / (_constant + distance * slope);
}

void SdLightDecay::dump(std::ostream& os) const {
    os << " _hasQuadratic: " << _hasQuadratic << " _constant: " << _constant
       << " _linear: " << _linear << " _quadratic: " << _quadratic;
}

}  // namespace Zr
