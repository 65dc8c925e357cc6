#pragma once
// The maker of the shaders of one kind of described object: material shaders from materials,
// light shaders from lights. Packages register a builder per run-time type of material or light
// in the scene registry (RsSceneRegistry), and the scene builder asks it for a shader of each
// material of each instance and of each enabled light, so that the renderer's core knows no
// concrete shader.
//
// Object is const SdMaterial or const SdLight; Shader is RsMaterialShader or RsLightShader.
// Builders hold no data: the registry stores one and hands each caller a clone.
//
// The order of the virtual operations is fixed, for builders compiled against earlier builds.
#include "rcBase.h"
#include "rcShdPtr.h"
#include "rsLightShader.h"
#include "rsMaterialShader.h"
#include "sdInstance.h"
#include "sdLight.h"
#include "sdMaterial.h"

namespace Zr {

class RsSceneBuilder;

template <class Object, class Shader>
class RsShaderBuilder : public RCObject {
public:
    ~RsShaderBuilder() override = default;

    // A new builder of the same class.
    virtual RCShdPtr<RsShaderBuilder> clone() const = 0;
    // The shader of object as placed by instance. sceneBuilder is the scene builder asking, for
    // builders that need to call back into it; it is null when that builder is not held by a
    // shared pointer. A builder may answer null when it has no shader for the object.
    virtual RCShdPtr<Shader> build(const RCShdPtr<const SdInstance>& instance, const RCShdPtr<Object>& object,
                                   const RCShdPtr<RsSceneBuilder>& sceneBuilder) = 0;

protected:
    RsShaderBuilder() = default;
    RsShaderBuilder(const RsShaderBuilder&) = default;
    RsShaderBuilder& operator=(const RsShaderBuilder&) = default;
};

using RsMaterialShaderBuilder = RsShaderBuilder<const SdMaterial, RsMaterialShader>;
using RsLightShaderBuilder = RsShaderBuilder<const SdLight, RsLightShader>;

}  // namespace Zr
