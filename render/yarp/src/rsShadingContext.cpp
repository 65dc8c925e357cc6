#include "rsShadingContext.h"

#include <cmath>
#include <limits>

#include "sdTextureSampler.h"

namespace Zr {

GeVector3<float> RsShadingContext::computeViewVector() const {
    if (_orthographic) return -_viewDirection;
    return normalizeOrZero(-_eyeCoord.toVector());
}

void RsShadingContext::applyBumpMap(const SdTextureSampler& bumpSampler, float weight) {
    // A zero weight also kept the tangent bit out of the material's mask, so the frame may hold
    // stale values: nothing of it may be read then.
    if (!(std::fabs(weight) > std::numeric_limits<float>::min())) return;

    const CoRgbaColorTyped<float> sample = bumpSampler.sample(_texCoord, _texCoordDerivatives);
    const float cx = sample.r - 0.5f;
    const float cy = sample.g - 0.5f;
    const float cz = sample.b - 0.5f;

    // The sampled direction taken from tangent space into eye space.
    const GeVector3<float> bumped =
        normalizeOrZero(_tangent * cx + _binormal * cy + _normal * cz);
    _normal = normalizeOrZero(_normal + (bumped - _normal) * weight);
}

void RsShadingContext::dump(std::ostream& os) const {
    os << " _receivesShadows: " << _receivesShadows << " _orthographic: " << _orthographic
       << " _viewDirection:";
    _viewDirection.dump(os);
    os << " _eyeCoord:";
    _eyeCoord.dump(os);
    os << " _dEyeCoord_dx:";
    _dEyeCoord_dx.dump(os);
    os << " _dEyeCoord_dy:";
    _dEyeCoord_dy.dump(os);
    os << " _normal:";
    _normal.dump(os);
    os << " _tangent:";
    _tangent.dump(os);
    os << " _binormal:";
    _binormal.dump(os);
    os << " _texCoord:";
    _texCoord.dump(os);
    os << " _texCoordDerivatives:";
    _texCoordDerivatives.dump(os);
    os << " _ambient:";
    _ambient.dump(os);
}

}  // namespace Zr
