#include "zrDiffuseShader.h"

#include <algorithm>

#include "rsSceneRegistry.h"
#include "rsShaderBuilder.h"

namespace Zr {

namespace {

// Makes a ZrDiffuseShader of each material it is given. Like every builder it holds nothing, so
// its clone is a new object of its class.
class ZrDiffuseShaderBuilder : public RsMaterialShaderBuilder {
public:
    RCShdPtr<RsMaterialShaderBuilder> clone() const override { return makeShared<ZrDiffuseShaderBuilder>(); }
    RCShdPtr<RsMaterialShader> build(const RCShdPtr<const SdInstance>&, const RCShdPtr<const SdMaterial>& material,
                                     const RCShdPtr<RsSceneBuilder>&) override {
        return makeShared<ZrDiffuseShader>(material);
    }
};

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

void ZrDiffuseMaterial::registerShaderBuilder() {
    // A second registration of the type would be refused by the registry: register once.
    static const bool registered = [] {
        RsSceneRegistry::getInstance().registerBuilder(RttiClassType::getInstance(),
                                                       makeShared<ZrDiffuseShaderBuilder>());
        return true;
    }();
    (void)registered;
}

}  // namespace Zr
