#include "rsDiffuseMapShader.h"

namespace Zr {

RsDiffuseMapShader::RsDiffuseMapShader(const RCShdPtr<const SdMaterial>& material, unsigned int neededContext)
    : RsMaterialShader(material),
      _color(scaleByTexture(material->_diffuse, material->_opacity, material->_diffuseMap)),
      _diffuseMap(material->_diffuseMap),
      _neededContext(neededContext | neededContextOfMap(material->_diffuseMap)) {}

unsigned int RsDiffuseMapShader::getNeededContext() const { return _neededContext; }

void RsDiffuseMapShader::makeSampler(RsShaderMap& map) {
    if (!map._sampler) map._sampler = createSampler(map._params);
}

void RsDiffuseMapShader::lockMemoryImpl() { makeSampler(_diffuseMap); }

void RsDiffuseMapShader::unlockMemoryImpl() { _diffuseMap.releaseTiles(); }

void RsDiffuseMapShader::dump(std::ostream& os) const {
    RsMaterialShader::dump(os);
    os << " _color:";
    _color.dump(os);
    os << " _neededContext: " << _neededContext;
}

}  // namespace Zr
