#include "rsCubeShadowMap.h"

namespace Zr {

RsCubeShadowMap::RsCubeShadowMap() = default;

RsCubeShadowMap::~RsCubeShadowMap() = default;

CoRgbColorTyped<float> RsCubeShadowMap::computeBestShadow(const GePoint3<float>& point) const {
    return pickFace(point).computeBestShadow(point);
}

CoRgbColorTyped<float> RsCubeShadowMap::computeFastShadow(const GePoint3<float>& point) const {
    return pickFace(point).computeFastShadow(point);
}

}  // namespace Zr
