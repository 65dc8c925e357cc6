#include "rsStdMaterialShaderBuilder.h"

#include "rsNoShadeMaterialShader.h"
#include "rsShadowMatteShader.h"
#include "rsSimpleMaterialShader.h"
#include "rsStdMaterialShader.h"

namespace Zr {

RCShdPtr<RsMaterialShader> RsStdMaterialShaderBuilder::makeShader(const RCShdPtr<const SdMaterial>& material) {
    switch (material->_shadingModel) {
    case SdMaterial::ShadingModel::noShade:
        return makeShared<RsNoShadeMaterialShader>(material);
    case SdMaterial::ShadingModel::simple:
        return makeShared<RsSimpleMaterialShader>(material);
    case SdMaterial::ShadingModel::standard:
        return makeShared<RsStdMaterialShader>(material);
    case SdMaterial::ShadingModel::shadowMatte:
        return makeShared<RsShadowMatteShader>(material);
    }
    // A model this builder does not know: the instance's faces of this material get no shader.
    return {};
}

}  // namespace Zr
