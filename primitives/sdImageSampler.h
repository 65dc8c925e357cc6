#pragma once
// The sampler of an SdTexture held in memory, with the filter and wrap rule of its map
// (SdTextureParams). Coordinates that are not finite, as a degenerate environment lookup can
// produce, answer transparent black.
#include "rcShdPtr.h"
#include "sdTexture.h"
#include "sdTextureParams.h"
#include "sdTextureSampler.h"

namespace Zr {

class SdImageSampler : public SdTextureSampler {
public:
    // texture must have texels.
    SdImageSampler(RCShdPtr<const SdTexture> texture, SdTextureParams::Filter filter,
                   SdTextureParams::Wrap wrap);
    ~SdImageSampler() override;

    using SdTextureSampler::sample;
    // At most maxBoxSamples by maxBoxSamples bilinear lookups, spread evenly over the box.
    CoRgbaColorTyped<float> sample(const GePoint2<double>& texCoord, double widthS,
                                   double widthT) const override;
    // Texels outside the image follow the wrap rule.
    CoRgbaColorTyped<float> sample(int x, int y) const override;
    CoRgbaColorTyped<float> sample(const GePoint2<double>& texCoord,
                                   const GeLinearMatrix2<double>& derivatives) const override;
    // The texels are in memory already.
    void lockTiles() const override;

    static constexpr int maxBoxSamples = 8;

private:
    CoRgbaColorTyped<float> sampleNearest(double s, double t) const;
    CoRgbaColorTyped<float> sampleBilinear(double s, double t) const;
    // Brings a coordinate into [0, 1) for repeat or [0, 1] for clamp.
    double reduce(double coordinate) const;
    int wrapTexel(int index, int size) const;

    RCShdPtr<const SdTexture> _texture;
    SdTextureParams::Filter _filter;
    SdTextureParams::Wrap _wrap;
};

}  // namespace Zr
