#include "rsShadowShader.h"

namespace Zr {

RsShadowShader::RsShadowShader(const RCShdPtr<const SdMaterial>& material)
    : RsMaterialShader(material),
      _color(scaleByTexture(material->_diffuse, material->_opacity, material->_diffuseMap)),
      _diffuseMap(material->_diffuseMap),
      _neededContext(neededContextOfMap(material->_diffuseMap)) {}

RsShadowShader::~RsShadowShader() = default;

CoRgbaColorTyped<float> RsShadowShader::shade(RsShadingContext& context) {
    const CoRgbaColorTyped<float> sample = _diffuseMap.sample(context);
    const float a = _color.a * sample.a;
    const float u = 1.0f - a;
    // The clear share u passes untinted, the covered share a tinted by the surface; what comes
    // out is scaled once more by u, so that an opaque surface passes nothing at all.
    return CoRgbaColorTyped<float>((_color.r * sample.r * a + u) * u, (_color.g * sample.g * a + u) * u,
                                   (_color.b * sample.b * a + u) * u, a);
}

unsigned int RsShadowShader::getNeededContext() const { return _neededContext; }

void RsShadowShader::lockMemoryImpl() {
    if (!_diffuseMap._sampler) _diffuseMap._sampler = createSampler(_diffuseMap._params);
}

void RsShadowShader::unlockMemoryImpl() { _diffuseMap.releaseTiles(); }

void RsShadowShader::dump(std::ostream& os) const {
    RsMaterialShader::dump(os);
    os << " _color:";
    _color.dump(os);
    os << " _neededContext: " << _neededContext;
}

}  // namespace Zr
