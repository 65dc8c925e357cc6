#include "rsEnvironmentShader.h"

namespace Zr {

namespace {
constexpr unsigned int kEyeAndNormal = RsShadingContext::needsEyeCoord | RsShadingContext::needsNormal;
}  // namespace

RsEnvironmentShader::RsEnvironmentShader(const RCShdPtr<const SdMaterial>& material, unsigned int neededContext)
    : RsDiffuseMapShader(material,
                         neededContext | neededContextOfMap(material->_reflectionMap, kEyeAndNormal) |
                             neededContextOfMap(material->_refractionMap, kEyeAndNormal) |
                             neededContextOfMap(material->_irradianceMap, RsShadingContext::needsNormal) |
                             neededContextOfBumpMap(material->_bumpMap, RsShadingContext::needsNormal |
                                                                            RsShadingContext::needsTexCoord |
                                                                            RsShadingContext::needsTangents)),
      _reflection(scaleByTexture(material->_reflection, material->_reflectionMap)),
      _refraction(scaleByTexture(material->_refraction, material->_refractionMap)),
      _irradiance(scaleByTextures(material->_irradiance, material->_diffuseMap, material->_irradianceMap)),
      _refractionIndex(material->_refractionIndex),
      _reflectionMap(material->_reflectionMap),
      _refractionMap(material->_refractionMap),
      _irradianceMap(material->_irradianceMap),
      _bumpMap(material->_bumpMap) {}

void RsEnvironmentShader::lockMemoryImpl() {
    RsDiffuseMapShader::lockMemoryImpl();
    for (RsShaderMap* map : {&_reflectionMap, &_refractionMap, &_irradianceMap, &_bumpMap}) makeSampler(*map);
}

void RsEnvironmentShader::unlockMemoryImpl() {
    RsDiffuseMapShader::unlockMemoryImpl();
    for (const RsShaderMap* map : {&_reflectionMap, &_refractionMap, &_irradianceMap, &_bumpMap})
        map->releaseTiles();
}

void RsEnvironmentShader::dump(std::ostream& os) const {
    RsDiffuseMapShader::dump(os);
    os << " _reflection:";
    _reflection.dump(os);
    os << " _refraction:";
    _refraction.dump(os);
    os << " _irradiance:";
    _irradiance.dump(os);
    os << " _refractionIndex: " << _refractionIndex;
}

}  // namespace Zr
