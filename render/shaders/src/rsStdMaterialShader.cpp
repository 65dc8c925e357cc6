#include "rsStdMaterialShader.h"

#include <cmath>

#include "rsLinkedLights.h"

namespace Zr {

RsStdMaterialShader::RsStdMaterialShader(const RCShdPtr<const SdMaterial>& material)
    : RsMaterialShader(material),
      _emissive(scaleByTexture(material->_emissive, material->_diffuseMap)),
      _ambient(scaleByTexture(material->_ambient, material->_diffuseMap)),
      _diffuse(scaleByTexture(material->_diffuse, material->_diffuseMap)),
      _specular(scaleByTexture(material->_specular, material->_diffuseMap)),
      _reflection(scaleByTexture(material->_reflection, material->_reflectionMap)),
      _refraction(scaleByTexture(material->_refraction, material->_refractionMap)),
      _irradiance(scaleByTextures(material->_irradiance, material->_diffuseMap, material->_irradianceMap)),
      _refractionIndex(material->_refractionIndex),
      _opacity(material->_opacity),
      _shininess(material->_shininess),
      _specularExponent(std::exp2(10.0f * material->_shininess)),
      _diffuseMap(material->_diffuseMap),
      _reflectionMap(material->_reflectionMap),
      _refractionMap(material->_refractionMap),
      _irradianceMap(material->_irradianceMap),
      _bumpMap(material->_bumpMap),
      _neededContext(RsShadingContext::needsEyeCoord | RsShadingContext::needsNormal |
                     neededContextOfMap(material->_diffuseMap) |
                     neededContextOfBumpMap(material->_bumpMap, RsShadingContext::needsTexCoord |
                                                                    RsShadingContext::needsTangents)) {}

RsStdMaterialShader::~RsStdMaterialShader() = default;

void RsStdMaterialShader::initialize(RCShdPtr<RsScene>& scene, RCShdPtr<const RsGeomInstance>& instance) {
    RsLinkedLights::select(scene, instance, _lights);
}

unsigned int RsStdMaterialShader::getNeededContext() const { return _neededContext; }

CoRgbaColorTyped<float> RsStdMaterialShader::shade(RsShadingContext& context) {
    const GeVector3<float> view = context.computeViewVector();
    if (_bumpMap.exists()) context.applyBumpMap(*_bumpMap._sampler, _bumpMap._params->getWeight());
    const GeVector3<float>& normal = context._normal;

    CoRgbColorTyped<float> ambient = context._ambient;
    CoRgbColorTyped<float> diffuse(0.0f, 0.0f, 0.0f);
    CoRgbColorTyped<float> specular(0.0f, 0.0f, 0.0f);
    for (const RCShdPtr<RsLightShader>& light : _lights) {
        RsLightShader::Illumination illumination;
        const bool lit = light->illuminate(context, illumination);
        if (lit && light->_emitDiffuse) diffuse += illumination._color * illumination._cosine;
        if (lit && light->_emitSpecular) {
            // The highlight peaks where the normal bisects the view and the light direction.
            const GeVector3<float> half = RsShadingContext::normalizeOrZero(view + illumination._direction);
            const float c = half.dot(normal);
            if (c > 0.0f) specular += illumination._color * std::pow(c, _specularExponent);
        }
        // Ambient light needs no line of sight: it counts on the dark side too.
        if (light->_emitAmbient) ambient += illumination._ambient;
    }

    CoRgbaColorTyped<float> result(_emissive + ambient * _ambient + diffuse * _diffuse + specular * _specular,
                                   _opacity);
    if (_irradianceMap.exists()) addTo(result, _irradiance * _irradianceMap.lookUpByNormal(context));
    // Everything so far, highlights, emission and alpha included, is textured.
    result *= _diffuseMap.sample(context);

    // Environment seen in the surface comes on top, untextured and leaving alpha alone.
    if (_reflectionMap.exists()) addTo(result, _reflection * _reflectionMap.lookUpByReflection(context, view));
    if (_refractionMap.exists())
        addTo(result, _refraction * _refractionMap.lookUpByRefraction(context, view, _refractionIndex));
    return result;
}

void RsStdMaterialShader::lockMemoryImpl() {
    for (RsShaderMap* map : {&_diffuseMap, &_reflectionMap, &_refractionMap, &_irradianceMap, &_bumpMap})
        if (!map->_sampler) map->_sampler = createSampler(map->_params);
    for (const RCShdPtr<RsLightShader>& light : _lights) light->lockMemory();
}

void RsStdMaterialShader::unlockMemoryImpl() {
    for (const RsShaderMap* map : {&_diffuseMap, &_reflectionMap, &_refractionMap, &_irradianceMap, &_bumpMap})
        map->releaseTiles();
    for (const RCShdPtr<RsLightShader>& light : _lights) light->unlockMemory();
}

void RsStdMaterialShader::dump(std::ostream& os) const {
    RsMaterialShader::dump(os);
    os << " _emissive:";
    _emissive.dump(os);
    os << " _ambient:";
    _ambient.dump(os);
    os << " _diffuse:";
    _diffuse.dump(os);
    os << " _specular:";
    _specular.dump(os);
    os << " _reflection:";
    _reflection.dump(os);
    os << " _refraction:";
    _refraction.dump(os);
    os << " _irradiance:";
    _irradiance.dump(os);
    os << " _refractionIndex: " << _refractionIndex << " _opacity: " << _opacity << " _shininess: " << _shininess
       << " _specularExponent: " << _specularExponent << " _lights: " << _lights.size()
       << " _neededContext: " << _neededContext;
}

}  // namespace Zr
