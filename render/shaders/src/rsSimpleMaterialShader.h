#pragma once
// The shader of materials that are not lit but still mirror their surroundings: the flat diffuse
// colour with the standard shader's environment - irradiance by the normal, the diffuse map over
// both, reflection and refraction on top - and its bump map. It reads only the parts of the
// shading context that its maps need.
#include "rsEnvironmentShader.h"

namespace Zr {

class RsSimpleMaterialShader : public RsEnvironmentShader {
public:
    explicit RsSimpleMaterialShader(const RCShdPtr<const SdMaterial>& material);

    // (colour + irradiance) x diffuse map + reflection + refraction; alpha is the opacity times
    // the diffuse map's alpha. Writes the last lookup position into the context's _texCoord and
    // the bumped normal into its _normal.
    CoRgbaColorTyped<float> shade(RsShadingContext& context) override;
};

}  // namespace Zr
