#pragma once
// Makes the shadow shader of a material: the shader that the lights draw an instance with when
// they render their shadow maps. Registered for SdMaterial in the shadow shader registry when the
// "shaders" package starts; every material gets an RsShadowShader.
#include "rcShdPtr.h"
#include "rsMaterialShader.h"
#include "rsShaderBuilder.h"
#include "sdInstance.h"
#include "sdMaterial.h"

namespace Zr {

class RsStdShadowShaderBuilder : public RsMaterialShaderBuilder {
public:
    RsStdShadowShaderBuilder();
    ~RsStdShadowShaderBuilder() override;

    RCShdPtr<RsMaterialShaderBuilder> clone() const override;
    // An RsShadowShader of material; instance and sceneBuilder are not used.
    RCShdPtr<RsMaterialShader> build(const RCShdPtr<const SdInstance>& instance,
                                     const RCShdPtr<const SdMaterial>& material,
                                     const RCShdPtr<RsSceneBuilder>& sceneBuilder) override;
};

}  // namespace Zr
