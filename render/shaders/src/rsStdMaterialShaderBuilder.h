#pragma once
// Makes the material shader of a material by its shading model: flat colour, simple, standard
// or shadow matte. Registered for SdMaterial when the "shaders" package starts, so it serves
// every material class that brings no builder of its own.
#include "rsMaterialOnlyShaderBuilder.h"

namespace Zr {

class RsStdMaterialShaderBuilder : public RsMaterialOnlyShaderBuilder<RsStdMaterialShaderBuilder> {
public:
    // The shader of the material's shading model; null for a model outside the four, without a
    // failure.
    static RCShdPtr<RsMaterialShader> makeShader(const RCShdPtr<const SdMaterial>& material);
};

}  // namespace Zr
