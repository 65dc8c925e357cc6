#include "zrSampleScene.h"

#include <cmath>
#include <vector>

#include "rsSceneBuilder.h"
#include "sdMeshGeometry.h"
#include "sdStdLight.h"
#include "sdTexture.h"
#include "sdTextureParams.h"
#include "zrDiffuseShader.h"
#include "zrShapes.h"

namespace Zr {

namespace {

using Colour = CoRgbColorTyped<float>;
using Mode = SdMaterial::TransferMode;

// A material of the standard lighting model with the given colour and highlight.
RCShdPtr<SdMaterial> standard(const Colour& diffuse, const Colour& specular, float shininess, float opacity = 1.0f,
                              Mode mode = Mode::normal) {
    RCShdPtr<SdMaterial> material = ZrSceneKit::makeMaterial(diffuse, opacity, mode);
    material->_ambient = diffuse;
    material->_specular = specular;
    material->_shininess = shininess;
    return material;
}

// A tile of 16 by 16 texels, light in the middle and darker towards its border, as a map that
// repeats once per ground cell.
RCShdPtr<const SdTextureParams> tileMap() {
    constexpr int size = 16;
    std::vector<CoRgbaColorTyped<float>> texels;
    for (int y = 0; y < size; ++y) {
        for (int x = 0; x < size; ++x) {
            const double u = (x + 0.5) / size * 2.0 - 1.0;
            const double v = (y + 0.5) / size * 2.0 - 1.0;
            const float shade = static_cast<float>(1.0 - 0.45 * std::pow(std::max(std::abs(u), std::abs(v)), 4.0));
            texels.push_back({shade, shade, shade, 1.0f});
        }
    }
    return makeShared<SdTextureParams>(makeShared<SdTexture>(size, size, std::move(texels)));
}

RCShdPtr<SdInstance> placed(const char* name, const RCShdPtr<const SdMesh>& mesh,
                            std::vector<RCShdPtr<const SdMaterial>> materials,
                            const GeAffineMatrix3<float>& objectToWorld) {
    RCShdPtr<SdInstance> instance = makeShared<SdInstance>(makeShared<SdMeshGeometry>(mesh), objectToWorld);
    instance->setMaterials(std::move(materials));
    instance->setName(name);
    return instance;
}

RCShdPtr<SdMaterial> named(const char* name, RCShdPtr<SdMaterial> material) {
    material->_name = name;
    return material;
}

RCShdPtr<SdStdLight> light(SdStdLight::Kind kind, const Colour& colour, float intensity) {
    RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
    light->_kind = kind;
    light->_color = colour;
    light->_intensity = intensity;
    return light;
}

RCShdPtr<SdInstance> lightAt(const RCShdPtr<SdStdLight>& light, unsigned int number, const GePoint3<double>& position,
                             const GePoint3<double>& target) {
    RCShdPtr<SdInstance> instance = makeShared<SdInstance>(light, ZrSceneKit::makeLookAt(position, target));
    instance->setLightNumber(number);
    return instance;
}

}  // namespace

RCShdPtr<SdScene> ZrSampleScene::makeDescription(const Options& options, double seconds) {
    ZrDiffuseMaterial::registerShaderBuilder();
    RCShdPtr<SdScene> scene = makeShared<SdScene>();

    // Ground: a board of 8 by 8 cells, 12 units wide; its two face groups take the two materials
    // in turn. The light cells are tiles of a map, the dark ones slightly glossy.
    RCShdPtr<SdMaterial> lightCells = named("lightCells", standard({0.85f, 0.82f, 0.74f}, {0.1f, 0.1f, 0.1f}, 0.3f));
    lightCells->_diffuseMap = tileMap();
    RCShdPtr<SdMaterial> darkCells = named("darkCells", standard({0.30f, 0.33f, 0.38f}, {0.35f, 0.35f, 0.35f}, 0.5f));
    scene->addGeometry(placed("ground", ZrShapes::makeGrid(12.0f, 8, true), {lightCells, darkCells},
                              ZrSceneKit::makePlacement({0, 0, 0})));

    // An opaque red sphere on the left, with a sharp highlight, swinging left and right once in
    // two seconds (about 2.5 units a second through the middle).
    scene->addGeometry(placed("redSphere", ZrShapes::makeSphere(1.0f, 32, 16),
                              {named("redGloss", standard({0.85f, 0.18f, 0.12f}, {0.8f, 0.8f, 0.8f}, 0.6f))},
                              ZrSceneKit::makePlacement({-1.7 + 0.8 * std::sin(3.14159265358979323846 * seconds),
                                                         1.0, 0.0})));

    // A green torus standing on its rim on the right, turned towards the camera, half transparent,
    // in the host's own material.
    RCShdPtr<SdMaterial> torus = named("greenDiffuse", makeShared<ZrDiffuseMaterial>());
    torus->_diffuse = {0.15f, 0.80f, 0.30f};
    torus->_opacity = 0.55f;
    scene->addGeometry(placed("greenTorus", ZrShapes::makeTorus(0.85f, 0.3f, 40, 16), {torus},
                              ZrSceneKit::makePlacement({1.7, 1.15, 0.2}, {1.0, -0.35, 0.0}, 80.0 + 180.0 * seconds)));

    // A blue cube in front, turned about the vertical, half clear and laid over the scene in the
    // screen mode; its shadow in deep maps is blue.
    RCShdPtr<SdMaterial> cube =
        named("blueScreen", standard({0.25f, 0.45f, 0.95f}, {0.5f, 0.5f, 0.5f}, 0.4f, 0.5f, Mode::screen));
    scene->addGeometry(placed("blueCube", ZrShapes::makeCube(0.6f), {cube},
                              ZrSceneKit::makePlacement({0.1, 0.6, 2.0}, {0, 1, 0}, 30.0)));

    // A coarse yellow sphere at the back, drawn as flat wires one and a half pixels wide.
    RCShdPtr<SdMaterial> wires = named("yellowWires", ZrSceneKit::makeMaterial({1.0f, 0.85f, 0.2f}));
    wires->_shadingModel = SdMaterial::ShadingModel::noShade;
    wires->_wireframe = true;
    wires->_screenSpace = true;
    wires->_wireSize = 1.5f;
    scene->addGeometry(
        placed("wireSphere", ZrShapes::makeSphere(0.9f, 12, 7), {wires}, ZrSceneKit::makePlacement({0.2, 0.9, -2.2})));

    // A warm omni light above the left, a spot from the front right aimed at the middle, and a
    // weak cool direct light from above that also lights the materials' ambient term.
    RCShdPtr<SdStdLight> omni = light(SdStdLight::Kind::omni, {1.0f, 0.92f, 0.8f}, 0.55f);
    omni->_decayType = SdStdLight::DecayType::quadratic;
    omni->_decayParameter = 12.0f;
    options.applyTo(*omni);
    scene->addLight(lightAt(omni, 1, {-4.0, 5.0, 3.0}, {0.0, 0.0, 0.0}));
    RCShdPtr<SdStdLight> spot = light(SdStdLight::Kind::spot, {1.0f, 1.0f, 1.0f}, 0.7f);
    spot->_innerConeAngle = 0.45f;
    spot->_outerConeAngle = 0.75f;
    options.applyTo(*spot);
    scene->addLight(lightAt(spot, 2, {4.5, 6.0, 5.0}, {0.0, 0.6, 0.0}));
    RCShdPtr<SdStdLight> direct = light(SdStdLight::Kind::direct, {0.75f, 0.85f, 1.0f}, 0.3f);
    direct->_emitAmbient = true;
    options.applyTo(*direct);
    scene->addLight(lightAt(direct, 3, {1.0, 8.0, 2.0}, {0.0, 0.0, 0.0}));
    return scene;
}

RCShdPtr<RsScene> ZrSampleScene::makeScene(const Options& options, double seconds) {
    RCShdPtr<RsSceneBuilder> builder = makeShared<RsSceneBuilder>();
    builder->addScene(makeDescription(options, seconds));
    return builder->createRendererScene();
}

RCShdPtr<RsScene> ZrSampleScene::makeUnlitScene(const ZrSceneKit::ShaderMaker& shaderMaker) {
    const RCShdPtr<SdScene> description = makeDescription();
    std::vector<RCShdPtr<RsGeomInstance>> instances;
    for (const RCShdPtr<SdInstance>& instance : description->getGeometry()) {
        const SdGeometry& geometry = static_cast<const SdGeometry&>(*instance->getObject());
        instances.push_back(ZrSceneKit::makeInstance(geometry.getMesh(), instance->getMaterials(),
                                                     instance->getMatrix(), shaderMaker));
    }
    return ZrSceneKit::makeScene(std::move(instances));
}

namespace {
const GePoint3<double> kEye{0.0, 3.4, 8.0};
const GePoint3<double> kTarget{0.0, 0.7, 0.0};
}  // namespace

RCShdPtr<SdInstance> ZrSampleScene::makeCamera(int width, int height) {
    const double aspect = height > 0 ? static_cast<double>(width) / height : 1.0;
    return ZrSceneKit::makeCamera(kEye, kTarget, 40.0, aspect, 0.5f, 50.0f);
}

double ZrSampleScene::focusDistance() { return (kEye - kTarget).length(); }

}  // namespace Zr
