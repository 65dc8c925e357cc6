#include "rsStdShadowShaderBuilder.h"

#include "rsShadowShader.h"

namespace Zr {

RCShdPtr<RsMaterialShader> RsStdShadowShaderBuilder::makeShader(const RCShdPtr<const SdMaterial>& material) {
    return makeShared<RsShadowShader>(material);
}

}  // namespace Zr
