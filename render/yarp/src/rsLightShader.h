#pragma once
// The base of the renderer's light shaders. A scene owns its light shaders through RCShdPtr, and
// material shaders refer to the lights that reach them; neither refers back.
#include "rcBase.h"

namespace Zr {

class RsLightShader : public RCObject {
public:
    ~RsLightShader() override = default;

    // ---- Light interface ------------------------------------------------------------------
    // The per-render setup, shadow map creation, illumination of a fragment and the light-link
    // test are declared here by the shading code as they are added; this record only needs to
    // be owned and released by the scene.
    // -----------------------------------------------------------------------------------------

protected:
    RsLightShader() = default;
    RsLightShader(const RsLightShader&) = default;
    RsLightShader& operator=(const RsLightShader&) = default;
};

}  // namespace Zr
