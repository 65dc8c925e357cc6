#pragma once
// Turns a scene description into the renderer's flat scene (RsScene). The host feeds it a whole
// SdScene with addScene or single instances with add, then takes the result with
// createRendererScene:
//
//   RCShdPtr<RsSceneBuilder> builder = makeShared<RsSceneBuilder>();
//   builder->addScene(scene);
//   RCShdPtr<RsScene> rendererScene = builder->createRendererScene();
//
// Each geometry instance with faces becomes an RsGeomInstance with a material shader and a
// shadow shader for each material of the instance, made anew per instance (a material shader is
// bound to the lights of its own instance when it is initialised). Each enabled light becomes a
// light shader, and camera instances are kept as they are. The shaders come from the builders
// that RsSceneRegistry holds for the run-time type of the material or light.
//
// A builder can be used again after createRendererScene: its lists are then empty, except the
// shadow shaders, which it keeps until it dies.
//
// Shader builders are handed this builder as a shared pointer, so that they can call back into
// it; a builder not held by a shared pointer (on the stack) hands them null instead, since a
// reference taken to it would delete it when dropped.
#include <vector>

#include "rcBase.h"
#include "rcShdPtr.h"
#include "rsGeomInstance.h"
#include "rsLightShader.h"
#include "rsMaterialShader.h"
#include "rsScene.h"
#include "sdCamera.h"
#include "sdGeometry.h"
#include "sdInstance.h"
#include "sdLight.h"
#include "sdMaterial.h"
#include "sdScene.h"

namespace Zr {

class RsSceneBuilder : public RCObject {
public:
    using MaterialShaderList = std::vector<RCShdPtr<RsMaterialShader>>;

    // All lists empty.
    RsSceneBuilder();
    ~RsSceneBuilder() override;
    RsSceneBuilder(const RsSceneBuilder&) = delete;
    RsSceneBuilder& operator=(const RsSceneBuilder&) = delete;

    // Adds the instances of the scene's geometry list, then of its camera list, then of its
    // light list, each in list order. An instance whose object is not of its list's kind fails
    // with ExCastFailed; what was added before stays.
    void addScene(const RCShdPtr<SdScene>& scene);

    // Adds one instance of any kind, by the kind of its object. A null instance fails with
    // ExNullPtr; an instance without an object is passed over; an object that is no light, camera
    // or geometry is a program fault (ExProgramAborted).
    void add(const RCShdPtr<const SdInstance>& instance);

    // The geometry instance made for geometry placed by instance, with its shaders; null, with
    // nothing added, when the geometry has no mesh or a mesh without faces. A mesh that lacks
    // derived data is replaced, for this instance alone, by a copy that has it.
    RCShdPtr<RsGeomInstance> add(const RCShdPtr<const SdInstance>& instance, const RCShdPtr<const SdGeometry>& geometry);
    // The light shader of an enabled light; null, with nothing added, for a disabled one.
    RCShdPtr<RsLightShader> add(const RCShdPtr<const SdInstance>& instance, const RCShdPtr<const SdLight>& light);
    // Keeps the camera's instance; the camera itself is not read.
    void add(const RCShdPtr<const SdInstance>& instance, const RCShdPtr<const SdCamera>& camera);
    // A new material shader, or shadow shader, of material for instance. Whatever the registry's
    // builder answers is kept and returned, null included.
    RCShdPtr<RsMaterialShader> add(const RCShdPtr<const SdInstance>& instance,
                                   const RCShdPtr<const SdMaterial>& material);
    RCShdPtr<RsMaterialShader> addShadow(const RCShdPtr<const SdInstance>& instance,
                                         const RCShdPtr<const SdMaterial>& material);

    // The scene of everything added so far. Initialises each instance and then the material
    // shaders of that instance, instance by instance, and after all of them the lights: a
    // material shader finds the scene's whole light list in place, and no light has been
    // initialised yet when it looks. Shadow shaders are not initialised: they need no lights.
    // Empties the builder's lists except its shadow shaders.
    RCShdPtr<RsScene> createRendererScene();

    // What has been made since the last createRendererScene (the shadow shaders since the builder
    // was made), in the order of making.
    const RsScene::GeomInstanceList& getGeomInstances() const { return _geomInstances; }
    const RsScene::LightList& getLights() const { return _lights; }
    const RsScene::CameraList& getCameras() const { return _cameras; }
    const MaterialShaderList& getMaterialShaders() const { return _materialShaders; }
    const MaterialShaderList& getShadowShaders() const { return _shadowShaders; }

private:
    // This builder as the shader builders receive it: null when no shared pointer holds it.
    RCShdPtr<RsSceneBuilder> asShared();

    RsScene::GeomInstanceList _geomInstances;
    RsScene::LightList _lights;
    RsScene::CameraList _cameras;
    MaterialShaderList _materialShaders;
    MaterialShaderList _shadowShaders;
};

}  // namespace Zr
