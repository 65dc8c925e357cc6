#include "rsShadowShader.h"

namespace Zr {

RsShadowShader::RsShadowShader(const RCShdPtr<const SdMaterial>& material) : RsDiffuseMapShader(material, 0u) {}

CoRgbaColorTyped<float> RsShadowShader::shade(RsShadingContext& context) {
    const CoRgbaColorTyped<float> sample = _diffuseMap.sample(context);
    const float a = _color.a * sample.a;
    const float u = 1.0f - a;
    // The clear share u passes untinted, the covered share a tinted by the surface; what comes
    // out is scaled once more by u, so that an opaque surface passes nothing at all.
    return CoRgbaColorTyped<float>((_color.r * sample.r * a + u) * u, (_color.g * sample.g * a + u) * u,
                                   (_color.b * sample.b * a + u) * u, a);
}

}  // namespace Zr
