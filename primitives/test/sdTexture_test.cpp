// Texture lookups, the sampler of missing maps, and light decay, against closed forms and
// brute-force averages.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "exBase.h"
#include "nullTextureSampler.h"
#include "sdLightDecay.h"
#include "sdStdLight.h"
#include "sdTextureParams.h"

namespace Zr {
namespace {

using Rgba = CoRgbaColorTyped<float>;

void expectColor(const Rgba& actual, const Rgba& expected, float tolerance = 1e-5f) {
    EXPECT_NEAR(actual.r, expected.r, tolerance);
    EXPECT_NEAR(actual.g, expected.g, tolerance);
    EXPECT_NEAR(actual.b, expected.b, tolerance);
    EXPECT_NEAR(actual.a, expected.a, tolerance);
}

Rgba average(const Rgba& a, const Rgba& b) {
    return Rgba((a.r + b.r) * 0.5f, (a.g + b.g) * 0.5f, (a.b + b.b) * 0.5f, (a.a + b.a) * 0.5f);
}

RCShdPtr<const SdTexture> randomTexture(int width, int height, std::mt19937& rng) {
    std::uniform_real_distribution<float> channel(0.0f, 1.0f);
    std::vector<Rgba> texels;
    for (int i = 0; i < width * height; ++i) texels.emplace_back(channel(rng), channel(rng), channel(rng), channel(rng));
    return makeShared<SdTexture>(width, height, std::move(texels));
}

OPtr<SdTextureSampler> samplerOf(const RCShdPtr<const SdTexture>& texture, SdTextureParams::Filter filter,
                                 SdTextureParams::Wrap wrap) {
    return SdTextureParams(texture, 1.0f, filter, wrap).createSampler();
}

const GeLinearMatrix2<double> noFootprint(0.0, 0.0, 0.0, 0.0);

// A missing or empty map gives a sampler whose every lookup is opaque white.
TEST(SdTextureParams, MissingTexturesGiveOpaqueWhite) {
    const Rgba white(1, 1, 1, 1);
    const std::vector<RCShdPtr<const SdTexture>> missing = {RCShdPtr<const SdTexture>(), makeShared<SdTexture>()};
    for (const RCShdPtr<const SdTexture>& texture : missing) {
        OPtr<SdTextureSampler> sampler = SdTextureParams(texture, 0.5f).createSampler();
        ASSERT_NE(dynamic_cast<NullTextureSampler*>(sampler.get()), nullptr);
        expectColor(sampler->sample(3, 4, 0.5f, 0.25f), white, 0.0f);
        expectColor(sampler->sample(GePoint2<double>(0.3, 0.7), 0.1, 0.2), white, 0.0f);
        expectColor(sampler->sample(GePoint2<double>(std::nan(""), 2.0), GeLinearMatrix2<float>()), white, 0.0f);
    }
    std::mt19937 rng(1);
    OPtr<SdTextureSampler> real = SdTextureParams(randomTexture(2, 2, rng)).createSampler();
    EXPECT_EQ(dynamic_cast<NullTextureSampler*>(real.get()), nullptr);
}

TEST(SdImageSampler, TexelCentresGiveTheirTexels) {
    std::mt19937 rng(2);
    const int width = 5, height = 3;
    RCShdPtr<const SdTexture> texture = randomTexture(width, height, rng);
    std::uniform_real_distribution<double> within(-0.49, 0.49);
    for (SdTextureParams::Filter filter :
         {SdTextureParams::Filter::nearest, SdTextureParams::Filter::bilinear, SdTextureParams::Filter::footprint}) {
        for (SdTextureParams::Wrap wrap : {SdTextureParams::Wrap::repeat, SdTextureParams::Wrap::clamp}) {
            OPtr<SdTextureSampler> sampler = samplerOf(texture, filter, wrap);
            for (int y = 0; y < height; ++y) {
                for (int x = 0; x < width; ++x) {
                    const GePoint2<double> centre((x + 0.5) / width, (y + 0.5) / height);
                    expectColor(sampler->sample(centre, noFootprint), texture->getTexel(x, y));
                    expectColor(sampler->sample(x, y), texture->getTexel(x, y), 0.0f);
                    if (filter == SdTextureParams::Filter::nearest) {
                        // Anywhere inside the texel.
                        const GePoint2<double> inside((x + 0.5 + within(rng)) / width,
                                                      (y + 0.5 + within(rng)) / height);
                        expectColor(sampler->sample(inside, noFootprint), texture->getTexel(x, y), 0.0f);
                    }
                }
            }
        }
    }
}

TEST(SdImageSampler, BilinearBlendsNeighboursAndWraps) {
    std::mt19937 rng(3);
    const int width = 4, height = 4;
    RCShdPtr<const SdTexture> texture = randomTexture(width, height, rng);
    OPtr<SdTextureSampler> repeat = samplerOf(texture, SdTextureParams::Filter::bilinear, SdTextureParams::Wrap::repeat);
    OPtr<SdTextureSampler> clamp = samplerOf(texture, SdTextureParams::Filter::bilinear, SdTextureParams::Wrap::clamp);
    const double t = 1.5 / height;  // on the centres of row 1
    // Halfway between the centres of columns 1 and 2.
    expectColor(repeat->sample(GePoint2<double>(2.0 / width, t), noFootprint),
                average(texture->getTexel(1, 1), texture->getTexel(2, 1)));
    // At the left edge: repeat blends the last column with the first, clamp keeps the first.
    expectColor(repeat->sample(GePoint2<double>(0.0, t), noFootprint),
                average(texture->getTexel(width - 1, 1), texture->getTexel(0, 1)));
    expectColor(clamp->sample(GePoint2<double>(0.0, t), noFootprint), texture->getTexel(0, 1));

    // Repeat is periodic; clamp holds the edge beyond [0, 1].
    std::uniform_real_distribution<double> coord(0.0, 1.0);
    std::uniform_int_distribution<int> shift(-50, 50);
    for (int trial = 0; trial < 200; ++trial) {
        const GePoint2<double> p(coord(rng), coord(rng));
        const GePoint2<double> moved(p.x + shift(rng), p.y + shift(rng));
        expectColor(repeat->sample(moved, noFootprint), repeat->sample(p, noFootprint), 1e-4f);
        const GePoint2<double> outside(-1.0 - coord(rng), 2.0 + coord(rng));
        expectColor(clamp->sample(outside, noFootprint), clamp->sample(GePoint2<double>(0.0, 1.0), noFootprint));
    }
    // Texels beyond the image follow the wrap rule.
    expectColor(repeat->sample(-1, 5), texture->getTexel(width - 1, 1), 0.0f);
    expectColor(clamp->sample(-1, 5), texture->getTexel(0, height - 1), 0.0f);
}

TEST(SdImageSampler, FractionalTexelLookupIsLinearBetweenNeighbours) {
    std::mt19937 rng(4);
    RCShdPtr<const SdTexture> texture = randomTexture(3, 3, rng);
    OPtr<SdTextureSampler> sampler = samplerOf(texture, SdTextureParams::Filter::bilinear, SdTextureParams::Wrap::clamp);
    expectColor(sampler->sample(1, 1, 0.0f, 0.0f), texture->getTexel(1, 1));
    expectColor(sampler->sample(1, 1, 1.0f, 0.0f), texture->getTexel(2, 1));
    expectColor(sampler->sample(1, 1, 0.0f, 1.0f), texture->getTexel(1, 2));
    expectColor(sampler->sample(1, 1, 1.0f, 1.0f), texture->getTexel(2, 2));
    std::uniform_real_distribution<float> fraction(0.0f, 1.0f);
    for (int trial = 0; trial < 50; ++trial) {
        const float f = fraction(rng);
        const Rgba a = texture->getTexel(0, 0), b = texture->getTexel(1, 0);
        expectColor(sampler->sample(0, 0, f, 0.0f),
                    Rgba(a.r + (b.r - a.r) * f, a.g + (b.g - a.g) * f, a.b + (b.b - a.b) * f, a.a + (b.a - a.a) * f));
    }
    // The texel lookup with a footprint ignores the footprint.
    expectColor(sampler->sample(2, 0, GeLinearMatrix2<float>(3, 1, 4, 1)), texture->getTexel(2, 0), 0.0f);
}

TEST(SdImageSampler, FootprintAveragesWhatThePixelCovers) {
    std::mt19937 rng(5);
    const int width = 4, height = 4;
    RCShdPtr<const SdTexture> texture = randomTexture(width, height, rng);
    OPtr<SdTextureSampler> footprint =
        samplerOf(texture, SdTextureParams::Filter::footprint, SdTextureParams::Wrap::repeat);
    OPtr<SdTextureSampler> bilinear = samplerOf(texture, SdTextureParams::Filter::bilinear, SdTextureParams::Wrap::repeat);

    // A pixel covering the whole texture sees the mean of all texels, whichever way round its
    // steps lie.
    Rgba mean(0, 0, 0, 0);
    for (const Rgba& texel : texture->getTexels()) mean = mean + texel * (1.0f / (width * height));
    expectColor(footprint->sample(GePoint2<double>(0.5, 0.5), GeLinearMatrix2<double>(1.0, 0.0, 0.0, 1.0)), mean);
    expectColor(footprint->sample(GePoint2<double>(0.5, 0.5), GeLinearMatrix2<double>(0.0, -1.0, 1.0, 0.0)), mean);
    // The same through float derivatives.
    expectColor(footprint->sample(GePoint2<double>(0.5, 0.5), GeLinearMatrix2<float>(1.0f, 0.0f, 0.0f, 1.0f)), mean);

    // A footprint of half the texture in s and one texel in t averages a half row.
    const Rgba halfRow = (texture->getTexel(0, 2) + texture->getTexel(1, 2)) * 0.5f;
    expectColor(footprint->sample(GePoint2<double>(0.25, 2.5 / height), GeLinearMatrix2<double>(0.5, 0.0, 0.0, 0.0)),
                halfRow);

    // A point footprint is the bilinear lookup.
    std::uniform_real_distribution<double> coord(0.0, 1.0);
    for (int trial = 0; trial < 50; ++trial) {
        const GePoint2<double> p(coord(rng), coord(rng));
        expectColor(footprint->sample(p, noFootprint), bilinear->sample(p, noFootprint), 0.0f);
    }
}

TEST(SdImageSampler, CoordinatesThatAreNotFiniteGiveTransparentBlack) {
    std::mt19937 rng(6);
    RCShdPtr<const SdTexture> texture = randomTexture(2, 2, rng);
    const double bad[] = {std::numeric_limits<double>::infinity(), -std::numeric_limits<double>::infinity(),
                          std::nan("")};
    for (SdTextureParams::Filter filter :
         {SdTextureParams::Filter::nearest, SdTextureParams::Filter::bilinear, SdTextureParams::Filter::footprint}) {
        OPtr<SdTextureSampler> sampler = samplerOf(texture, filter, SdTextureParams::Wrap::repeat);
        for (double value : bad) {
            expectColor(sampler->sample(GePoint2<double>(value, 0.5), noFootprint), Rgba(0, 0, 0, 0), 0.0f);
            expectColor(sampler->sample(GePoint2<double>(0.5, value), noFootprint), Rgba(0, 0, 0, 0), 0.0f);
        }
        // An endless footprint is taken as a point.
        const GeLinearMatrix2<double> endless(bad[0], 0.0, 0.0, bad[2]);
        expectColor(sampler->sample(GePoint2<double>(0.25, 0.25), endless),
                    sampler->sample(GePoint2<double>(0.25, 0.25), noFootprint), 0.0f);
    }
}

TEST(SdTexture, SizeMustMatchTheTexels) {
    EXPECT_THROW(SdTexture(2, 2, std::vector<Rgba>(3)), ExAssertionFailed);
    EXPECT_THROW(SdTexture(0, 1, std::vector<Rgba>()), ExAssertionFailed);
}

TEST(SdLightDecay, HalvesAtTheParameterDistance) {
    const SdLightDecay none;
    std::mt19937 rng(8);
    std::uniform_real_distribution<float> parameter(0.01f, 100.0f), distance(0.0f, 500.0f);
    for (int trial = 0; trial < 100; ++trial) {
        const float p = parameter(rng);
        const float d = distance(rng);
        const SdLightDecay linear(false, p), quadratic(true, p);
        EXPECT_NEAR(linear.computeFactor(p), 0.5f, 1e-5f);
        EXPECT_NEAR(quadratic.computeFactor(p), 0.5f, 1e-5f);
        EXPECT_NEAR(linear.computeFactor(d), p / (p + d), 1e-5f);
        EXPECT_NEAR(quadratic.computeFactor(d), p * p / (p * p + d * d), 1e-5f);
        EXPECT_EQ(none.computeFactor(d), 1.0f);
    }
    for (float p : {0.0f, -3.0f, std::nanf("")}) {
        for (bool kind : {false, true}) EXPECT_EQ(SdLightDecay(kind, p).computeFactor(40.0f), 1.0f);
    }
}

TEST(SdLightDecay, StandardLightDecaysByItsType) {
    SdStdLight light;
    light._decayParameter = 4.0f;
    light._decayType = SdStdLight::DecayType::none;
    EXPECT_FALSE(light.getDecay()._hasQuadratic);
    light._decayType = SdStdLight::DecayType::linear;
    EXPECT_FALSE(light.getDecay()._hasQuadratic);
    EXPECT_NEAR(light.getDecay().computeFactor(4.0f), 0.5f, 1e-6f);
    light._decayType = SdStdLight::DecayType::quadratic;
    EXPECT_TRUE(light.getDecay()._hasQuadratic);
    EXPECT_NEAR(light.getDecay().computeFactor(8.0f), 0.2f, 1e-6f);
}

}  // namespace
}  // namespace Zr
