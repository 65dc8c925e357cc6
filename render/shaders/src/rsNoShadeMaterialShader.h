#pragma once
// The shader of materials that are not lit: the material's diffuse colour and opacity, times the
// diffuse map. Without a map it needs nothing of the shading context, so the plainest drawing
// path serves it.
#include "rsDiffuseMapShader.h"

namespace Zr {

class RsNoShadeMaterialShader : public RsDiffuseMapShader {
public:
    explicit RsNoShadeMaterialShader(const RCShdPtr<const SdMaterial>& material);

    // The flat colour times the diffuse map's sample, all four channels.
    CoRgbaColorTyped<float> shade(RsShadingContext& context) override;
};

}  // namespace Zr
