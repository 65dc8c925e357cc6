#include "zrDiffuseShader.h"

#include <algorithm>

namespace Zr {

namespace {

// Unit direction towards the light, in eye space (x right, y up, the viewer looking down -z).
const GeVector3<float> lightDirection = GeVector3<float>(-0.4f, 0.6f, 0.7f).getNormalized();
constexpr float ambientShare = 0.25f;

}  // namespace

ZrDiffuseShader::ZrDiffuseShader(const RCShdPtr<const SdMaterial>& material)
    : RsMaterialShader(material), _diffuse(material->_diffuse), _opacity(material->_opacity) {}

CoRgbaColorTyped<float> ZrDiffuseShader::shade(RsShadingContext& context) {
    // Lambert's cosine law; the renderer hands the normal over at unit length.
    const float lambert = std::max(0.0f, context._normal.dot(lightDirection));
    const float light = ambientShare + (1.0f - ambientShare) * lambert;
    return {_diffuse.r * light, _diffuse.g * light, _diffuse.b * light, _opacity};
}

}  // namespace Zr
