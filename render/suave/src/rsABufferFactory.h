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
#include "rsBufferOutputSettings.h"
#include "rsABuffer.h"
#include "rsFilterKernel.h"

namespace Zr {

class RsABufferFactory : public RsBufferOutputSettings {
public:
    using Buffer = RsABuffer;

    static constexpr int kMaxArea = 8976;

    // The output settings' defaults and the box kernel.
    RsABufferFactory() = default;
    RsABufferFactory(const RsABufferFactory&) = delete;
    RsABufferFactory& operator=(const RsABufferFactory&) = delete;

    int getKernelSize() const { return _kernel.getKernelSupport(); }
    int getMaxArea() const { return kMaxArea; }
    // The output guard's rectangle grown by the kernel's support on all four sides.
    GeRectangle<int> getPixelRegion() const;
    // A buffer for the region, directed at the factory's output.
    RCShdPtr<RsABuffer> createBuffer(const GeRectangle<int>& region) const;

    void setFilterKernel(const RsFilterKernel& kernel) { _kernel = kernel; }
    void dump(std::ostream& os) const;

private:
    RsFilterKernel _kernel{RsFilterKernel::KernelBox};
    // Handed from each region's buffer to the next; the buffers die before the factory.
    mutable RsABufferMemory _memory;
};

}  // namespace Zr
