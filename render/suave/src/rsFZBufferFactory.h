#pragma once
// What all the region buffers of one render call without anti-aliasing share, and the making of
// one buffer per region. The render driver configures the factory once per call and then asks it
// for the pixel region to draw and for a buffer for each region it draws.
//
// The path has no filter, so regions need no margin (kernel size 0); a region of at most 16384
// pixels (128 x 128) is drawn as one.
#include <ostream>

#include "coRgbaColorTyped.h"
#include "geRectangle.h"
#include "ixTileManip.h"
#include "rcShdPtr.h"
#include "rsBufferOutputSettings.h"
#include "rsFZBuffer.h"

namespace Zr {

class RsDeepShadowMap;

class RsFZBufferFactory : public RsBufferOutputSettings {
public:
    using Buffer = RsFZBuffer;

    static constexpr int kMaxArea = 16384;

    // The output settings' defaults and no deep shadow map.
    RsFZBufferFactory() = default;
    RsFZBufferFactory(const RsFZBufferFactory&) = delete;
    RsFZBufferFactory& operator=(const RsFZBufferFactory&) = delete;

    int getKernelSize() const { return 0; }
    int getMaxArea() const { return kMaxArea; }
    // The output guard's rectangle; with a deep shadow map as output, the square from 0 to the
    // map's size.
    GeRectangle<int> getPixelRegion() const;
    // A buffer for the region, directed at the factory's output.
    RCShdPtr<RsFZBuffer> createBuffer(const GeRectangle<int>& region) const;

    using RsBufferOutputSettings::setOutput;
    void setOutput(RsDeepShadowMap& map) { _deepShadowMap = &map; }
    // Where the buffers hand their arrays and pool on, from region to region: memory that outlives
    // the factory carries them from one render to the next as well. Null for the factory's own.
    void setMemory(RsFZBufferMemory* memory) { _memory = memory != nullptr ? memory : &_ownMemory; }
    // Where the buffers gather surface channels and deep samples; null for none.
    void setAuxOutputs(RsAuxOutputs* aux) { _aux = aux; }
    RsAuxOutputs* getAuxOutputs() const { return _aux; }

    void dump(std::ostream& os) const;

private:
    // The square of the deep shadow map's size.
    GeRectangle<int> getDeepShadowMapRegion() const;

    RsDeepShadowMap* _deepShadowMap = nullptr;
    // Handed from each region's buffer to the next; the buffers die before the factory.
    RsFZBufferMemory _ownMemory;
    RsFZBufferMemory* _memory = &_ownMemory;
    RsAuxOutputs* _aux = nullptr;
};

}  // namespace Zr
