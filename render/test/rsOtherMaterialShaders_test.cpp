// The unlit material shaders, the shadow shader and the shadow matte against closed forms: flat
// colour times the diffuse map with the simple shader's environment on top, the transmittance of a
// surface seen from a light, and the matte's shadow sum shared out among zero, one and two linked
// lights, inverted or not.
#include <gtest/gtest.h>

#include <random>
#include <string>

#include "rsNoShadeMaterialShader.h"
#include "rsShadowMatteShader.h"
#include "rsShadowShader.h"
#include "rsSimpleMaterialShader.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;
using Rgb = CoRgbColorTyped<float>;

Rgb randomRgb(std::mt19937& rng) {
    std::uniform_real_distribution<float> u(0.0f, 1.0f);
    return {u(rng), u(rng), u(rng)};
}

Rgba shadeLocked(RsMaterialShader& shader) {
    RsShadingContext context;
    context._normal = GeVector3<float>(0.6f, 0.0f, 0.8f);
    context._eyeCoord = GePoint3<float>(0.2f, 0.1f, -3.0f);
    shader.lockMemory();
    const Rgba colour = shader.shade(context);
    shader.unlockMemory();
    return colour;
}

// With constant map samples: the no-shade shader gives (diffuse x weight, opacity) x the diffuse
// sample; the simple shader adds the irradiance (times both weights) before the diffuse sample and
// the reflection and refraction (times their own weights) after it.
TEST(RsUnlitMaterialShaders, FlatColourTimesTheDiffuseMapWithTheEnvironmentOnTop) {
    std::mt19937 rng(23);
    std::uniform_real_distribution<float> weight(0.2f, 1.5f);
    for (int trial = 0; trial < 60; ++trial) {
        RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
        m->_diffuse = randomRgb(rng);
        m->_irradiance = randomRgb(rng);
        m->_reflection = randomRgb(rng);
        m->_refraction = randomRgb(rng);
        m->_opacity = std::uniform_real_distribution<float>(0.0f, 1.0f)(rng);
        const bool mapped = trial % 3 != 0, environment = trial % 2 == 0;
        const float wd = mapped ? weight(rng) : 1.0f, wi = weight(rng), wl = weight(rng), wr = weight(rng);
        const Rgba ds = mapped ? Rgba(randomRgb(rng), 0.5f) : Rgba(1, 1, 1, 1), is(randomRgb(rng), 1),
                   ls(randomRgb(rng), 1), rs(randomRgb(rng), 1);
        if (mapped) m->_diffuseMap = makeShared<ConstantParams>(ds, wd);
        if (environment) {
            m->_irradianceMap = makeShared<ConstantParams>(is, wi);
            m->_reflectionMap = makeShared<ConstantParams>(ls, wl);
            m->_refractionMap = makeShared<ConstantParams>(rs, wr);
        }
        RsNoShadeMaterialShader noShade(m);
        RsSimpleMaterialShader simple(m);
        Rgba flat, mirrored;
        for (int k = 0; k < 3; ++k) {
            const auto ch = [k](const auto& c) { return double(channelOf(Rgba(c.r, c.g, c.b, 0), k)); };
            channelOf(flat, k) = float(wd * ch(m->_diffuse) * ch(ds));
            channelOf(mirrored, k) = !environment ? channelOf(flat, k)
                                                  : float((wd * ch(m->_diffuse) + wd * wi * ch(m->_irradiance) * ch(is)) *
                                                              ch(ds) +
                                                          wl * ch(m->_reflection) * ch(ls) +
                                                          wr * ch(m->_refraction) * ch(rs));
        }
        flat.a = mirrored.a = m->_opacity * ds.a;
        expectNearRgba(shadeLocked(noShade), flat, 1e-6, "no shade, trial " + std::to_string(trial));
        expectNearRgba(shadeLocked(simple), mirrored, 2e-6, "simple, trial " + std::to_string(trial));
    }
}

// Seen from a light, a surface of coverage a = opacity x map alpha lets u = 1 - a through untinted
// and tints the rest by its colour and map, and what passes is scaled by u once more: clear gives
// white without alpha, opaque gives black with alpha 1, whatever the colour.
TEST(RsShadowShader, GivesTheTransmittanceOfTheSurface) {
    std::mt19937 rng(29);
    for (int trial = 0; trial < 60; ++trial) {
        RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
        m->_diffuse = randomRgb(rng);
        const float opacities[] = {0.0f, 1.0f, std::uniform_real_distribution<float>(0.0f, 1.0f)(rng)};
        m->_opacity = opacities[trial % 3];
        const bool mapped = trial % 2 == 1;
        const float w = 0.7f;
        const Rgba sample(randomRgb(rng), 0.8f);
        if (mapped) m->_diffuseMap = makeShared<ConstantParams>(sample, w);
        RsShadowShader shader(m);
        const double a = m->_opacity * (mapped ? sample.a : 1.0), u = 1 - a;
        Rgba want(0, 0, 0, float(a));
        for (int k = 0; k < 3; ++k) {
            const double tint = channelOf(Rgba(m->_diffuse, 0), k) * (mapped ? w * channelOf(sample, k) : 1.0);
            channelOf(want, k) = float(u * (u + a * tint));
        }
        const Rgba got = shadeLocked(shader);
        if (!mapped && m->_opacity == 1.0f) {
            EXPECT_EQ(got, Rgba(0, 0, 0, 1));
        }
        if (!mapped && m->_opacity == 0.0f) {
            EXPECT_EQ(got, Rgba(1, 1, 1, 0));
        }
        expectNearRgba(got, want, 1e-6, "trial " + std::to_string(trial));
    }
}

// A light that answers a fixed shadow.
class ShadowingLight : public RsLightShader {
public:
    ShadowingLight(unsigned int id, const Rgb& shadow) : _shadow(shadow) {
        _lightId = id;
        _linkMode = SdLight::LinkMode::include;
    }
    void setupRender(const GeAffineMatrix3<float>&) override {}
    void initializeMaps(const RCShdPtr<RsScene>&) override {}
    bool illuminate(const RsShadingContext&, Illumination&) const override { return false; }
    Rgb shadow(const RsShadingContext&) override { return _shadow; }
    Rgb _shadow;

protected:
    void lockMemoryImpl() override {}
    void unlockMemoryImpl() override {}
};

// The matte's picture per channel: the smaller of the summed shadow of the linked lights times
// the strength shared out among them, and 1; 1 less that when inverted; alpha 1. Light 9 is not
// linked to the instance and counts neither in the sum nor in the sharing.
TEST(RsShadowMatteShader, ShowsTheSharedShadowSumOfItsLinkedLights) {
    struct Case {
        std::vector<Rgb> shadows;  // of lights 1, 2, ...; all linked
        float strength;
        Rgb want;
    };
    const Case cases[] = {
        {{}, 1.0f, {0, 0, 0}},
        {{{0.25f, 0.5f, 1.0f}}, 0.8f, {0.2f, 0.4f, 0.8f}},
        {{{0.3f, 0.6f, 1.0f}}, 2.0f, {0.6f, 1.0f, 1.0f}},
        {{{1, 1, 1}, {1, 1, 1}}, 1.0f, {1, 1, 1}},
        {{{1.0f, 0.0f, 0.5f}, {1.0f, 1.0f, 0.1f}}, 1.0f, {1.0f, 0.5f, 0.3f}},
        {{{0.2f, 0.4f, 0.6f}, {0.2f, 0.0f, 0.6f}}, 1.5f, {0.3f, 0.3f, 0.9f}},
    };
    for (const Case& c : cases)
        for (bool inverted : {false, true}) {
            RCShdPtr<SdMaterial> m = makeShared<SdMaterial>();
            m->_shadowStrength = c.strength;
            m->_inverted = inverted;
            RsScene::LightList lights{makeShared<ShadowingLight>(9, Rgb(1, 1, 1))};
            std::vector<unsigned int> linked;
            for (std::size_t i = 0; i < c.shadows.size(); ++i) {
                lights.push_back(makeShared<ShadowingLight>(unsigned(i + 1), c.shadows[i]));
                linked.push_back(unsigned(i + 1));
            }
            RCShdPtr<RsScene> scene = makeScene({}, lights);
            RCShdPtr<const RsGeomInstance> instance = makeShared<RsGeomInstance>(
                GeAffineMatrix3<float>(), makeBoxMesh({0, 0, 0}, {1, 1, 1}), RsGeomInstance::MaterialList{},
                RsGeomInstance::MaterialList{}, SdInstanceAttributes{}, linked);
            RsShadowMatteShader shader(m);
            shader.initialize(scene, instance);
            const Rgb v = inverted ? Rgb(1, 1, 1) - c.want : c.want;
            expectNearRgba(shadeLocked(shader), Rgba(v, 1.0f), 1e-6,
                           std::to_string(c.shadows.size()) + " lights, strength " + std::to_string(c.strength) +
                               (inverted ? ", inverted" : ""));
        }
}

}  // namespace
}  // namespace Zr
