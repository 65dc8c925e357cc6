#pragma once
// The material shader of the zrender host and its own kind of material: the example of how a host
// extends the renderer with a shader and a material of its own.
//
// A host derives from RsMaterialShader and answers four questions:
// - shade: the colour of one fragment, from the shading context. Alpha is straight: the renderer
//   composites the colour through the material's transfer mode, which the base class read from
//   the material together with the wire-frame settings.
// - getNeededContext: which members of the context shade reads. The renderer interpolates only
//   those, so the mask must name every member used.
// - lockMemoryImpl / unlockMemoryImpl: where a shader with texture maps makes its samplers and
//   releases their tiles. This one has no maps, so both do nothing.
//
// The look is plain diffuse lighting from one fixed light in eye space (above the viewer's left
// shoulder, so it moves with the camera), plus a constant ambient share so that faces turned
// away from the light are not black. The renderer turns the normals of faces seen from behind
// towards the viewer, so the inside of a transparent object is lit like its outside.
#include "coRgbColorTyped.h"
#include "rsMaterialShader.h"
#include "rttiGenType.h"
#include "sdMaterial.h"

namespace Zr {

// The host's own kind of material, which ZrDiffuseShader draws: a subtype of SdMaterial with a
// run-time type of its own. A shader builder registered for that type in the scene registry makes
// the shader wherever a scene builder meets such a material; its shadow shader is the standard
// one, which the registry finds through the type's ancestor, SdMaterial.
class ZrDiffuseMaterial : public SdMaterial {
public:
    // Registers the builder of ZrDiffuseShader for this type with the process's scene registry;
    // later calls do nothing. Call it before building a scene that uses the material.
    static void registerShaderBuilder();

    using RttiClassType = RttiGenType1<ZrDiffuseMaterial, SdMaterial>;
    const RttiType<SdMaterial>& getType() const override { return RttiClassType::getInstance(); }
};

class ZrDiffuseShader : public RsMaterialShader {
public:
    explicit ZrDiffuseShader(const RCShdPtr<const SdMaterial>& material);

    CoRgbaColorTyped<float> shade(RsShadingContext& context) override;
    // shade reads the normal only.
    unsigned int getNeededContext() const override { return RsShadingContext::needsNormal; }

protected:
    void lockMemoryImpl() override {}
    void unlockMemoryImpl() override {}

private:
    // Copied from the material once, so that shade reads nothing through pointers.
    CoRgbColorTyped<float> _diffuse;
    float _opacity;
};

}  // namespace Zr
