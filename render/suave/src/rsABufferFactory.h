#pragma once
// What all the region buffers of one anti-aliased render call share, and the making of one A-buffer
// per region. The render driver configures the factory once per call and then asks it for the
// pixel region to draw and for a buffer for each region it draws.
//
// The filter reaches the kernel's support in pixels around each pixel, so the pixel region is the
// output's grown by the support on every side, and neighbouring regions overlap by twice the
// support (the kernel size): each region then holds the fragments that the filter reads at the
// pixels it writes. A region of at most 8976 pixels is drawn as one.
#include <ostream>

#include "coRgbaColorTyped.h"
#include "geRectangle.h"
#include "ixTileManip.h"
#include "rcShdPtr.h"
#include "rsABuffer.h"
#include "rsFilterKernel.h"

namespace Zr {

class RsABufferFactory {
public:
    using Buffer = RsABuffer;
    using Rgba = CoRgbaColorTyped<float>;

    static constexpr int kMaxArea = 8976;

    // Depth test on, no output, not accumulating, weight 1, opaque black fill, no background,
    // unpremultiplied output, the box kernel.
    RsABufferFactory();
    RsABufferFactory(const RsABufferFactory&) = delete;
    RsABufferFactory& operator=(const RsABufferFactory&) = delete;

    int getKernelSize() const { return _kernel.getKernelSupport(); }
    int getMaxArea() const { return kMaxArea; }
    // The output guard's rectangle grown by the kernel's support on all four sides.
    GeRectangle<int> getPixelRegion() const;
    // A buffer for the region, directed at the factory's output.
    RCShdPtr<RsABuffer> createBuffer(const GeRectangle<int>& region) const;

    void setFilterKernel(const RsFilterKernel& kernel) { _kernel = kernel; }
    void setUnpremultiply(bool unpremultiply) { _unpremultiply = unpremultiply; }
    void setZBuffer(bool zBuffer) { _zBuffer = zBuffer; }
    void setFillColor(const Rgba& fillColor) { _fillColor = fillColor; }
    void setBackground(const IxReadGuard& background) { _background = background; }
    // The output tile, whether the resolve adds to it instead of replacing it, and the weight of
    // the finished pixels.
    void setOutput(const IxWriteGuard& output, bool accumulate, float weight);

    void dump(std::ostream& os) const;

private:
    bool _zBuffer = true;
    IxTileManip::WriteGuardNoCheck _output;
    bool _accumulate = false;
    float _weight = 1.0f;
    Rgba _fillColor;
    IxTileManip::ReadGuardNoCheck _background;
    bool _unpremultiply = true;
    RsFilterKernel _kernel{RsFilterKernel::KernelBox};
    // Handed from each region's buffer to the next; the buffers die before the factory.
    mutable RsABufferMemory _memory;
};

}  // namespace Zr
