#include "rsOmniLightShader.h"

#include "rsShadingContext.h"

namespace Zr {

RsOmniLightShader::RsOmniLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                                     const RCShdPtr<const SdStdLight>& light)
    : RsStdLightShader(lightId, lightToWorld, light) {
    setUpShadowMap(_shadowMap);
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
}

}  // namespace Zr
