#include "rsFZBufferFactory.h"

#include "rsDeepShadowMap.h"

namespace Zr {

GeRectangle<int> RsFZBufferFactory::getPixelRegion() const {
    if (_deepShadowMap != nullptr) return getDeepShadowMapRegion();
    return _output._rectangle;
}

GeRectangle<int> RsFZBufferFactory::getDeepShadowMapRegion() const {
    const int size = static_cast<int>(_deepShadowMap->getSize());
    return {0, size, 0, size};
}

RCShdPtr<RsFZBuffer> RsFZBufferFactory::createBuffer(const GeRectangle<int>& region) const {
    RCShdPtr<RsFZBuffer> buffer = makeShared<RsFZBuffer>(region.x0, region.y0, region.getWidth(),
                                                         region.getHeight(), _zBuffer, _unpremultiply, _memory, _aux);
    if (_deepShadowMap != nullptr) buffer->setOutput(*_deepShadowMap);
    else buffer->setOutput(_output, _background, _fillColor, _accumulate, _weight);
    return buffer;
}

void RsFZBufferFactory::dump(std::ostream& os) const {
    RsBufferOutputSettings::dump(os);
    os << " _deepShadowMap: " << static_cast<const void*>(_deepShadowMap);
}

}  // namespace Zr
