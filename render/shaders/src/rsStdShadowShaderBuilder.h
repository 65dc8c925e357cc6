#pragma once
// Makes the shadow shader of a material: the shader that the lights draw an instance with when
// they render their shadow maps. Registered for SdMaterial in the shadow shader registry when the
// "shaders" package starts; every material gets an RsShadowShader.
#include "rsMaterialOnlyShaderBuilder.h"

namespace Zr {

class RsStdShadowShaderBuilder : public RsMaterialOnlyShaderBuilder<RsStdShadowShaderBuilder> {
public:
    // An RsShadowShader of material.
    static RCShdPtr<RsMaterialShader> makeShader(const RCShdPtr<const SdMaterial>& material);
};

}  // namespace Zr
