// The scene builder, through probe builders of probe materials and lights; the standard builders.
#include <gtest/gtest.h>

#include "rsDirectLightShader.h"
#include "rsNoShadeMaterialShader.h"
#include "rsOmniLightShader.h"
#include "rsSceneBuilder.h"
#include "rsSceneRegistry.h"
#include "rsShadowMatteShader.h"
#include "rsShadowShader.h"
#include "rsSimpleMaterialShader.h"
#include "rsSpotLightShader.h"
#include "rsStdMaterialShader.h"
#include "rsTestSupport.h"
#include "sdMeshGeometry.h"
#include "sdStdLight.h"

namespace Zr {
namespace {

struct ProbeMaterial : SdMaterial {
    using RttiClassType = RttiGenType1<ProbeMaterial, SdMaterial>;
    const RttiType<SdMaterial>& getType() const override { return RttiClassType::getInstance(); }
};
struct ProbeLight : SdLight {
    explicit ProbeLight(bool enabled = true) { _enabled = enabled; }
    using RttiClassType = RttiGenType1<ProbeLight, SdLight>;
    const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }
};

// What probes saw: builds ('m', 's', 'l': instance, scene builder), inits ('i': scene, served, lights).
using Event = std::tuple<char, const void*, const void*, const void*, std::size_t>;
std::vector<Event> events;
void initialised(const void* shader, const RCShdPtr<RsScene>& s, const void* served) {
    events.emplace_back('i', shader, s.get(), served, s->_lights.size());
}

struct ProbeShader : RsMaterialShader {
    ProbeShader(const SdInstance&, const RCShdPtr<const SdMaterial>& m) : RsMaterialShader(m) {}
    void initialize(RCShdPtr<RsScene>& s, RCShdPtr<const RsGeomInstance>& g) override { initialised(this, s, g.get()); }
    Rgba shade(RsShadingContext&) override { return {}; } unsigned int getNeededContext() const override { return 0; }
    void lockMemoryImpl() override {} void unlockMemoryImpl() override {}
};
struct ProbeLightShader : RsLightShader {
    ProbeLightShader(const SdInstance& i, const RCShdPtr<const SdLight>& l) : RsLightShader(i.getLightNumber(), *l) {}
    void initialize(const RCShdPtr<RsScene>& s) override { initialised(this, s, nullptr); }
    void setupRender(const GeAffineMatrix3<float>&) override {}
    void initializeMaps(const RCShdPtr<RsScene>&) override {}
    bool illuminate(const RsShadingContext&, Illumination&) const override { return false; }
    CoRgbColorTyped<float> shadow(const RsShadingContext&) override { return {1, 1, 1}; }
    void lockMemoryImpl() override {} void unlockMemoryImpl() override {}
};

template <char kWhat, class Object = std::conditional_t<kWhat == 'l', const SdLight, const SdMaterial>,
          class Shader = std::conditional_t<kWhat == 'l', RsLightShader, RsMaterialShader>>
struct ProbeBuilder : RsShaderBuilder<Object, Shader> {
    RCShdPtr<RsShaderBuilder<Object, Shader>> clone() const override { return makeShared<ProbeBuilder>(); }
    RCShdPtr<Shader> build(const RCShdPtr<const SdInstance>& instance, const RCShdPtr<Object>& object,
                           const RCShdPtr<RsSceneBuilder>& sceneBuilder) override {
        const RCShdPtr<Shader> shader =
            makeShared<std::conditional_t<kWhat == 'l', ProbeLightShader, ProbeShader>>(*instance, object);
        events.emplace_back(kWhat, shader.get(), instance.get(), sceneBuilder.get(), 0);
        return shader;
    }
};

[[maybe_unused]] const bool probesRegistered = [] {
    RsSceneRegistry& r = RsSceneRegistry::getInstance();
    r.registerBuilder(ProbeMaterial::RttiClassType::getInstance(), makeShared<ProbeBuilder<'m'>>());
    r.registerShadowShaderBuilder(ProbeMaterial::RttiClassType::getInstance(), makeShared<ProbeBuilder<'s'>>());
    r.registerBuilder(ProbeLight::RttiClassType::getInstance(), makeShared<ProbeBuilder<'l'>>());
    return true;
}();

using Materials = std::vector<RCShdPtr<const SdMaterial>>;

RCShdPtr<SdInstance> placed(const RCShdPtr<SdObject>& object, const Materials& ms = {}, unsigned n = 0, float x = 0) {
    RCShdPtr<SdInstance> instance = makeShared<SdInstance>(object, GeAffineMatrix3<float>::makeTranslation({x, 0, 0}));
    instance->setMaterials(ms);
    instance->setLightNumber(n);
    return instance;
}
RCShdPtr<SdObject> shape(const RCShdPtr<const SdMesh>& mesh = RsTest::makeBoxMesh({0, 0, 0}, {1, 1, 1})) {
    return makeShared<SdMeshGeometry>(mesh);
}

// Shaders and shadow shaders per material per instance, enabled lights and cameras in list order, derived
// mesh data per instance; material shaders initialised once, before any light; shadow shaders kept.
TEST(RsSceneBuilderTest, SceneHasAShaderPerMaterialPerInstanceInitialisedBeforeTheLights) {
    const RCShdPtr<const SdMaterial> a = makeShared<ProbeMaterial>(), b = makeShared<ProbeMaterial>();
    const std::vector<Materials> materials = {{a, b, a}, {a}, {}};
    const RCShdPtr<SdScene> description = makeShared<SdScene>();
    const RCShdPtr<const SdMesh> box = RsTest::makeBoxMesh({0, 0, 0}, {1, 1, 1}), bare = SdMeshBuilder()
        .setVertices({{0, 0, 0}, {1, 0, 0}, {0, 1, 0}}).setTriangles({0, 1, 2}).buildWithoutDerivedData();
    const RCShdPtr<SdObject> shapes[] = {shape(bare), shape(bare), shape(box)};
    for (int i = 0; i < 3; ++i) description->addGeometry(placed(shapes[i], materials[i], 0, float(i)));
    description->getGeometry()[0]->setLightTable({3, 1, 3});
    SdInstanceAttributes& attributes = description->getGeometry()[0]->getAttributes();
    attributes._renderOrder = 9, attributes._castsShadows = false, attributes._drawBackFaces = false;
    description->addCamera(placed(makeShared<SdCamera>()));
    for (unsigned int n : {5, 6, 7}) description->addLight(placed(makeShared<ProbeLight>(n != 6), {}, n));
    const RCShdPtr<RsSceneBuilder> builder = makeShared<RsSceneBuilder>();
    events.clear();
    builder->addScene(description);
    const RsSceneBuilder::MaterialShaderList shadows = builder->getShadowShaders();
    const RCShdPtr<RsScene> scene = builder->createRendererScene();

    const RsScene::GeomInstanceList& g = scene->_geomInstances;
    ASSERT_TRUE(g.size() == 3 && scene->_lights.size() == 2);
    std::vector<Event> built, initialised;
    for (std::size_t i = 0; i < 3; ++i) {
        EXPECT_EQ(g[i]->_matrix.getTranslation().x, float(i));
        ASSERT_EQ(g[i]->_materials.size() + g[i]->_shadowMaterials.size(), 2 * materials[i].size());
        for (std::size_t k = 0; k < materials[i].size(); ++k) {
            const RsMaterialShader *shader = g[i]->_materials[k].get(), *shadow = g[i]->_shadowMaterials[k].get();
            EXPECT_TRUE(shader->getMaterial() == materials[i][k] && shadow->getMaterial() == materials[i][k]);
            built.emplace_back('m', shader, description->getGeometry()[i].get(), builder.get(), 0);
            built.emplace_back('s', shadow, description->getGeometry()[i].get(), builder.get(), 0);
            initialised.emplace_back('i', shader, scene.get(), g[i].get(), 2);
        }
    }
    for (int l = 0; l < 2; ++l) {
        built.emplace_back('l', scene->_lights[l].get(), description->getLights()[2 * l].get(), builder.get(), 0);
        initialised.emplace_back('i', scene->_lights[l].get(), scene.get(), nullptr, 2);
    }
    built.insert(built.end(), initialised.begin(), initialised.end());
    EXPECT_TRUE(g[0]->_mesh->hasDerivedData() && g[1]->_mesh->hasDerivedData() && g[0]->_mesh != g[1]->_mesh);
    EXPECT_TRUE(dynamic_cast<const SdGeometry&>(*shapes[0]).getMesh() == bare && g[2]->_mesh == box);
    EXPECT_EQ(g[0]->getAttributes(), description->getGeometry()[0]->getAttributes());
    EXPECT_EQ(g[0]->_lights, (RsGeomInstance::LightSet{1, 3}));
    EXPECT_EQ(scene->_cameras, (RsScene::CameraList{description->getCameras()[0]}));
    EXPECT_TRUE(events == built && builder->getMaterialShaders().empty() && builder->getShadowShaders() == shadows);
}

// By kind, passing over no mesh, no faces, no object; a builder on the stack hands builders null.
TEST(RsSceneBuilderTest, AnInstanceIsTakenByItsKind) {
    const Materials one{makeShared<ProbeMaterial>()};
    const RCShdPtr<const SdMesh> noFaces = SdMeshBuilder().setVertices({{0, 0, 0}}).build();
    const RCShdPtr<SdInstance> camera = placed(makeShared<SdCamera>()), light = placed(makeShared<ProbeLight>());
    RsSceneBuilder b;
    for (const RCShdPtr<SdInstance>& instance : {placed(shape(nullptr), one), placed(shape(noFaces), one),
                                                 placed(nullptr, one), placed(shape(), one), camera, light})
        b.add(instance);
    EXPECT_TRUE(b.getGeomInstances().size() == 1 && b.getLights().size() == 1 && b.getCameras().size() == 1 &&
                b.getMaterialShaders().size() == 1 && b.getShadowShaders().size() == 1);
    EXPECT_EQ(std::get<3>(events.back()), nullptr);
    EXPECT_THROW(b.add(placed(makeShared<SdMaterial>())), ExProgramAborted);
    EXPECT_THROW(b.add(RCShdPtr<const SdInstance>()), ExNullPtr);
    const RCShdPtr<SdScene> wrong[] = {makeShared<SdScene>(), makeShared<SdScene>(), makeShared<SdScene>()};
    wrong[0]->addGeometry(camera), wrong[1]->addCamera(light), wrong[2]->addLight(placed(shape()));
    for (const RCShdPtr<SdScene>& scene : wrong) EXPECT_THROW(RsSceneBuilder().addScene(scene), ExCastFailed);
}

// Registered at load: material shaders by shading model, shadow shaders, light shaders by kind.
TEST(RsSceneBuilderTest, StandardBuilders) {
    const RsSceneRegistry& r = RsSceneRegistry::getInstance();
    const RttiType<SdMaterial>& base = SdMaterial::RttiClassType::getInstance();
    const std::type_info* byModel[] = {nullptr, &typeid(RsNoShadeMaterialShader), &typeid(RsSimpleMaterialShader),
                                       &typeid(RsStdMaterialShader), &typeid(RsShadowMatteShader), nullptr};
    for (int model = -1; model <= 4; ++model) {
        const RCShdPtr<SdMaterial> material = makeShared<SdMaterial>();
        material->_shadingModel = SdMaterial::ShadingModel(model);
        const RCShdPtr<RsMaterialShader> shadow = r.getShadowShaderBuilder(base)->build(nullptr, material, nullptr);
        const RCShdPtr<RsMaterialShader> shader = r.getMaterialShaderBuilder(base)->build(nullptr, material, nullptr);
        EXPECT_TRUE(typeid(*shadow) == typeid(RsShadowShader) && shadow->getMaterial() == material);
        ASSERT_EQ(shader.isNull(), byModel[model + 1] == nullptr) << model;
        EXPECT_TRUE(shader.isNull() || (typeid(*shader) == *byModel[model + 1] && shader->getMaterial() == material));
    }
    const std::type_info* byKind[] = {&typeid(RsDirectLightShader), &typeid(RsOmniLightShader),
                                      &typeid(RsSpotLightShader)};
    const RCShdPtr<RsLightShaderBuilder> lights = r.getLightShaderBuilder(SdStdLight().getType());
    RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
    for (int kind = 0; kind < 3; ++kind, light = makeShared<SdStdLight>()) {
        light->_kind = SdStdLight::Kind(kind);
        const RCShdPtr<RsLightShader> shader = lights->build(placed(light, {}, 11 + kind), light, nullptr);
        EXPECT_TRUE(typeid(*shader) == *byKind[kind] && shader->_lightId == 11u + kind) << kind;
        EXPECT_EQ(dynamic_cast<RsStdLightShader&>(*shader).getLight(), light);
    }
    light->_kind = SdStdLight::Kind(3);
    EXPECT_THROW(lights->build(placed(light), light, nullptr), ExProgramAborted);
    EXPECT_THROW(lights->build(placed(light), makeShared<ProbeLight>(), nullptr), ExAssertionFailed);
}

}  // namespace
}  // namespace Zr
