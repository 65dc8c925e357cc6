#include "rsOmniLightShader.h"

#include "rsShadingContext.h"

namespace Zr {

RsOmniLightShader::RsOmniLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                                     const RCShdPtr<const SdStdLight>& light)
    : RsStdLightShader(lightId, lightToWorld, light) {
    setUpShadowMap(_shadowMap, _deepShadowMap);
}

const RsShadowEvaluator* RsOmniLightShader::renderShadowMaps(const RCShdPtr<RsScene>& scene,
                                                             SdStdLight::ShadowMapType type) {
    return renderCubeMaps(scene, type, _shadowMap, _deepShadowMap);
}

RsOmniLightShader::~RsOmniLightShader() = default;

bool RsOmniLightShader::illuminate(const RsShadingContext& context, Illumination& illumination) const {
    const GeVector3<float> toLight = _position - context._eyeCoord;
    const float distance = toLight.length();
    // Not normalised, so only its sign counts: a fragment at the light itself is turned away.
    const float facing = context._normal.dot(toLight);
    if (distance != 0.0f) illumination._direction = toLight / distance;
    illumination._cosine = facing / distance;
    return illuminateFacing(context, facing, distance, illumination);
}

void RsOmniLightShader::dump(std::ostream& os) const {
    RsStdLightShader::dump(os);
    os << " _shadowMap:";
    _shadowMap.dump(os);
    os << " _deepShadowMap:";
    _deepShadowMap.dump(os);
}

}  // namespace Zr
