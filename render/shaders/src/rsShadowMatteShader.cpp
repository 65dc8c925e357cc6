#include "rsShadowMatteShader.h"

#include <algorithm>

namespace Zr {

RsShadowMatteShader::RsShadowMatteShader(const RCShdPtr<const SdMaterial>& material)
    : RsLinkedLights(material), _inverted(material->_inverted), _strength(material->_shadowStrength) {}

void RsShadowMatteShader::initialize(RCShdPtr<RsScene>& scene, RCShdPtr<const RsGeomInstance>& instance) {
    RsLinkedLights::initialize(scene, instance);
    _strength = _material->_shadowStrength;
    // Each light takes an equal share, so that a point lit by all of them shows full strength.
    if (_lights.size() > 1) _strength /= static_cast<float>(_lights.size());
}

CoRgbaColorTyped<float> RsShadowMatteShader::shade(RsShadingContext& context) {
    CoRgbColorTyped<float> sum(0.0f, 0.0f, 0.0f);
    for (const RCShdPtr<RsLightShader>& light : _lights) sum += light->shadow(context);
    CoRgbColorTyped<float> v(std::min(sum.r * _strength, 1.0f), std::min(sum.g * _strength, 1.0f),
                             std::min(sum.b * _strength, 1.0f));
    if (_inverted) v = CoRgbColorTyped<float>(1.0f, 1.0f, 1.0f) - v;
    return CoRgbaColorTyped<float>(v, 1.0f);
}

unsigned int RsShadowMatteShader::getNeededContext() const { return RsShadingContext::needsEyeCoord; }

void RsShadowMatteShader::lockMemoryImpl() {}

void RsShadowMatteShader::unlockMemoryImpl() {}

void RsShadowMatteShader::dump(std::ostream& os) const {
    RsMaterialShader::dump(os);
    os << " _inverted: " << _inverted << " _strength: " << _strength << " _lights: " << _lights.size();
}

}  // namespace Zr
