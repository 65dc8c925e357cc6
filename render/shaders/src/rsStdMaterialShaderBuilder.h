#pragma once
// Makes the material shader of a material by its shading model: flat colour, simple, standard
// or shadow matte. Registered for SdMaterial when the "shaders" package starts, so it serves
// every material class that brings no builder of its own.
#include "rcShdPtr.h"
#include "rsMaterialShader.h"
#include "rsShaderBuilder.h"
#include "sdInstance.h"
#include "sdMaterial.h"

namespace Zr {

class RsStdMaterialShaderBuilder : public RsMaterialShaderBuilder {
public:
    RsStdMaterialShaderBuilder();
    ~RsStdMaterialShaderBuilder() override;

    RCShdPtr<RsMaterialShaderBuilder> clone() const override;
    // The shader of the material's shading model; null for a model outside the four, without a
    // failure. instance and sceneBuilder are not used.
    RCShdPtr<RsMaterialShader> build(const RCShdPtr<const SdInstance>& instance,
                                     const RCShdPtr<const SdMaterial>& material,
                                     const RCShdPtr<RsSceneBuilder>& sceneBuilder) override;
};

}  // namespace Zr
