#include "sdImageSampler.h"

#include <algorithm>
#include <cmath>
#include <utility>

#include "assertions.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = ".\\primitives/sdImageSampler.cpp";

const CoRgbaColorTyped<float> transparent{0.0f, 0.0f, 0.0f, 0.0f};

// How many evenly spread lookups cover a box of the given width in texels.
int boxSampleCount(double widthInTexels) {
    if (!(widthInTexels > 1.0)) return 1;
    return static_cast<int>(std::min<double>(std::ceil(widthInTexels), SdImageSampler::maxBoxSamples));
}

}  // namespace

SdImageSampler::SdImageSampler(RCShdPtr<const SdTexture> texture, SdTextureParams::Filter filter,
                               SdTextureParams::Wrap wrap)
    : _texture(std::move(texture)), _filter(filter), _wrap(wrap) {
    ZR_ASSERT_AT(!_texture.isNull() && !_texture->isEmpty(), kSourceFile, __LINE__);
}

SdImageSampler::~SdImageSampler() = default;

int SdImageSampler::wrapTexel(int index, int size) const {
    if (_wrap == SdTextureParams::Wrap::clamp) return std::clamp(index, 0, size - 1);
    const int wrapped = index % size;
    return wrapped < 0 ? wrapped + size : wrapped;
}

double SdImageSampler::reduce(double coordinate) const {
    if (_wrap == SdTextureParams::Wrap::clamp) return std::clamp(coordinate, 0.0, 1.0);
    const double reduced = coordinate - std::floor(coordinate);
    // Rounding can give exactly 1 for a tiny negative coordinate.
    return reduced < 1.0 ? reduced : 0.0;
}

CoRgbaColorTyped<float> SdImageSampler::sample(int x, int y) const {
    return _texture->getTexel(wrapTexel(x, _texture->getWidth()), wrapTexel(y, _texture->getHeight()));
}

CoRgbaColorTyped<float> SdImageSampler::sampleNearest(double s, double t) const {
    // After reduction both products lie within [0, size], so the conversions cannot overflow.
    const int x = static_cast<int>(std::floor(reduce(s) * _texture->getWidth()));
    const int y = static_cast<int>(std::floor(reduce(t) * _texture->getHeight()));
    return sample(x, y);
}

CoRgbaColorTyped<float> SdImageSampler::sampleBilinear(double s, double t) const {
    // Texel centres lie at (x + 0.5) / width: the blend runs between the centres around (s, t).
    const double u = reduce(s) * _texture->getWidth() - 0.5;
    const double v = reduce(t) * _texture->getHeight() - 0.5;
    const double x0 = std::floor(u);
    const double y0 = std::floor(v);
    return SdTextureSampler::sample(static_cast<int>(x0), static_cast<int>(y0),
                                    static_cast<float>(u - x0), static_cast<float>(v - y0));
}

CoRgbaColorTyped<float> SdImageSampler::sample(const GePoint2<double>& texCoord, double widthS,
                                               double widthT) const {
    if (!std::isfinite(texCoord.x) || !std::isfinite(texCoord.y)) return transparent;
    // A footprint of no known size is taken as a point.
    if (!std::isfinite(widthS)) widthS = 0.0;
    if (!std::isfinite(widthT)) widthT = 0.0;
    const int countS = boxSampleCount(std::fabs(widthS) * _texture->getWidth());
    const int countT = boxSampleCount(std::fabs(widthT) * _texture->getHeight());
    float r = 0.0f, g = 0.0f, b = 0.0f, a = 0.0f;
    for (int j = 0; j < countT; ++j) {
        const double t = texCoord.y + widthT * ((j + 0.5) / countT - 0.5);
        for (int i = 0; i < countS; ++i) {
            const double s = texCoord.x + widthS * ((i + 0.5) / countS - 0.5);
            const CoRgbaColorTyped<float> c = sampleBilinear(s, t);
            r += c.r;
            g += c.g;
            b += c.b;
            a += c.a;
        }
    }
    const float scale = 1.0f / static_cast<float>(countS * countT);
    return CoRgbaColorTyped<float>{r * scale, g * scale, b * scale, a * scale};
}

CoRgbaColorTyped<float> SdImageSampler::sample(const GePoint2<double>& texCoord,
                                               const GeLinearMatrix2<double>& derivatives) const {
    if (!std::isfinite(texCoord.x) || !std::isfinite(texCoord.y)) return transparent;
    switch (_filter) {
    case SdTextureParams::Filter::nearest:
        return sampleNearest(texCoord.x, texCoord.y);
    case SdTextureParams::Filter::footprint: {
        // The box that holds the parallelogram spanned by the pixel's two steps.
        const double widthS = std::fabs(derivatives(0, 0)) + std::fabs(derivatives(1, 0));
        const double widthT = std::fabs(derivatives(0, 1)) + std::fabs(derivatives(1, 1));
        return sample(texCoord, widthS, widthT);
    }
    case SdTextureParams::Filter::bilinear:
    default:
        return sampleBilinear(texCoord.x, texCoord.y);
    }
}

void SdImageSampler::lockTiles() const {}

}  // namespace Zr
