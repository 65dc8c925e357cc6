#include "rsABufferFactory.h"

namespace Zr {

namespace {
// The fill colour of a new factory: no colour, full coverage.
constexpr CoRgbaColorTyped<float> kOpaqueBlack(0.0f, 0.0f, 0.0f, 1.0f);
}  // namespace

RsABufferFactory::RsABufferFactory() : _fillColor(kOpaqueBlack) {}

GeRectangle<int> RsABufferFactory::getPixelRegion() const {
    const GeRectangle<int>& r = _output._rectangle;
    const int s = _kernel.getKernelSupport();
    return {r.x0 - s, r.x1 + s, r.y0 - s, r.y1 + s};
}

RCShdPtr<RsABuffer> RsABufferFactory::createBuffer(const GeRectangle<int>& region) const {
    RCShdPtr<RsABuffer> buffer = makeShared<RsABuffer>(region.x0, region.y0, region.getWidth(), region.getHeight(),
                                                       _zBuffer, _unpremultiply, &_memory);
    buffer->setOutput(_output, _background, _fillColor, _accumulate, _weight, _kernel);
    return buffer;
}

void RsABufferFactory::setOutput(const IxWriteGuard& output, bool accumulate, float weight) {
    _output = output;
    _accumulate = accumulate;
    _weight = weight;
}

void RsABufferFactory::dump(std::ostream& os) const {
    os << " _zBuffer: " << _zBuffer << " _output: ";
    _output.dump(os);
    os << " _accumulate: " << _accumulate << " _weight: " << _weight << " _fillColor: ";
    _fillColor.dump(os);
    os << " _background: ";
    _background.dump(os);
    os << " _unpremultiply: " << _unpremultiply << " _kernel:";
    _kernel.dump(os);
}

}  // namespace Zr
