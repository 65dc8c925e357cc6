#pragma once
// The process-wide registry of shader builders, by the run-time type of the described object:
// one registry of material shader builders, one of shadow shader builders (both keyed by the
// material hierarchy) and one of light shader builders (keyed by the SdObject hierarchy, where
// the lights live). The "shaders" package fills it with the standard builders when the library
// loads; hosts may register builders for their own material and light classes. A type without a
// builder of its own gets the one of its nearest registered ancestor.
//
// Lookups hand out a fresh clone of the stored builder. Registering the same type twice in one of
// the three registries fails with SdEx::ExDoubleRegistration and keeps the first builder; the
// same type in the material and the shadow registries is no clash. A type that neither it nor an
// ancestor has a builder for fails with SdEx::ExCantResolveBuilder.
//
// There is no lock: registration happens at package start, before any render, and lookups read.
#include "rcShdPtr.h"
#include "rsShaderBuilder.h"
#include "rttiType.h"
#include "sdMaterial.h"
#include "sdObject.h"
#include "sdSceneRegistry.h"

namespace Zr {

class RsSceneRegistry {
public:
    using MaterialShaderBuilderPtr = RCShdPtr<RsMaterialShaderBuilder>;
    using LightShaderBuilderPtr = RCShdPtr<RsLightShaderBuilder>;

    // Empty registries. The library uses the one of getInstance; other objects serve tests.
    RsSceneRegistry();
    ~RsSceneRegistry();
    RsSceneRegistry(const RsSceneRegistry&) = delete;
    RsSceneRegistry& operator=(const RsSceneRegistry&) = delete;

    // The process's registry, made on first demand. After the singletons were destroyed at the
    // end of the process it fails with ExNullPtr.
    static RsSceneRegistry& getInstance();

    void registerBuilder(const RttiType<SdMaterial>& type, const MaterialShaderBuilderPtr& builder);
    void registerShadowShaderBuilder(const RttiType<SdMaterial>& type, const MaterialShaderBuilderPtr& builder);
    void registerBuilder(const RttiType<SdObject>& type, const LightShaderBuilderPtr& builder);

    MaterialShaderBuilderPtr getMaterialShaderBuilder(const RttiType<SdMaterial>& type) const;
    MaterialShaderBuilderPtr getShadowShaderBuilder(const RttiType<SdMaterial>& type) const;
    LightShaderBuilderPtr getLightShaderBuilder(const RttiType<SdObject>& type) const;

private:
    SdSceneRegistry<SdMaterial, RsMaterialShaderBuilder> _materialShaders;
    SdSceneRegistry<SdMaterial, RsMaterialShaderBuilder> _shadowShaders;
    SdSceneRegistry<SdObject, RsLightShaderBuilder> _lightShaders;
};

}  // namespace Zr
