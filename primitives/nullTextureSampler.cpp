#include "nullTextureSampler.h"

namespace Zr {

namespace {
const CoRgbaColorTyped<float> white{1.0f, 1.0f, 1.0f, 1.0f};
}

NullTextureSampler::~NullTextureSampler() = default;

CoRgbaColorTyped<float> NullTextureSampler::sample(int, int, float, float) const { return white; }
CoRgbaColorTyped<float> NullTextureSampler::sample(const GePoint2<double>&, double,
                                                   double) const {
    return white;
}
CoRgbaColorTyped<float> NullTextureSampler::sample(int, int) const { return white; }
CoRgbaColorTyped<float> NullTextureSampler::sample(int, int,
                                                   const GeLinearMatrix2<float>&) const {
    return white;
}
CoRgbaColorTyped<float> NullTextureSampler::sample(const GePoint2<double>&,
                                                   const GeLinearMatrix2<double>&) const {
    return white;
}
CoRgbaColorTyped<float> NullTextureSampler::sample(const GePoint2<double>&,
                                                   const GeLinearMatrix2<float>&) const {
    return white;
}

void NullTextureSampler::lockTiles() const {}

}  // namespace Zr
