#include "sdMaterial.h"

namespace Zr {

namespace {
void dumpColor(std::ostream& os, const char* name, const CoRgbColorTyped<float>& c) {
    os << ' ' << name << ": " << c.r << ' ' << c.g << ' ' << c.b;
}
}  // namespace

void SdMaterial::dump(std::ostream& os) const {
    os << " _shadingModel: " << static_cast<int>(_shadingModel)
       << " _transferMode: " << static_cast<int>(_transferMode);
    dumpColor(os, "_ambient", _ambient);
    dumpColor(os, "_diffuse", _diffuse);
    dumpColor(os, "_specular", _specular);
    dumpColor(os, "_emissive", _emissive);
    dumpColor(os, "_reflection", _reflection);
    dumpColor(os, "_refraction", _refraction);
    dumpColor(os, "_irradiance", _irradiance);
    os << " _opacity: " << _opacity << " _shininess: " << _shininess
       << " _refractionIndex: " << _refractionIndex << " _shadowStrength: " << _shadowStrength
       << " _inverted: " << _inverted << " _wireframe: " << _wireframe
       << " _screenSpace: " << _screenSpace << " _wireSize: " << _wireSize
       << " _diffuseMap: " << static_cast<const void*>(_diffuseMap.get())
       << " _reflectionMap: " << static_cast<const void*>(_reflectionMap.get())
       << " _refractionMap: " << static_cast<const void*>(_refractionMap.get())
       << " _irradianceMap: " << static_cast<const void*>(_irradianceMap.get())
       << " _bumpMap: " << static_cast<const void*>(_bumpMap.get());
}

}  // namespace Zr
