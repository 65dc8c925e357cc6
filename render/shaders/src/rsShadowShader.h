#pragma once
// What a material lets through when its instance is drawn from a light into a deep shadow map: a
// transmittance rather than a colour. A clear surface passes white and has no alpha, an opaque
// one passes black; a partly clear one passes light tinted by its diffuse colour (and map).
#include "rsDiffuseMapShader.h"

namespace Zr {

class RsShadowShader : public RsDiffuseMapShader {
public:
    explicit RsShadowShader(const RCShdPtr<const SdMaterial>& material);

    // With a = opacity x the map's alpha and u = 1 - a: each colour channel is
    // (colour x map x a + u) x u, and alpha is a.
    CoRgbaColorTyped<float> shade(RsShadingContext& context) override;
};

}  // namespace Zr
