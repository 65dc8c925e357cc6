#include "sdLight.h"

namespace Zr {

void SdLight::dump(std::ostream& os) const {
    os << " _enabled: " << _enabled << " _linkMode: " << static_cast<int>(_linkMode)
       << " _emitAmbient: " << _emitAmbient << " _emitDiffuse: " << _emitDiffuse
       << " _emitSpecular: " << _emitSpecular;
}

}  // namespace Zr
