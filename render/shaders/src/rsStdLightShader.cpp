#include "rsStdLightShader.h"

#include "rsShadingContext.h"

namespace Zr {

namespace {

// One channel of the shadow colour mix. k is how far the light is pulled towards the shadow
// colour: 0 leaves it, 1 replaces (or, multiplying, scales) it. Beyond 1 the light's own colour
// no longer counts when the shadow colour replaces it.
inline float mixChannel(float color, float shadowColor, float k, bool multiplies) {
    if (multiplies) {
        if (k < 0.0f) return color * (k + shadowColor);
        if (k > 1.0f) return color * shadowColor * k;
        return color * (1.0f - k + shadowColor * k);
    }
    if (k < 0.0f) return color + shadowColor * k;
    if (k > 1.0f) return shadowColor * k;
    return color * (1.0f - k) + shadowColor * k;
}

}  // namespace

RsStdLightShader::RsStdLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                                   const RCShdPtr<const SdStdLight>& light)
    : RsLightShader(lightId, *light),
      _light(light),
      _lightToWorld(lightToWorld),
      _decay(light->getDecay()) {}

RsStdLightShader::~RsStdLightShader() = default;

bool RsStdLightShader::applyDecay(float distance, float& strength) const {
    if (_light->_decayType == SdStdLight::DecayType::none) return true;
    const float factor = _decay.computeFactor(distance);
    // Written so that a factor that is not a number does not reach either.
    if (!(factor > 0.0f)) return false;
    strength *= factor;
    return true;
}

void RsStdLightShader::applyShadowColor(CoRgbColorTyped<float>& color,
                                        const CoRgbColorTyped<float>& shadowColor,
                                        const CoRgbColorTyped<float>& shadow) const {
    const float strength = _light->_shadowStrength;
    const bool multiplies = _light->_shadowColorMultiplies;
    color.r = mixChannel(color.r, shadowColor.r, (1.0f - shadow.r) * strength, multiplies);
    color.g = mixChannel(color.g, shadowColor.g, (1.0f - shadow.g) * strength, multiplies);
    color.b = mixChannel(color.b, shadowColor.b, (1.0f - shadow.b) * strength, multiplies);
}

void RsStdLightShader::applyShadowColor(CoRgbColorTyped<float>& color,
                                        const CoRgbColorTyped<float>& shadowColor,
                                        float shadow) const {
    const float k = (1.0f - shadow) * _light->_shadowStrength;
    const bool multiplies = _light->_shadowColorMultiplies;
    color.r = mixChannel(color.r, shadowColor.r, k, multiplies);
    color.g = mixChannel(color.g, shadowColor.g, k, multiplies);
    color.b = mixChannel(color.b, shadowColor.b, k, multiplies);
}

CoRgbColorTyped<float> RsStdLightShader::evaluateShadow(const RsShadingContext& context) const {
    if (_shadowEvaluator == nullptr) return CoRgbColorTyped<float>(1.0f);
    return _shadowEvaluator->computeBestShadow(context._eyeCoord);
}

bool RsStdLightShader::applyShadowStep(const RsShadingContext& context,
                                       Illumination& illumination, float strength) const {
    const SdStdLight& light = *_light;
    illumination._color = light._color;
    if (context._receivesShadows) {
        const CoRgbColorTyped<float> factors = evaluateShadow(context);
        // A fully lit point keeps the light's colour exactly.
        if (factors.getMin() < 1.0f) applyShadowColor(illumination._color, light._shadowColor, factors);
    }
    illumination._color *= strength;
    return true;
}

void RsStdLightShader::dump(std::ostream& os) const {
    os << " _lightId: " << _lightId << " _linkMode: " << static_cast<int>(_linkMode)
       << " _emitAmbient: " << _emitAmbient << " _emitDiffuse: " << _emitDiffuse
       << " _emitSpecular: " << _emitSpecular << " _lockCount: " << _lockCount
       << " _light: " << static_cast<const void*>(_light.get()) << " _lightToWorld:";
    _lightToWorld.dump(os);
    os << " _decay:";
    _decay.dump(os);
    os << " _shadowEvaluator: " << static_cast<const void*>(_shadowEvaluator);
}

CoRgbColorTyped<float> RsStdLightShader::shadow(const RsShadingContext& context) {
    CoRgbColorTyped<float> passed(1.0f);
    const CoRgbColorTyped<float> factors = evaluateShadow(context);
    if (factors.getMin() < 1.0f) applyShadowColor(passed, _light->_shadowColor, factors);
    return passed;
}

}  // namespace Zr
