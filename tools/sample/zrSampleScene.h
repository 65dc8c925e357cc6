#pragma once
// The sample scene that zrender draws and the render benchmarks time: on a chequered ground
// plane stand an opaque sphere, a torus half transparent in the normal mode, a cube half
// transparent in the screen mode (it brightens what lies behind it), and a low sphere drawn as
// yellow wires. The camera looks down at them slightly from the front.
#include "rcShdPtr.h"
#include "rsScene.h"
#include "sdInstance.h"
#include "zrSceneKit.h"

namespace Zr {

class ZrSampleScene {
public:
    // The scene, each material shaded by a shader from shaderMaker.
    static RCShdPtr<RsScene> makeScene(const ZrSceneKit::ShaderMaker& shaderMaker = ZrSceneKit::diffuseShaderMaker());
    // The camera for a picture of width by height pixels.
    static RCShdPtr<SdInstance> makeCamera(int width, int height);
};

}  // namespace Zr
