#include "rsNoShadeMaterialShader.h"

namespace Zr {

RsNoShadeMaterialShader::RsNoShadeMaterialShader(const RCShdPtr<const SdMaterial>& material)
    : RsMaterialShader(material),
      _color(scaleByTexture(material->_diffuse, material->_opacity, material->_diffuseMap)),
      _diffuseMap(material->_diffuseMap),
      _neededContext(neededContextOfMap(material->_diffuseMap)) {}

RsNoShadeMaterialShader::~RsNoShadeMaterialShader() = default;

CoRgbaColorTyped<float> RsNoShadeMaterialShader::shade(RsShadingContext& context) {
    return _color * _diffuseMap.sample(context);
}

unsigned int RsNoShadeMaterialShader::getNeededContext() const { return _neededContext; }

void RsNoShadeMaterialShader::lockMemoryImpl() {
    if (!_diffuseMap._sampler) _diffuseMap._sampler = createSampler(_diffuseMap._params);
}

void RsNoShadeMaterialShader::unlockMemoryImpl() { _diffuseMap.releaseTiles(); }

void RsNoShadeMaterialShader::dump(std::ostream& os) const {
    RsMaterialShader::dump(os);
    os << " _color:";
    _color.dump(os);
    os << " _neededContext: " << _neededContext;
}

}  // namespace Zr
