#include "zrBenchScenes.h"

#include <utility>
#include <vector>

#include "zrShapes.h"

namespace Zr {

ZrBenchScene ZrBenchScenes::makeGrid(int cells, double aspect, const ZrSceneKit::ShaderMaker& shaderMaker) {
    const RCShdPtr<RsScene> scene = ZrSceneKit::makeScene({ZrSceneKit::makeInstance(
        ZrShapes::makeGrid(10.0f, cells, false), {ZrSceneKit::makeMaterial({0.6f, 0.7f, 0.8f})},
        ZrSceneKit::makePlacement({0, 0, 0}, {1, 0, 0}, 90.0), shaderMaker)});
    return {scene, ZrSceneKit::makeCamera({0, 0, 12}, {0, 0, 0}, 40.0, aspect, 1.0f, 100.0f)};
}

ZrBenchScene ZrBenchScenes::makeLayers(double aspect, const ZrSceneKit::ShaderMaker& shaderMaker) {
    std::vector<RCShdPtr<RsGeomInstance>> layers;
    const RCShdPtr<const SdMesh> square = ZrShapes::makeGrid(1.0f, 1, false);
    for (int i = 0; i < 10; ++i) {
        const float shade = 0.1f * static_cast<float>(i);
        layers.push_back(ZrSceneKit::makeInstance(
            square, {ZrSceneKit::makeMaterial({shade, 0.5f, 1.0f - shade}, 0.3f)},
            ZrSceneKit::makePlacement({0, 0, -0.5 * i}, {1, 0, 0}, 90.0, 40.0), shaderMaker));
    }
    return {ZrSceneKit::makeScene(std::move(layers)),
            ZrSceneKit::makeCamera({0, 0, 10}, {0, 0, 0}, 40.0, aspect, 1.0f, 100.0f)};
}

}  // namespace Zr
