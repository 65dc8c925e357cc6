#pragma once
// The base of the renderer's light shaders. A scene owns its light shaders through RCShdPtr, and
// material shaders refer to the lights that reach them; neither refers back.
//
// Every render call first runs setupRender and then initializeMaps on each light of the scene, in
// the scene's order, before any pixel is touched: a light places itself in camera space and
// rebuilds its shadow maps for that call.
#include "geAffineMatrix3.h"
#include "rcBase.h"
#include "rcShdPtr.h"

namespace Zr {

class RsScene;

class RsLightShader : public RCObject {
public:
    ~RsLightShader() override = default;

    // Called once after the scene that owns the light is built. Nothing to do here.
    virtual void initialize(const RCShdPtr<RsScene>& scene);
    // Places the light for one render call seen through worldToCamera.
    virtual void setupRender(const GeAffineMatrix3<float>& worldToCamera) = 0;
    // Rebuilds the light's shadow maps for one render call of scene.
    virtual void initializeMaps(const RCShdPtr<RsScene>& scene) = 0;

protected:
    RsLightShader() = default;
    RsLightShader(const RsLightShader&) = default;
    RsLightShader& operator=(const RsLightShader&) = default;
};

}  // namespace Zr
