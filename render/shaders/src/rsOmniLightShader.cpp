#include "rsOmniLightShader.h"

#include <cmath>

#include "rcExUtil.h"
#include "rsShadingContext.h"

namespace Zr {

RsOmniLightShader::RsOmniLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                                     const RCShdPtr<const SdStdLight>& light)
    : RsStdLightShader(lightId, lightToWorld, light) {
    _shadowMap.setSize(static_cast<float>(light->_shadowMapSize));
    _shadowMap.setBias(light->_shadowBias);
    _shadowMap.setRange(light->_shadowRange);
}

RsOmniLightShader::~RsOmniLightShader() = default;

void RsOmniLightShader::setupRender(const GeAffineMatrix3<float>& worldToCamera) {
    const GeAffineMatrix3<float> lightToCamera = worldToCamera * _lightToWorld;
    _position = GePoint3<float>(lightToCamera.getTranslation());
    _cameraToLight = lightToCamera.computeInverse();
}

void RsOmniLightShader::initializeMaps(const RCShdPtr<RsScene>&) {
    if (!_light) RCExUtil::throwExNullPtr("SdStdLight");
}

bool RsOmniLightShader::illuminate(const RsShadingContext& context, Illumination& illumination) const {
    const SdStdLight& light = *_light;
    float strength = light._intensity;
    const GeVector3<float> toLight = _position - context._eyeCoord;
    // Not normalised: only the sign matters here.
    const float facing = context._normal.dot(toLight);

    if (facing <= 0.0f) {
        // Turned away (or lit from within its own plane): no direct light, but the ambient term
        // still counts the falloff.
        if (_emitAmbient) {
            if (!applyDecay(toLight.length(), strength)) {
                illumination._ambient = CoRgbColorTyped<float>(0.0f);
                return false;
            }
            illumination._ambient = light._color * strength;
        }
        return false;
    }

    const float distance = toLight.length();
    if (distance != 0.0f) illumination._direction = toLight / distance;
    if (!applyDecay(distance, strength)) return false;

    illumination._cosine = facing / distance;
    illumination._ambient = light._color * strength;
    return applyShadowStep(context, illumination, strength);
}

void RsOmniLightShader::dump(std::ostream& os) const {
    RsStdLightShader::dump(os);
    os << " _shadowMap:";
    _shadowMap.dump(os);
    os << " _cameraToLight:";
    _cameraToLight.dump(os);
    os << " _position:";
    _position.dump(os);
}

void RsOmniLightShader::lockMemoryImpl() {}

void RsOmniLightShader::unlockMemoryImpl() {}

}  // namespace Zr
