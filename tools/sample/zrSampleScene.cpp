#include "zrSampleScene.h"

#include "zrShapes.h"

namespace Zr {

RCShdPtr<RsScene> ZrSampleScene::makeScene(const ZrSceneKit::ShaderMaker& shaderMaker) {
    using Mode = SdMaterial::TransferMode;
    std::vector<RCShdPtr<RsGeomInstance>> instances;

    // Ground: a chess board of 8 by 8 cells, 12 units wide; its two face groups take the two
    // materials in turn.
    instances.push_back(ZrSceneKit::makeInstance(
        ZrShapes::makeGrid(12.0f, 8, true),
        {ZrSceneKit::makeMaterial({0.85f, 0.82f, 0.74f}), ZrSceneKit::makeMaterial({0.30f, 0.33f, 0.38f})},
        ZrSceneKit::makePlacement({0, 0, 0}), shaderMaker));

    // An opaque red sphere on the left.
    instances.push_back(ZrSceneKit::makeInstance(ZrShapes::makeSphere(1.0f, 32, 16),
                                                 {ZrSceneKit::makeMaterial({0.85f, 0.18f, 0.12f})},
                                                 ZrSceneKit::makePlacement({-1.7, 1.0, 0.0}), shaderMaker));

    // A green torus standing on its rim on the right, turned towards the camera, half transparent.
    instances.push_back(ZrSceneKit::makeInstance(
        ZrShapes::makeTorus(0.85f, 0.3f, 40, 16), {ZrSceneKit::makeMaterial({0.15f, 0.80f, 0.30f}, 0.55f)},
        ZrSceneKit::makePlacement({1.7, 1.15, 0.2}, {1.0, -0.35, 0.0}, 80.0), shaderMaker));

    // A blue cube in front, turned about the vertical, laid over the scene in the screen mode.
    instances.push_back(ZrSceneKit::makeInstance(
        ZrShapes::makeCube(0.6f), {ZrSceneKit::makeMaterial({0.25f, 0.45f, 0.95f}, 0.7f, Mode::screen)},
        ZrSceneKit::makePlacement({0.1, 0.6, 2.0}, {0, 1, 0}, 30.0), shaderMaker));

    // A coarse yellow sphere at the back, drawn as wires one and a half pixels wide.
    RCShdPtr<SdMaterial> wires = ZrSceneKit::makeMaterial({1.0f, 0.85f, 0.2f});
    wires->_wireframe = true;
    wires->_screenSpace = true;
    wires->_wireSize = 1.5f;
    instances.push_back(ZrSceneKit::makeInstance(ZrShapes::makeSphere(0.9f, 12, 7), {wires},
                                                 ZrSceneKit::makePlacement({0.2, 0.9, -2.2}), shaderMaker));

    return ZrSceneKit::makeScene(std::move(instances));
}

RCShdPtr<SdInstance> ZrSampleScene::makeCamera(int width, int height) {
    const double aspect = height > 0 ? static_cast<double>(width) / height : 1.0;
    return ZrSceneKit::makeCamera({0.0, 3.4, 8.0}, {0.0, 0.7, 0.0}, 40.0, aspect, 0.5f, 50.0f);
}

}  // namespace Zr
