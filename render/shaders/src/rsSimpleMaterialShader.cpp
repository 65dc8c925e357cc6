#include "rsSimpleMaterialShader.h"

namespace Zr {

RsSimpleMaterialShader::RsSimpleMaterialShader(const RCShdPtr<const SdMaterial>& material)
    : RsEnvironmentShader(material, 0u) {}

CoRgbaColorTyped<float> RsSimpleMaterialShader::shade(RsShadingContext& context) {
    const GeVector3<float> view = bumpAndView(context);
    return withEnvironment(_color, context, view);
}

}  // namespace Zr
