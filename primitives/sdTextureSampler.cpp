#include "sdTextureSampler.h"

namespace Zr {

SdTextureSampler::~SdTextureSampler() = default;

void SdTextureSampler::releaseGuard() const {}

CoRgbaColorTyped<float> SdTextureSampler::sample(int x, int y, float fx, float fy) const {
    const CoRgbaColorTyped<float> c00 = sample(x, y);
    const CoRgbaColorTyped<float> c10 = sample(x + 1, y);
    const CoRgbaColorTyped<float> c01 = sample(x, y + 1);
    const CoRgbaColorTyped<float> c11 = sample(x + 1, y + 1);
    const float w00 = (1.0f - fx) * (1.0f - fy);
    const float w10 = fx * (1.0f - fy);
    const float w01 = (1.0f - fx) * fy;
    const float w11 = fx * fy;
    return CoRgbaColorTyped<float>{c00.r * w00 + c10.r * w10 + c01.r * w01 + c11.r * w11,
                                   c00.g * w00 + c10.g * w10 + c01.g * w01 + c11.g * w11,
                                   c00.b * w00 + c10.b * w10 + c01.b * w01 + c11.b * w11,
                                   c00.a * w00 + c10.a * w10 + c01.a * w01 + c11.a * w11};
}

CoRgbaColorTyped<float> SdTextureSampler::sample(int x, int y,
                                                 const GeLinearMatrix2<float>&) const {
    return sample(x, y);
}

CoRgbaColorTyped<float> SdTextureSampler::sample(const GePoint2<double>& texCoord,
                                                 const GeLinearMatrix2<float>& derivatives) const {
    return sample(texCoord, GeLinearMatrix2<double>(derivatives));
}

int SdTextureSampler::getCacheBlockingSizeX() const { return 64; }
int SdTextureSampler::getCacheBlockingSizeY() const { return 64; }

void SdTextureSampler::releaseTiles() const {}

void SdTextureSampler::registerGuardProxy(const IxGuardProxy&) const {}

}  // namespace Zr
