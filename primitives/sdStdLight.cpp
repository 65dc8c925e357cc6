#include "sdStdLight.h"

namespace Zr {

void SdStdLight::dump(std::ostream& os) const {
    SdLight::dump(os);
    os << " _kind: " << static_cast<int>(_kind) << " _color: " << _color.r << ' ' << _color.g
       << ' ' << _color.b << " _shadowColor: " << _shadowColor.r << ' ' << _shadowColor.g << ' '
       << _shadowColor.b << " _intensity: " << _intensity << " _shadowStrength: "
       << _shadowStrength << " _shadowColorMultiplies: " << _shadowColorMultiplies
       << " _decayType: " << static_cast<int>(_decayType) << " _decayParameter: "
       << _decayParameter << " _coneShape: " << static_cast<int>(_coneShape)
       << " _aspect: " << _aspect << " _innerConeAngle: " << _innerConeAngle
       << " _outerConeAngle: " << _outerConeAngle << " _useProjectedMap: " << _useProjectedMap
       << " _projectedMap: " << static_cast<const void*>(_projectedMap.get())
       << " _width: " << _width << " _shadowsActive: " << _shadowsActive
       << " _shadowsEnabled: " << _shadowsEnabled
       << " _shadowMapType: " << static_cast<int>(_shadowMapType)
       << " _shadowMapSize: " << _shadowMapSize << " _shadowBias: " << _shadowBias
       << " _shadowRange: " << _shadowRange;
}

}  // namespace Zr
