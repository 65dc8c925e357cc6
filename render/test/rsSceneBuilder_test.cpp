// From scene description to renderer scene: the registry's separate maps, the builder's instances,
// lights and cameras in list order with a shader per material per instance, derived mesh data,
// what adds nothing, the order of initialisation and what the builder keeps afterwards. The
// shaders come from probe builders registered for probe material and light types.
#include <gtest/gtest.h>

#include <algorithm>
#include <typeinfo>
#include <type_traits>
#include <utility>
#include <vector>

#include "exBase.h"
#include "rsDirectLightShader.h"
#include "rsNoShadeMaterialShader.h"
#include "rsOmniLightShader.h"
#include "rsSceneBuilder.h"
#include "rsSceneRegistry.h"
#include "rsShadowMatteShader.h"
#include "rsShadowShader.h"
#include "rsSimpleMaterialShader.h"
#include "rsSpotLightShader.h"
#include "rsStdLightShaderBuilder.h"
#include "rsStdMaterialShader.h"
#include "rsStdMaterialShaderBuilder.h"
#include "rsStdShadowShaderBuilder.h"
#include "rsTestSupport.h"
#include "sdEx.h"
#include "sdMeshGeometry.h"
#include "sdStdLight.h"

namespace Zr {
namespace {

using namespace RsTest;

struct ProbeMaterial : SdMaterial {
    using RttiClassType = RttiGenType1<ProbeMaterial, SdMaterial>;
    const RttiType<SdMaterial>& getType() const override { return RttiClassType::getInstance(); }
};
struct ProbeLight : SdLight {
    using RttiClassType = RttiGenType1<ProbeLight, SdLight>;
    const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }
};

int lightsInitialised = 0;

// What a shader's builder was given, and its initialisations with what the scene held then.
struct Probe {
    RCShdPtr<const SdInstance> instance;
    const RsSceneBuilder* sceneBuilder = nullptr;  // not held: the builder holds the shader
    bool isShadow = false;
    int inits = 0;
    const RsScene* scene = nullptr;
    const RsGeomInstance* served = nullptr;
    std::size_t lightsInScene = 0;
    int lightsInitialisedBefore = -1;
};

struct ProbeShader : RsMaterialShader, Probe {
    using RsMaterialShader::RsMaterialShader;
    void initialize(RCShdPtr<RsScene>& s, RCShdPtr<const RsGeomInstance>& g) override {
        ++inits, scene = s.get(), served = g.get(), lightsInScene = s->_lights.size();
        lightsInitialisedBefore = lightsInitialised;
    }
    Rgba shade(RsShadingContext&) override { return {}; }
    unsigned int getNeededContext() const override { return 0; }
    void lockMemoryImpl() override {}
    void unlockMemoryImpl() override {}
};

struct ProbeLightShader : RsLightShader, Probe {
    ProbeLightShader(unsigned int id, const SdLight& light) : RsLightShader(id, light) {}
    void initialize(const RCShdPtr<RsScene>& s) override { ++inits, scene = s.get(), ++lightsInitialised; }
    void setupRender(const GeAffineMatrix3<float>&) override {}
    void initializeMaps(const RCShdPtr<RsScene>&) override {}
    bool illuminate(const RsShadingContext&, Illumination&) const override { return false; }
    CoRgbColorTyped<float> shadow(const RsShadingContext&) override { return {1, 1, 1}; }
    void lockMemoryImpl() override {}
    void unlockMemoryImpl() override {}
};

Probe& probeOf(const RCShdPtr<RsMaterialShader>& s) { return dynamic_cast<ProbeShader&>(*s); }
Probe& probeOf(const RCShdPtr<RsLightShader>& s) { return dynamic_cast<ProbeLightShader&>(*s); }

template <class Object, class Shader, bool kShadow = false>
struct ProbeBuilder : RsShaderBuilder<Object, Shader> {
    RCShdPtr<RsShaderBuilder<Object, Shader>> clone() const override { return makeShared<ProbeBuilder>(); }
    RCShdPtr<Shader> build(const RCShdPtr<const SdInstance>& instance, const RCShdPtr<Object>& object,
                           const RCShdPtr<RsSceneBuilder>& sceneBuilder) override {
        RCShdPtr<Shader> shader;
        if constexpr (std::is_same_v<Shader, RsLightShader>)
            shader = makeShared<ProbeLightShader>(instance->getLightNumber(), *object);
        else
            shader = makeShared<ProbeShader>(object);
        probeOf(shader) = Probe{instance, sceneBuilder.get(), kShadow};
        return shader;
    }
};
using MaterialBuilder = ProbeBuilder<const SdMaterial, RsMaterialShader>;
using ShadowBuilder = ProbeBuilder<const SdMaterial, RsMaterialShader, true>;
using LightBuilder = ProbeBuilder<const SdLight, RsLightShader>;

class RsSceneBuilderTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        static const bool registered = [] {
            RsSceneRegistry& r = RsSceneRegistry::getInstance();
            r.registerBuilder(ProbeMaterial::RttiClassType::getInstance(), makeShared<MaterialBuilder>());
            r.registerShadowShaderBuilder(ProbeMaterial::RttiClassType::getInstance(), makeShared<ShadowBuilder>());
            r.registerBuilder(ProbeLight::RttiClassType::getInstance(), makeShared<LightBuilder>());
            return true;
        }();
        (void)registered;
    }
    void SetUp() override { lightsInitialised = 0; }
};

using Materials = std::vector<RCShdPtr<const SdMaterial>>;

RCShdPtr<SdInstance> placed(const RCShdPtr<SdObject>& object, float x = 0.0f, const Materials& materials = {}) {
    RCShdPtr<SdInstance> instance = makeShared<SdInstance>(object, GeAffineMatrix3<float>::makeTranslation({x, 0, 0}));
    instance->setMaterials(materials);
    return instance;
}
RCShdPtr<SdInstance> geometry(const RCShdPtr<const SdMesh>& mesh, float x = 0.0f, const Materials& materials = {}) {
    return placed(makeShared<SdMeshGeometry>(mesh), x, materials);
}
RCShdPtr<SdInstance> light(bool enabled, unsigned int number) {
    RCShdPtr<ProbeLight> l = makeShared<ProbeLight>();
    l->_enabled = enabled;
    RCShdPtr<SdInstance> instance = placed(l);
    instance->setLightNumber(number);
    return instance;
}
RCShdPtr<const SdMesh> cube() { return makeBoxMesh({0, 0, 0}, {1, 1, 1}); }

// Geometry at x = 0, 1, 2 with materials [a, b, a], [a] and none; a camera; lights 5, 6 (off), 7.
struct ProbeScene {
    RCShdPtr<const SdMaterial> a = makeShared<ProbeMaterial>(), b = makeShared<ProbeMaterial>();
    RCShdPtr<SdScene> scene = makeShared<SdScene>();
    ProbeScene() {
        scene->addGeometry(geometry(cube(), 0, {a, b, a}));
        scene->addGeometry(geometry(cube(), 1, {a}));
        scene->addGeometry(geometry(cube(), 2));
        scene->getGeometry()[0]->setLightTable({3, 1, 3});
        scene->getGeometry()[0]->getAttributes()._renderOrder = 9;
        scene->addCamera(placed(makeShared<SdCamera>()));
        for (unsigned int number : {5, 6, 7}) scene->addLight(light(number != 6, number));
    }
};

TEST_F(RsSceneBuilderTest, RegistryKeepsMaterialAndShadowBuildersApart) {
    RsSceneRegistry registry;
    const RttiType<SdMaterial>& base = SdMaterial::RttiClassType::getInstance();
    registry.registerBuilder(base, makeShared<MaterialBuilder>());
    registry.registerShadowShaderBuilder(base, makeShared<ShadowBuilder>());
    const RCShdPtr<const SdMaterial> m = makeShared<ProbeMaterial>();
    EXPECT_FALSE(probeOf(registry.getMaterialShaderBuilder(m->getType())->build(nullptr, m, nullptr)).isShadow);
    EXPECT_TRUE(probeOf(registry.getShadowShaderBuilder(m->getType())->build(nullptr, m, nullptr)).isShadow);
}

TEST_F(RsSceneBuilderTest, RegistryResolvesALightOnlyAlongItsOwnAncestry) {
    RsSceneRegistry registry;
    registry.registerBuilder(SdStdLight::RttiClassType::getInstance(), makeShared<LightBuilder>());
    EXPECT_FALSE(registry.getLightShaderBuilder(SdStdLight().getType()).isNull());
    EXPECT_THROW(registry.getLightShaderBuilder(ProbeLight().getType()), SdEx::ExCantResolveBuilder);
}

TEST_F(RsSceneBuilderTest, AddSceneMakesAShaderPerMaterialPerInstanceInListOrder) {
    ProbeScene p;
    RCShdPtr<RsSceneBuilder> builder = makeShared<RsSceneBuilder>();
    builder->addScene(p.scene);
    const RsScene::GeomInstanceList& instances = builder->getGeomInstances();
    ASSERT_EQ(instances.size(), 3u);
    const std::vector<Materials> expected = {{p.a, p.b, p.a}, {p.a}, {}};
    std::vector<const RsMaterialShader*> seen;
    for (std::size_t i = 0; i < 3; ++i) {
        const RsGeomInstance& g = *instances[i];
        EXPECT_EQ(g._matrix.getTranslation().x, float(i));
        ASSERT_EQ(g._materials.size(), expected[i].size());
        ASSERT_EQ(g._shadowMaterials.size(), expected[i].size());
        for (std::size_t k = 0; k < expected[i].size(); ++k) {
            for (const RCShdPtr<RsMaterialShader>& shader : {g._materials[k], g._shadowMaterials[k]}) {
                EXPECT_EQ(shader->getMaterial(), expected[i][k]);
                EXPECT_EQ(probeOf(shader).isShadow, shader == g._shadowMaterials[k]);
                EXPECT_EQ(probeOf(shader).instance, p.scene->getGeometry()[i]);
                EXPECT_EQ(probeOf(shader).sceneBuilder, builder.get());
                seen.push_back(shader.get());
            }
        }
    }
    std::sort(seen.begin(), seen.end());
    EXPECT_EQ(std::unique(seen.begin(), seen.end()), seen.end()) << "a shader serves two places";
    EXPECT_EQ(instances[0]->getAttributes(), p.scene->getGeometry()[0]->getAttributes());
    EXPECT_EQ(instances[0]->_lights, (RsGeomInstance::LightSet{1, 3}));
    ASSERT_EQ(builder->getLights().size(), 2u);
    EXPECT_EQ(builder->getLights()[0]->_lightId, 5u);
    EXPECT_EQ(builder->getLights()[1]->_lightId, 7u);
    EXPECT_EQ(builder->getCameras(), (RsScene::CameraList{p.scene->getCameras()[0]}));
}

// Each material shader once, with its instance and every light in place but none initialised;
// then each light; no shadow shader. The builder is then empty but for its shadow shaders.
TEST_F(RsSceneBuilderTest, SceneInitialisesShadersThenLightsAndLeavesTheShadowShaders) {
    ProbeScene p;
    RsSceneBuilder builder;
    builder.addScene(p.scene);
    const RsSceneBuilder::MaterialShaderList shadows = builder.getShadowShaders();
    const RCShdPtr<RsScene> scene = builder.createRendererScene();
    ASSERT_EQ(scene->_geomInstances.size(), 3u);
    ASSERT_EQ(scene->_lights.size(), 2u);
    EXPECT_EQ(scene->_cameras.size(), 1u);
    for (const RCShdPtr<RsGeomInstance>& g : scene->_geomInstances) {
        for (const RCShdPtr<RsMaterialShader>& shader : g->_materials) {
            const Probe& probe = probeOf(shader);
            EXPECT_EQ(probe.inits, 1);
            EXPECT_EQ(probe.scene, scene.get());
            EXPECT_EQ(probe.served, g.get());
            EXPECT_EQ(probe.lightsInScene, 2u);
            EXPECT_EQ(probe.lightsInitialisedBefore, 0);
        }
    }
    for (const RCShdPtr<RsMaterialShader>& shadow : shadows) EXPECT_EQ(probeOf(shadow).inits, 0);
    for (const RCShdPtr<RsLightShader>& l : scene->_lights) EXPECT_EQ(probeOf(l).scene, scene.get());
    EXPECT_EQ(lightsInitialised, 2);

    EXPECT_TRUE(builder.getMaterialShaders().empty());
    EXPECT_EQ(builder.getShadowShaders(), shadows);
    const RCShdPtr<RsScene> again = builder.createRendererScene();
    EXPECT_TRUE(again->_geomInstances.empty() && again->_lights.empty() && again->_cameras.empty());
}

// Nothing drawable and no enabled light: no instance, shader or light, and a null answer.
TEST_F(RsSceneBuilderTest, WhatCannotBeDrawnOrLitAddsNothing) {
    const Materials one{makeShared<ProbeMaterial>()};
    const RCShdPtr<const SdMesh> noFaces = SdMeshBuilder().setVertices({{0, 0, 0}}).build();
    for (const RCShdPtr<SdInstance>& instance :
         {geometry(nullptr, 0, one), geometry(noFaces, 0, one), light(false, 1), placed(nullptr, 0, one)}) {
        RsSceneBuilder builder;
        builder.add(instance);
        const SdObject* object = instance->getObject().get();
        if (auto g = dynamic_cast<const SdGeometry*>(object)) {
            EXPECT_TRUE(builder.add(instance, RCShdPtr<const SdGeometry>(g)).isNull());
        }
        if (auto l = dynamic_cast<const SdLight*>(object)) {
            EXPECT_TRUE(builder.add(instance, RCShdPtr<const SdLight>(l)).isNull());
        }
        EXPECT_TRUE(builder.getGeomInstances().empty() && builder.getLights().empty() && builder.getCameras().empty());
        EXPECT_TRUE(builder.getMaterialShaders().empty() && builder.getShadowShaders().empty());
    }
}

// A mesh with its derived data is shared as it is; one without gets a derived copy per instance.
TEST_F(RsSceneBuilderTest, MeshesLackingDerivedDataGetACopyPerInstance) {
    SdMeshBuilder meshBuilder;
    meshBuilder.setVertices({{0, 0, 0}, {1, 0, 0}, {0, 1, 0}}).setTriangles({0, 1, 2});
    for (const RCShdPtr<SdMesh>& mesh : {meshBuilder.build(), meshBuilder.buildWithoutDerivedData()}) {
        const RCShdPtr<SdMeshGeometry> shape = makeShared<SdMeshGeometry>(mesh);
        RsSceneBuilder builder;
        const RCShdPtr<const SdMesh> first = builder.add(placed(shape), RCShdPtr<const SdGeometry>(shape))->_mesh;
        const RCShdPtr<const SdMesh> second = builder.add(placed(shape), RCShdPtr<const SdGeometry>(shape))->_mesh;
        EXPECT_EQ(shape->getMesh(), mesh);
        EXPECT_TRUE(first->hasDerivedData() && second->hasDerivedData());
        EXPECT_EQ(first == mesh, mesh->hasDerivedData());
        EXPECT_EQ(second == first, mesh->hasDerivedData());
    }
}

// add(instance) sorts by the object's kind; a builder on the stack hands shader builders null.
TEST_F(RsSceneBuilderTest, AddTakesAnInstanceByItsKind) {
    RsSceneBuilder builder;
    builder.add(geometry(cube()));
    builder.add(placed(makeShared<SdCamera>()));
    builder.add(light(true, 4));
    EXPECT_EQ(builder.getGeomInstances().size(), 1u);
    EXPECT_EQ(builder.getCameras().size(), 1u);
    ASSERT_EQ(builder.getLights().size(), 1u);
    EXPECT_EQ(probeOf(builder.getLights()[0]).sceneBuilder, nullptr);
    EXPECT_THROW(builder.add(placed(makeShared<SdMaterial>())), ExProgramAborted);
    EXPECT_THROW(builder.add(RCShdPtr<const SdInstance>()), ExNullPtr);
}

TEST_F(RsSceneBuilderTest, AnObjectOfTheWrongKindInASceneListIsAFailedCast) {
    for (int list = 0; list < 3; ++list) {
        const RCShdPtr<SdScene> scene = makeShared<SdScene>();
        if (list == 0) scene->addGeometry(placed(makeShared<SdCamera>()));
        if (list == 1) scene->addCamera(light(true, 1));
        if (list == 2) scene->addLight(geometry(cube()));
        EXPECT_THROW(RsSceneBuilder().addScene(scene), ExCastFailed) << list;
    }
}

// The library's load fills the process's registry with the standard builders.
TEST_F(RsSceneBuilderTest, StandardBuildersAreRegisteredAtLoad) {
    RsSceneRegistry& registry = RsSceneRegistry::getInstance();
    const RttiType<SdMaterial>& material = SdMaterial::RttiClassType::getInstance();
    EXPECT_EQ(typeid(*registry.getMaterialShaderBuilder(material)), typeid(RsStdMaterialShaderBuilder));
    EXPECT_EQ(typeid(*registry.getShadowShaderBuilder(material)), typeid(RsStdShadowShaderBuilder));
    EXPECT_EQ(typeid(*registry.getLightShaderBuilder(SdStdLight::RttiClassType::getInstance())),
              typeid(RsStdLightShaderBuilder));
}

TEST_F(RsSceneBuilderTest, StandardMaterialBuildersFollowTheShadingModel) {
    const std::vector<const std::type_info*> expected = {nullptr,
                                                         &typeid(RsNoShadeMaterialShader),
                                                         &typeid(RsSimpleMaterialShader),
                                                         &typeid(RsStdMaterialShader),
                                                         &typeid(RsShadowMatteShader),
                                                         nullptr};
    for (int model = -1; model <= 4; ++model) {
        RCShdPtr<SdMaterial> material = makeShared<SdMaterial>();
        material->_shadingModel = SdMaterial::ShadingModel(model);
        const RCShdPtr<RsMaterialShader> shadow = RsStdShadowShaderBuilder().build(nullptr, material, nullptr);
        EXPECT_EQ(typeid(*shadow), typeid(RsShadowShader));
        EXPECT_EQ(shadow->getMaterial(), material);
        const RCShdPtr<RsMaterialShader> shader = RsStdMaterialShaderBuilder().build(nullptr, material, nullptr);
        const std::type_info* want = expected[model + 1];
        ASSERT_EQ(shader.isNull(), want == nullptr) << model;
        if (want) {
            EXPECT_TRUE(typeid(*shader) == *want && shader->getMaterial() == material) << model;
        }
    }
}

// By kind with the instance's light number; a light that is not standard, or of no known kind,
// fails.
TEST_F(RsSceneBuilderTest, StandardLightBuilderFollowsTheKind) {
    const std::vector<const std::type_info*> expected = {&typeid(RsDirectLightShader), &typeid(RsOmniLightShader),
                                                         &typeid(RsSpotLightShader)};
    for (int kind = 0; kind <= 3; ++kind) {
        RCShdPtr<SdStdLight> l = makeShared<SdStdLight>();
        l->_kind = SdStdLight::Kind(kind);
        RCShdPtr<SdInstance> instance = placed(l, 2.0f);
        instance->setLightNumber(11 + kind);
        if (kind == 3) {
            EXPECT_THROW(RsStdLightShaderBuilder().build(instance, l, nullptr), ExProgramAborted);
            continue;
        }
        const RCShdPtr<RsLightShader> shader = RsStdLightShaderBuilder().build(instance, l, nullptr);
        EXPECT_EQ(typeid(*shader), *expected[kind]);
        EXPECT_EQ(shader->_lightId, 11u + kind);
        EXPECT_EQ(dynamic_cast<RsStdLightShader&>(*shader).getLight(), l);
    }
    EXPECT_THROW(RsStdLightShaderBuilder().build(light(true, 1), makeShared<ProbeLight>(), nullptr), ExAssertionFailed);
}

}  // namespace
}  // namespace Zr
