#pragma once
// The scenes that the benchmarks time, made once here so that the render benchmark and the peer
// benchmark draw the very same geometry through the very same cameras:
// - a square grid of cells by cells cells, two triangles each, facing the camera (224 cells give
//   100,352 triangles; 1 cell gives one quad over the same pixels);
// - ten squares one behind the other, each larger than the view, of opacity 0.3.
#include "rcShdPtr.h"
#include "rsScene.h"
#include "sdInstance.h"
#include "zrSceneKit.h"

namespace Zr {

struct ZrBenchScene {
    RCShdPtr<RsScene> scene;
    RCShdPtr<SdInstance> camera;
};

class ZrBenchScenes {
public:
    // For pictures of width over height aspect, each material drawn with a shader of shaderMaker.
    static ZrBenchScene makeGrid(int cells, double aspect, const ZrSceneKit::ShaderMaker& shaderMaker);
    static ZrBenchScene makeLayers(double aspect, const ZrSceneKit::ShaderMaker& shaderMaker);
};

}  // namespace Zr
