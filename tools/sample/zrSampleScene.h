#pragma once
// The sample scene that zrender draws and the render benchmarks time: on a tiled ground plane
// stand an opaque, glossy sphere, a torus half transparent in the normal mode (drawn by the host's
// own material, ZrDiffuseMaterial), a cube half transparent in the screen mode (it brightens what
// lies behind it), and a low sphere drawn as flat yellow wires. An omni light, a spot light and a
// direct light shine on it, each casting shadows from maps of the kind the options choose (depth
// maps by default); the camera looks down at it slightly from the front. With deep maps the
// transparent torus and cube cast shadows tinted by their colours.
//
// The scene is a scene description, turned into the renderer's scene by RsSceneBuilder as a host
// does it. The benchmarks that compare the renderer with another one draw the same geometry
// without lights, each material shaded by a shader of their choice.
#include "rcShdPtr.h"
#include "rsScene.h"
#include "sdInstance.h"
#include "sdScene.h"
#include "zrSceneKit.h"
#include "zrShadowOptions.h"

namespace Zr {

class ZrSampleScene {
public:
    using Options = ZrShadowOptions;

    // The scene description at the given time of its animation: geometry instances with their
    // materials, and the three lights casting shadows as the options say. The sphere swings left
    // and right and the torus turns; at time 0 the scene is the still picture. The sphere swings
    // 0.8 units each way once in two seconds; the torus turns about its tilted axis half a turn a
    // second.
    static RCShdPtr<SdScene> makeDescription(const Options& options = {}, double seconds = 0.0);
    // The lit renderer scene of the description at that time, made by RsSceneBuilder.
    static RCShdPtr<RsScene> makeScene(const Options& options = {}, double seconds = 0.0);
    // The description's geometry without lights, each material shaded by a shader of shaderMaker.
    static RCShdPtr<RsScene> makeUnlitScene(const ZrSceneKit::ShaderMaker& shaderMaker =
                                                ZrSceneKit::diffuseShaderMaker());
    // The camera for a picture of width by height pixels.
    static RCShdPtr<SdInstance> makeCamera(int width, int height);
    // The distance from the camera to the middle of the scene, where depth of field is sharpest.
    static double focusDistance();
};

}  // namespace Zr
