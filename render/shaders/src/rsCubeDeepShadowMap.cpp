#include "rsCubeDeepShadowMap.h"

namespace Zr {

RsDeepShadowMap& RsCubeDeepShadowMap::getMap(CubeFace face) {
    _faces[face].allocateMap();
    return _faces[face];
}

}  // namespace Zr
