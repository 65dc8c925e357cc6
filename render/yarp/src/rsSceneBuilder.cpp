#include "rsSceneBuilder.h"

#include <typeinfo>

#include "assertions.h"
#include "rcExUtil.h"
#include "rsSceneRegistry.h"
#include "rsShaderBuilder.h"
#include "sdMesh.h"
#include "sdMeshBuilder.h"

namespace Zr {

namespace {

// Failures report this source path and these lines, fixed whatever the build layout.
constexpr const char* kSourceFile = "render\\yarp\\src\\rsSceneBuilder";
constexpr int lineUnknownKind = 132;
constexpr int lineNullLightBuilder = 213;
constexpr int lineNullMaterialBuilder = 257;
constexpr int lineNullShadowBuilder = 294;

// The object of a scene list's instance as the kind that list holds. A missing object stays
// null; an object of another kind fails with ExCastFailed naming both types.
template <class Target>
RCShdPtr<const Target> castObject(const RCShdPtr<SdObject>& object) {
    if (object.isNull()) return {};
    const SdObject& source = *object;
    const Target* target = dynamic_cast<const Target*>(&source);
    if (!target) RCExUtil::throwExCastFailed(typeid(source).name(), typeid(Target).name());
    return RCShdPtr<const Target>(target);
}

// The shader that builder makes of object for instance, kept at the end of list. A missing builder
// is an assertion failure reported at line.
template <class Object, class Shader>
RCShdPtr<Shader> buildInto(std::vector<RCShdPtr<Shader>>& list, const RCShdPtr<RsShaderBuilder<Object, Shader>>& builder,
                           int line, const RCShdPtr<const SdInstance>& instance, const RCShdPtr<Object>& object,
                           const RCShdPtr<RsSceneBuilder>& sceneBuilder) {
    if (builder.isNull()) Assertions::throwAssertionFailed(kSourceFile, line, "!builder.isNull()");
    RCShdPtr<Shader> shader = builder->build(instance, object, sceneBuilder);
    list.push_back(shader);
    return shader;
}

}  // namespace

RsSceneBuilder::RsSceneBuilder() = default;

RsSceneBuilder::~RsSceneBuilder() = default;

RCShdPtr<RsSceneBuilder> RsSceneBuilder::asShared() {
    return getReferenceCount() > 0 ? RCShdPtr<RsSceneBuilder>(this) : RCShdPtr<RsSceneBuilder>();
}

void RsSceneBuilder::addScene(const RCShdPtr<SdScene>& scene) {
    for (const RCShdPtr<SdInstance>& instance : scene->getGeometry())
        add(instance, castObject<SdGeometry>(instance->getObject()));
    for (const RCShdPtr<SdInstance>& instance : scene->getCameras())
        add(instance, castObject<SdCamera>(instance->getObject()));
    for (const RCShdPtr<SdInstance>& instance : scene->getLights())
        add(instance, castObject<SdLight>(instance->getObject()));
}

void RsSceneBuilder::add(const RCShdPtr<const SdInstance>& instance) {
    if (instance.isNull()) RCExUtil::throwExNullPtr(typeid(SdInstance).name());
    const RCShdPtr<SdObject>& object = instance->getObject();
    if (object.isNull()) return;
    if (RCShdPtr<const SdLight> light = dynamicPointerCast<const SdLight>(object); !light.isNull()) {
        add(instance, light);
    } else if (RCShdPtr<const SdCamera> camera = dynamicPointerCast<const SdCamera>(object); !camera.isNull()) {
        add(instance, camera);
    } else if (RCShdPtr<const SdGeometry> geometry = dynamicPointerCast<const SdGeometry>(object);
               !geometry.isNull()) {
        add(instance, geometry);
    } else {
        Assertions::throwProgramAborted(kSourceFile, lineUnknownKind, nullptr);
    }
}

RCShdPtr<RsGeomInstance> RsSceneBuilder::add(const RCShdPtr<const SdInstance>& instance,
                                             const RCShdPtr<const SdGeometry>& geometry) {
    RCShdPtr<const SdMesh> mesh = geometry->getMesh();
    if (mesh.isNull() || mesh->getFaceCount() == 0) return {};

    // A shader and a shadow shader per material, made anew for this instance.
    MaterialShaderList shaders;
    MaterialShaderList shadowShaders;
    for (unsigned int i = 0; i < instance->getMaterialCount(); ++i) {
        const RCShdPtr<const SdMaterial> material = instance->getMaterialOfGroup(i);
        shaders.push_back(add(instance, material));
        shadowShaders.push_back(addShadow(instance, material));
    }

    // The drawing code relies on the face normals and corner normals being there. The copy that
    // has them belongs to this instance alone; the geometry keeps its mesh.
    mesh = geometry->getMesh();
    if ((mesh->getChannelSet() & SdMesh::DERIVED_DATA) != SdMesh::DERIVED_DATA)
        mesh = SdMeshBuilder().addDerivedDataChannel(*mesh);

    RCShdPtr<RsGeomInstance> geomInstance = makeShared<RsGeomInstance>(
        instance->getMatrix(), mesh, shaders, shadowShaders, instance->getAttributes(), instance->getLightTable());
    geomInstance->_name = instance->getName();
    _geomInstances.push_back(geomInstance);
    return geomInstance;
}

RCShdPtr<RsLightShader> RsSceneBuilder::add(const RCShdPtr<const SdInstance>& instance,
                                            const RCShdPtr<const SdLight>& light) {
    if (!light->_enabled) return {};
    return buildInto(_lights, RsSceneRegistry::getInstance().getLightShaderBuilder(light->getType()),
                     lineNullLightBuilder, instance, light, asShared());
}

void RsSceneBuilder::add(const RCShdPtr<const SdInstance>& instance, const RCShdPtr<const SdCamera>& /*camera*/) {
    _cameras.push_back(instance);
}

RCShdPtr<RsMaterialShader> RsSceneBuilder::add(const RCShdPtr<const SdInstance>& instance,
                                               const RCShdPtr<const SdMaterial>& material) {
    return buildInto(_materialShaders, RsSceneRegistry::getInstance().getMaterialShaderBuilder(material->getType()),
                     lineNullMaterialBuilder, instance, material, asShared());
}

RCShdPtr<RsMaterialShader> RsSceneBuilder::addShadow(const RCShdPtr<const SdInstance>& instance,
                                                     const RCShdPtr<const SdMaterial>& material) {
    return buildInto(_shadowShaders, RsSceneRegistry::getInstance().getShadowShaderBuilder(material->getType()),
                     lineNullShadowBuilder, instance, material, asShared());
}

RCShdPtr<RsScene> RsSceneBuilder::createRendererScene() {
    // The scene takes the three lists by swapping; they are empty from here on.
    RCShdPtr<RsScene> scene = makeShared<RsScene>(_geomInstances, _lights, _cameras);
    for (RCShdPtr<RsGeomInstance>& instance : scene->_geomInstances) {
        instance->initialize(scene);
        RCShdPtr<const RsGeomInstance> served = instance;
        for (const RCShdPtr<RsMaterialShader>& shader : instance->_materials) shader->initialize(scene, served);
    }
    for (const RCShdPtr<RsLightShader>& light : scene->_lights) light->initialize(scene);

    // The shadow shaders stay until the builder dies.
    _geomInstances.clear();
    _materialShaders.clear();
    _lights.clear();
    _cameras.clear();
    return scene;
}

}  // namespace Zr
