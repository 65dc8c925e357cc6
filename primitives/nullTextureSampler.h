#pragma once
// The sampler of a map that is not there: every lookup answers (1, 1, 1, 1), so that a shader can
// multiply by its samples without asking whether a map exists. Its other operations do nothing.
#include "sdTextureSampler.h"

namespace Zr {

class NullTextureSampler : public SdTextureSampler {
public:
    NullTextureSampler() = default;
    ~NullTextureSampler() override;

    using SdTextureSampler::sample;
    CoRgbaColorTyped<float> sample(int x, int y, float fx, float fy) const override;
    CoRgbaColorTyped<float> sample(const GePoint2<double>& texCoord, double widthS,
                                   double widthT) const override;
    CoRgbaColorTyped<float> sample(int x, int y) const override;
    CoRgbaColorTyped<float> sample(int x, int y,
                                   const GeLinearMatrix2<float>& derivatives) const override;
    CoRgbaColorTyped<float> sample(const GePoint2<double>& texCoord,
                                   const GeLinearMatrix2<double>& derivatives) const override;
    CoRgbaColorTyped<float> sample(const GePoint2<double>& texCoord,
                                   const GeLinearMatrix2<float>& derivatives) const override;
    void lockTiles() const override;
};

}  // namespace Zr
