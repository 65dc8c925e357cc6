#pragma once
// A point light: it shines from the origin of its instance's space in all directions, so the
// light's direction at a fragment is the way from the fragment to that point, and its falloff
// counts the distance between them. Its shadow is a cube of six maps around the light, of depths or of transmittances.
#include <ostream>

#include "geAffineMatrix3.h"
#include "rsCubeDeepShadowMap.h"
#include "rsCubeShadowMap.h"
#include "rsStdLightShader.h"

namespace Zr {

class RsOmniLightShader : public RsStdLightShader {
public:
    // lightId is the number of the light's instance, lightToWorld its matrix. The cube map takes
    // its size, bias and filter range from the light; a null light is reported as a null pointer
    // failure.
    RsOmniLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                      const RCShdPtr<const SdStdLight>& light);
    ~RsOmniLightShader() override;

    bool illuminate(const RsShadingContext& context, Illumination& illumination) const override;

    const RsCubeShadowMap& getShadowMap() const { return _shadowMap; }
    RsCubeShadowMap& getShadowMap() { return _shadowMap; }
    const RsCubeDeepShadowMap& getDeepShadowMap() const { return _deepShadowMap; }
    RsCubeDeepShadowMap& getDeepShadowMap() { return _deepShadowMap; }

    // What RsStdLightShader::dump prints, then the shadow map; for diagnostics.
    void dump(std::ostream& os) const;

protected:
    // Six passes around the light, one per cube face.
    const RsShadowEvaluator* renderShadowMaps(const RCShdPtr<RsScene>& scene, SdStdLight::ShadowMapType type) override;

    RsCubeShadowMap _shadowMap;
    RsCubeDeepShadowMap _deepShadowMap;
};

}  // namespace Zr
