#include "rsStdMaterialShader.h"

#include <cmath>

namespace Zr {

RsStdMaterialShader::RsStdMaterialShader(const RCShdPtr<const SdMaterial>& material)
    : RsLinkedLights(material, RsShadingContext::needsEyeCoord | RsShadingContext::needsNormal),
      _emissive(scaleByTexture(material->_emissive, material->_diffuseMap)),
      _ambient(scaleByTexture(material->_ambient, material->_diffuseMap)),
      _specular(scaleByTexture(material->_specular, material->_diffuseMap)),
      _shininess(material->_shininess),
      _specularExponent(std::exp2(10.0f * material->_shininess)) {}

CoRgbaColorTyped<float> RsStdMaterialShader::shade(RsShadingContext& context) {
    const GeVector3<float> view = bumpAndView(context);
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

    // Everything lit here, highlights, emission and alpha included, is textured by the diffuse map.
    return withEnvironment(
        CoRgbaColorTyped<float>(_emissive + ambient * _ambient + diffuse * _color.getRgb() + specular * _specular,
                                _color.a),
        context, view);
}

void RsStdMaterialShader::lockMemoryImpl() {
    RsEnvironmentShader::lockMemoryImpl();
    for (const RCShdPtr<RsLightShader>& light : _lights) light->lockMemory();
}

void RsStdMaterialShader::unlockMemoryImpl() {
    RsEnvironmentShader::unlockMemoryImpl();
    for (const RCShdPtr<RsLightShader>& light : _lights) light->unlockMemory();
}

void RsStdMaterialShader::dump(std::ostream& os) const {
    RsEnvironmentShader::dump(os);
    os << " _emissive:";
    _emissive.dump(os);
    os << " _ambient:";
    _ambient.dump(os);
    os << " _specular:";
    _specular.dump(os);
    os << " _shininess: " << _shininess << " _specularExponent: " << _specularExponent
       << " _lights: " << _lights.size();
}

}  // namespace Zr
