// Texture lookups against closed forms and brute-force averages, the sampler of missing maps, light
// decay without falloff, and the hue's full turn.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "coHsvColor.h"
#include "exBase.h"
#include "nullTextureSampler.h"
#include "sdStdLight.h"

namespace Zr {
namespace {

using Filter = SdTextureParams::Filter;
using Wrap = SdTextureParams::Wrap;

void expectColor(const Rgba& actual, const Rgba& expected, float tolerance = 1e-5f) {
    EXPECT_NEAR(actual.r, expected.r, tolerance);
    EXPECT_NEAR(actual.g, expected.g, tolerance);
    EXPECT_NEAR(actual.b, expected.b, tolerance);
    EXPECT_NEAR(actual.a, expected.a, tolerance);
}

RCShdPtr<const SdTexture> randomTexture(int width, int height, std::mt19937& rng) {
    std::uniform_real_distribution<float> channel(0.0f, 1.0f);
    std::vector<Rgba> texels;
    for (int i = 0; i < width * height; ++i) {
        const float r = channel(rng), g = channel(rng), b = channel(rng);
        texels.emplace_back(r, g, b, channel(rng));
    }
    return makeShared<SdTexture>(width, height, std::move(texels));
}

OPtr<SdTextureSampler> samplerOf(const RCShdPtr<const SdTexture>& texture, Filter filter, Wrap wrap) {
    return SdTextureParams(texture, 1.0f, filter, wrap).createSampler();
}

const GeLinearMatrix2<double> noFootprint(0.0, 0.0, 0.0, 0.0);

// The lookup at (s, t) for a pixel of no footprint.
Rgba at(const OPtr<SdTextureSampler>& sampler, double s, double t) {
    return sampler->sample(GePoint2<double>(s, t), noFootprint);
}

TEST(SdTextureParams, MissingOrEmptyTexturesGiveOpaqueWhite) {
    for (const RCShdPtr<const SdTexture>& texture : {RCShdPtr<const SdTexture>(), makeShared<const SdTexture>()}) {
        const OPtr<SdTextureSampler> sampler = SdTextureParams(texture, 0.5f).createSampler();
        ASSERT_NE(dynamic_cast<NullTextureSampler*>(sampler.get()), nullptr);
        expectColor(sampler->sample({std::nan(""), 2.0}, GeLinearMatrix2<float>()), Rgba(1, 1, 1, 1), 0.0f);
    }
    std::mt19937 rng(1);
    const OPtr<SdTextureSampler> real = SdTextureParams(randomTexture(2, 2, rng)).createSampler();
    EXPECT_EQ(dynamic_cast<NullTextureSampler*>(real.get()), nullptr);
    EXPECT_THROW(SdTexture(2, 2, std::vector<Rgba>(3)), ExAssertionFailed);
    EXPECT_THROW(SdTexture(0, 1, std::vector<Rgba>()), ExAssertionFailed);
}

// Texel (x, y) covers s in [x / width, (x + 1) / width): its centre gives the texel through every
// filter, and the nearest filter gives it anywhere inside.
TEST(SdImageSampler, TexelCentresGiveTheirTexels) {
    std::mt19937 rng(2);
    const int width = 5, height = 3;
    const RCShdPtr<const SdTexture> texture = randomTexture(width, height, rng);
    std::uniform_real_distribution<double> within(0.01, 0.99);
    for (Filter filter : {Filter::nearest, Filter::bilinear, Filter::footprint})
        for (Wrap wrap : {Wrap::repeat, Wrap::clamp}) {
            const OPtr<SdTextureSampler> sampler = samplerOf(texture, filter, wrap);
            for (int y = 0; y < height; ++y)
                for (int x = 0; x < width; ++x) {
                    const Rgba& texel = texture->getTexel(x, y);
                    expectColor(at(sampler, (x + 0.5) / width, (y + 0.5) / height), texel);
                    expectColor(sampler->sample(x, y), texel, 0.0f);
                    const double s = (x + within(rng)) / width, t = (y + within(rng)) / height;
                    if (filter == Filter::nearest) expectColor(at(sampler, s, t), texel, 0.0f);
                }
        }
}

TEST(SdImageSampler, BilinearBlendsNeighboursLinearlyAndWraps) {
    std::mt19937 rng(3);
    const int size = 4;
    const RCShdPtr<const SdTexture> texture = randomTexture(size, size, rng);
    const OPtr<SdTextureSampler> repeat = samplerOf(texture, Filter::bilinear, Wrap::repeat);
    const OPtr<SdTextureSampler> clamp = samplerOf(texture, Filter::bilinear, Wrap::clamp);
    const auto texel = [&](int x, int y) { return texture->getTexel(x, y); };
    const double t = 1.5 / size;  // on the centres of row 1
    expectColor(at(repeat, 2.0 / size, t), (texel(1, 1) + texel(2, 1)) * 0.5f);
    // At the left edge: repeat blends the last column with the first, clamp keeps the first.
    expectColor(at(repeat, 0.0, t), (texel(size - 1, 1) + texel(0, 1)) * 0.5f);
    expectColor(at(clamp, 0.0, t), texel(0, 1));
    // Texels beyond the image follow the wrap rule.
    expectColor(repeat->sample(-1, 5), texel(size - 1, 1), 0.0f);
    expectColor(clamp->sample(-1, 5), texel(0, size - 1), 0.0f);
    // Repeat is periodic; clamp holds the edge beyond [0, 1]; fractions blend linearly.
    std::uniform_real_distribution<double> coord(0.0, 1.0);
    std::uniform_int_distribution<int> shift(-50, 50);
    for (int trial = 0; trial < 200; ++trial) {
        const double s = coord(rng), u = coord(rng);
        expectColor(at(repeat, s + shift(rng), u + shift(rng)), at(repeat, s, u), 1e-4f);
        expectColor(at(clamp, -1.0 - s, 2.0 + u), at(clamp, 0.0, 1.0));
        const float fx = float(s), fy = float(u);
        const Rgba top = texel(1, 1) * (1 - fx) + texel(2, 1) * fx, bottom = texel(1, 2) * (1 - fx) + texel(2, 2) * fx;
        expectColor(clamp->sample(1, 1, fx, fy), top * (1 - fy) + bottom * fy);
    }
    expectColor(clamp->sample(2, 0, GeLinearMatrix2<float>(3, 1, 4, 1)), texel(2, 0), 0.0f);  // no footprint used
}

TEST(SdImageSampler, FootprintAveragesWhatThePixelCovers) {
    std::mt19937 rng(5);
    const int size = 4;
    const RCShdPtr<const SdTexture> texture = randomTexture(size, size, rng);
    const OPtr<SdTextureSampler> footprint = samplerOf(texture, Filter::footprint, Wrap::repeat);
    const OPtr<SdTextureSampler> bilinear = samplerOf(texture, Filter::bilinear, Wrap::repeat);
    // A pixel covering the whole texture sees the mean of all texels, whichever way round its steps
    // lie, also through float derivatives.
    Rgba mean(0, 0, 0, 0);
    for (const Rgba& texel : texture->getTexels()) mean += texel * (1.0f / (size * size));
    expectColor(footprint->sample({0.5, 0.5}, GeLinearMatrix2<double>(1.0, 0.0, 0.0, 1.0)), mean);
    expectColor(footprint->sample({0.5, 0.5}, GeLinearMatrix2<double>(0.0, -1.0, 1.0, 0.0)), mean);
    expectColor(footprint->sample({0.5, 0.5}, GeLinearMatrix2<float>(1.0f, 0.0f, 0.0f, 1.0f)), mean);
    // Half the texture in s and one texel in t averages a half row.
    expectColor(footprint->sample({0.25, 2.5 / size}, GeLinearMatrix2<double>(0.5, 0.0, 0.0, 0.0)),
                (texture->getTexel(0, 2) + texture->getTexel(1, 2)) * 0.5f);
    std::uniform_real_distribution<double> coord(0.0, 1.0);
    for (int trial = 0; trial < 50; ++trial) {  // a point footprint is the bilinear lookup
        const double s = coord(rng), t = coord(rng);
        expectColor(at(footprint, s, t), at(bilinear, s, t), 0.0f);
    }
    // Coordinates that are not finite give transparent black; an endless footprint is a point.
    const double inf = std::numeric_limits<double>::infinity();
    for (Filter filter : {Filter::nearest, Filter::bilinear, Filter::footprint}) {
        const OPtr<SdTextureSampler> sampler = samplerOf(texture, filter, Wrap::repeat);
        for (double bad : {inf, -inf, std::nan("")}) {
            expectColor(at(sampler, bad, 0.5), Rgba(0, 0, 0, 0), 0.0f);
            expectColor(at(sampler, 0.5, bad), Rgba(0, 0, 0, 0), 0.0f);
            const GeLinearMatrix2<double> endless(bad, 0.0, 0.0, bad);
            expectColor(sampler->sample({0.25, 0.25}, endless), at(sampler, 0.25, 0.25), 0.0f);
        }
    }
}

// A decay parameter that is not positive means no falloff. (Positive parameters and the light's
// decay types meet the light shaders' own closed form in their tests.)
TEST(SdLightDecay, NoFalloffWithoutAPositiveParameter) {
    for (float p : {0.0f, -3.0f, std::nanf("")})
        for (bool kind : {false, true}) EXPECT_EQ(SdLightDecay(kind, p).computeFactor(40.0f), 1.0f);
}

// The hue from RGB lies in [0, 360) (channels 0 to 2 in steps of 0.125: colours are not clamped),
// and the hue to RGB is taken modulo a full turn. (The conversions themselves meet an independent
// hexcone in the tests of the colour-space transfer modes, which never see a hue out of range.)
TEST(CoHsvColor, HueStaysWithinOneTurn) {
    for (int i = 0; i < 17 * 17 * 17; ++i) {
        const CoRgbColorTyped<float> rgb(i % 17 * 0.125F, i / 17 % 17 * 0.125F, i / 289 * 0.125F);
        const CoHsvColor hsv = CoHsvColor::convertFromRgb(rgb);
        ASSERT_TRUE(hsv.h >= 0.0F && hsv.h < 360.0F && hsv.s >= 0.0F && hsv.s <= 1.0F) << rgb;
        const auto back = hsv.convertToRgb(), turned = CoHsvColor(hsv.h - 720.0F, hsv.s, hsv.v).convertToRgb();
        const float d = std::max({std::fabs(turned.r - back.r), std::fabs(turned.g - back.g), std::fabs(turned.b - back.b)});
        ASSERT_LT(d, 1e-4F) << rgb;
    }
}

}  // namespace
}  // namespace Zr
