#include "rsSimpleMaterialShader.h"

namespace Zr {

namespace {
constexpr unsigned int kEyeAndNormal = RsShadingContext::needsEyeCoord | RsShadingContext::needsNormal;
}  // namespace

RsSimpleMaterialShader::RsSimpleMaterialShader(const RCShdPtr<const SdMaterial>& material)
    : RsMaterialShader(material),
      _color(scaleByTexture(material->_diffuse, material->_opacity, material->_diffuseMap)),
      _reflection(scaleByTexture(material->_reflection, material->_reflectionMap)),
      _refraction(scaleByTexture(material->_refraction, material->_refractionMap)),
      _irradiance(scaleByTextures(material->_irradiance, material->_diffuseMap, material->_irradianceMap)),
      _refractionIndex(material->_refractionIndex),
      _diffuseMap(material->_diffuseMap),
      _reflectionMap(material->_reflectionMap),
      _refractionMap(material->_refractionMap),
      _irradianceMap(material->_irradianceMap),
      _bumpMap(material->_bumpMap),
      _neededContext(neededContextOfMap(material->_diffuseMap) |
                     neededContextOfMap(material->_reflectionMap, kEyeAndNormal) |
                     neededContextOfMap(material->_refractionMap, kEyeAndNormal) |
                     neededContextOfMap(material->_irradianceMap, RsShadingContext::needsNormal) |
                     neededContextOfBumpMap(material->_bumpMap, RsShadingContext::needsNormal |
                                                                    RsShadingContext::needsTexCoord |
                                                                    RsShadingContext::needsTangents)) {}

RsSimpleMaterialShader::~RsSimpleMaterialShader() = default;

CoRgbaColorTyped<float> RsSimpleMaterialShader::shade(RsShadingContext& context) {
    const GeVector3<float> view = context.computeViewVector();
    if (_bumpMap.exists()) context.applyBumpMap(*_bumpMap._sampler, _bumpMap._params->getWeight());

    CoRgbaColorTyped<float> result = _color;
    if (_irradianceMap.exists()) addTo(result, _irradiance * _irradianceMap.lookUpByNormal(context));
    result *= _diffuseMap.sample(context);
    if (_reflectionMap.exists()) addTo(result, _reflection * _reflectionMap.lookUpByReflection(context, view));
    if (_refractionMap.exists())
        addTo(result, _refraction * _refractionMap.lookUpByRefraction(context, view, _refractionIndex));
    return result;
}

unsigned int RsSimpleMaterialShader::getNeededContext() const { return _neededContext; }

void RsSimpleMaterialShader::lockMemoryImpl() {
    for (RsShaderMap* map : {&_diffuseMap, &_reflectionMap, &_refractionMap, &_irradianceMap, &_bumpMap})
        if (!map->_sampler) map->_sampler = createSampler(map->_params);
}

void RsSimpleMaterialShader::unlockMemoryImpl() {
    for (const RsShaderMap* map : {&_diffuseMap, &_reflectionMap, &_refractionMap, &_irradianceMap, &_bumpMap})
        map->releaseTiles();
}

void RsSimpleMaterialShader::dump(std::ostream& os) const {
    RsMaterialShader::dump(os);
    os << " _color:";
    _color.dump(os);
    os << " _reflection:";
    _reflection.dump(os);
    os << " _refraction:";
    _refraction.dump(os);
    os << " _irradiance:";
    _irradiance.dump(os);
    os << " _refractionIndex: " << _refractionIndex << " _neededContext: " << _neededContext;
}

}  // namespace Zr
