#pragma once
// A kind of material of the host's own, drawn by ZrDiffuseShader: the example of how a host adds
// a material kind to the renderer. The material is a subtype of SdMaterial with a run-time type of
// its own; a shader builder registered for that type in the scene registry makes the shader
// whenever a scene builder meets such a material. Its shadow shader is the standard one, which the
// registry finds through the type's ancestor, SdMaterial.
#include "rttiGenType.h"
#include "sdMaterial.h"

namespace Zr {

class ZrDiffuseMaterial : public SdMaterial {
public:
    using RttiClassType = RttiGenType1<ZrDiffuseMaterial, SdMaterial>;
    const RttiType<SdMaterial>& getType() const override { return RttiClassType::getInstance(); }

    // Registers the builder of ZrDiffuseShader for this type with the process's scene registry;
    // later calls do nothing. Call it before building a scene that uses the material.
    static void registerShaderBuilder();
};

}  // namespace Zr
