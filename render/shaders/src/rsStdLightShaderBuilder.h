#pragma once
// Makes the light shader of a standard light (SdStdLight) by its kind: a direct, omni or spot
// light shader, numbered and placed by the light's instance. Registered for SdStdLight when the
// "shaders" package starts, so it also serves classes derived from SdStdLight that bring no
// builder of their own.
#include "rcShdPtr.h"
#include "rsLightShader.h"
#include "rsShaderBuilder.h"
#include "sdInstance.h"
#include "sdLight.h"

namespace Zr {

class RsStdLightShaderBuilder : public RsLightShaderBuilder {
public:
    RsStdLightShaderBuilder();
    ~RsStdLightShaderBuilder() override;

    RCShdPtr<RsLightShaderBuilder> clone() const override;
    // The shader of light, which must be an SdStdLight (ExAssertionFailed otherwise), with the
    // instance's light number and matrix; a kind other than direct, omni or spot is a program
    // fault (ExProgramAborted). sceneBuilder is not used.
    RCShdPtr<RsLightShader> build(const RCShdPtr<const SdInstance>& instance, const RCShdPtr<const SdLight>& light,
                                  const RCShdPtr<RsSceneBuilder>& sceneBuilder) override;
};

}  // namespace Zr
