#include "rsStdShadowShaderBuilder.h"

#include "rsShadowShader.h"

namespace Zr {

RsStdShadowShaderBuilder::RsStdShadowShaderBuilder() = default;

RsStdShadowShaderBuilder::~RsStdShadowShaderBuilder() = default;

RCShdPtr<RsMaterialShaderBuilder> RsStdShadowShaderBuilder::clone() const {
    return makeShared<RsStdShadowShaderBuilder>();
}

RCShdPtr<RsMaterialShader> RsStdShadowShaderBuilder::build(const RCShdPtr<const SdInstance>& /*instance*/,
                                                           const RCShdPtr<const SdMaterial>& material,
                                                           const RCShdPtr<RsSceneBuilder>& /*sceneBuilder*/) {
    return makeShared<RsShadowShader>(material);
}

}  // namespace Zr
