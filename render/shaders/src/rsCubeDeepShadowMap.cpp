#include "rsCubeDeepShadowMap.h"

namespace Zr {

RsCubeDeepShadowMap::RsCubeDeepShadowMap() = default;

RsCubeDeepShadowMap::~RsCubeDeepShadowMap() = default;

CoRgbColorTyped<float> RsCubeDeepShadowMap::computeBestShadow(const GePoint3<float>& point) const {
    return pickFace(point).computeBestShadow(point);
}

CoRgbColorTyped<float> RsCubeDeepShadowMap::computeFastShadow(const GePoint3<float>& point) const {
    return pickFace(point).computeFastShadow(point);
}

RsDeepShadowMap& RsCubeDeepShadowMap::getMap(CubeFace face) {
    _faces[face].allocateMap();
    return _faces[face];
}

}  // namespace Zr
