#pragma once
// A map of a material or a light: which texture, how strongly it counts, and how it is looked up.
// Shaders fold the weight into their constant colours and make one sampler from the map
// (createSampler) when they are first locked.
#include <cstdint>

#include "oPtr.h"
#include "rcBase.h"
#include "rcShdPtr.h"
#include "sdTexture.h"
#include "sdTextureSampler.h"

namespace Zr {

class SdTextureParams : public RCObject {
public:
    // nearest: the texel under the coordinate. bilinear: a blend of the four nearest texels.
    // footprint: an average over the pixel's footprint in texture space, which needs the screen
    // derivatives of the texture coordinates.
    enum class Filter : std::int32_t { nearest = 0, bilinear = 1, footprint = 2 };
    // What lies beyond [0, 1]: the texture again (repeat) or its edge texels (clamp).
    enum class Wrap : std::int32_t { repeat = 0, clamp = 1 };

    SdTextureParams() = default;
    explicit SdTextureParams(RCShdPtr<const SdTexture> texture, float weight = 1.0f,
                             Filter filter = Filter::bilinear, Wrap wrap = Wrap::repeat);
    ~SdTextureParams() override;

    float getWeight() const { return _weight; }
    const RCShdPtr<const SdTexture>& getTexture() const { return _texture; }
    // Whether a lookup must be given the screen derivatives of the texture coordinates.
    bool needsDerivatives() const { return _filter == Filter::footprint; }

    // A new sampler of this map, owned by the caller: one over the texture, or a
    // NullTextureSampler when there is no texture or it has no texels. A host may derive to hand
    // out samplers of its own.
    virtual OPtr<SdTextureSampler> createSampler() const;

    RCShdPtr<const SdTexture> _texture;
    float _weight = 1.0f;
    Filter _filter = Filter::bilinear;
    Wrap _wrap = Wrap::repeat;
};

}  // namespace Zr
