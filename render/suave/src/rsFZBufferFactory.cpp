#include "rsFZBufferFactory.h"

#include "rsDeepShadowMap.h"

namespace Zr {

namespace {
// The fill colour of a new factory: no colour, full coverage.
constexpr CoRgbaColorTyped<float> kOpaqueBlack(0.0f, 0.0f, 0.0f, 1.0f);
}  // namespace

RsFZBufferFactory::RsFZBufferFactory() : _fillColor(kOpaqueBlack) {}

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

void RsFZBufferFactory::setOutput(const IxWriteGuard& output, bool accumulate, float weight) {
    _output = output;
    _accumulate = accumulate;
    _weight = weight;
}

void RsFZBufferFactory::dump(std::ostream& os) const {
    os << " _zBuffer: " << _zBuffer << " _output: ";
    _output.dump(os);
    os << " _accumulate: " << _accumulate << " _weight: " << _weight << " _fillColor: ";
    _fillColor.dump(os);
    os << " _background: ";
    _background.dump(os);
    os << " _deepShadowMap: " << static_cast<const void*>(_deepShadowMap) << " _unpremultiply: " << _unpremultiply;
}

}  // namespace Zr
