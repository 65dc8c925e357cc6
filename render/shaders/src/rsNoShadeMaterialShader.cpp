#include "rsNoShadeMaterialShader.h"

namespace Zr {

RsNoShadeMaterialShader::RsNoShadeMaterialShader(const RCShdPtr<const SdMaterial>& material)
    : RsDiffuseMapShader(material, 0u) {}

CoRgbaColorTyped<float> RsNoShadeMaterialShader::shade(RsShadingContext& context) {
    return _color * _diffuseMap.sample(context);
}

}  // namespace Zr
