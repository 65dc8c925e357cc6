#include "rsABufferFactory.h"

namespace Zr {

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

void RsABufferFactory::dump(std::ostream& os) const {
    RsBufferOutputSettings::dump(os);
    os << " _kernel:";
    _kernel.dump(os);
}

}  // namespace Zr
