// The standard lights: illumination at random points, normals and placements against closed
// forms worked in world space (Lambert's cosine, the decay curves, the spot's cone and smooth
// penumbra), the spot's edge cases, the projected image against the cone's projection, the shadow
// colour mix as a table, the shadow step with a stub evaluator, the own shadow map placed where
// the light looks, light linking and the lock count.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <map>
#include <random>
#include <set>
#include <string>

#include "exBase.h"
#include "rsDirectLightShader.h"
#include "rsOmniLightShader.h"
#include "rsShadingContext.h"
#include "rsSpotLightShader.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;
using Rgb = CoRgbColorTyped<float>;
using Illumination = RsLightShader::Illumination;
using Kind = SdStdLight::Kind;
using M = GeAffineMatrix3<float>;
using D3 = GeVector3<double>;

// A light whose shadow evaluator, shadow colour mix and projected sampler the tests reach.
template <class Light>
class Probe : public Light {
public:
    using Light::Light;
    using RsStdLightShader::applyShadowColor;
    void useEvaluator(const RsShadowEvaluator* evaluator) { this->_shadowEvaluator = evaluator; }
    void useOwnMap() { this->_shadowEvaluator = &this->_shadowMap; }
    const ConstantSampler& sampler() const { return dynamic_cast<const ConstantSampler&>(*this->_projectedSampler); }
};

// Answers one fixed shadow and counts the questions.
struct StubShadow : RsShadowEvaluator {
    explicit StubShadow(const Rgb& answer) : _answer(answer) {}
    Rgb computeFastShadow(const GePoint3<float>&) const override { return ++_calls, _answer; }
    Rgb computeBestShadow(const GePoint3<float>&) const override { return ++_calls, _answer; }
    Rgb _answer;
    mutable int _calls = 0;
};

// Runs f on a probe of each kind built from light, whose kind is set to match.
template <class F>
void forEachKind(const RCShdPtr<SdStdLight>& light, const M& lightToWorld, F&& f) {
    light->_kind = Kind::direct;
    { Probe<RsDirectLightShader> s(1, lightToWorld, light); f(s); }
    light->_kind = Kind::omni;
    { Probe<RsOmniLightShader> s(1, lightToWorld, light); f(s); }
    light->_kind = Kind::spot;
    { Probe<RsSpotLightShader> s(1, lightToWorld, light); f(s); }
}

float uniform(std::mt19937& rng, float lo, float hi) { return std::uniform_real_distribution<float>(lo, hi)(rng); }

GeVector3<float> randomUnit(std::mt19937& rng) {
    for (;;) {
        const GeVector3<float> v(uniform(rng, -1, 1), uniform(rng, -1, 1), uniform(rng, -1, 1));
        if (v.lengthSquared() > 0.01f && v.lengthSquared() <= 1.0f) return v / v.length();
    }
}

// A random rotation followed by a random translation.
M randomRigid(std::mt19937& rng, float reach) {
    const GeVector3<float> t(uniform(rng, -reach, reach), uniform(rng, -reach, reach), uniform(rng, -reach, reach));
    return M::makeTranslation(t) * M::makeRotation(randomUnit(rng), uniform(rng, -3.1f, 3.1f));
}

D3 toD3(const GePoint3<float>& p) { return {p.x, p.y, p.z}; }

// Coordinates of world point p in the frame of a rigid lightToWorld: dot products with its axes.
D3 inLightFrame(const M& lightToWorld, const D3& p) {
    const GeAffineMatrix3<double> l(lightToWorld);
    const D3 rel = p - l.getTranslation();
    return {rel.dot(l.getColumn(0)), rel.dot(l.getColumn(1)), rel.dot(l.getColumn(2))};
}

// The strength a decaying light keeps at distance d: half at the decay parameter p, falling as
// 1 / (1 + d / p) or 1 / (1 + (d / p)^2).
double decayOf(const SdStdLight& l, double d) {
    const double x = d / l._decayParameter;
    using T = SdStdLight::DecayType;
    return l._decayType == T::none ? 1.0 : l._decayType == T::linear ? 1.0 / (1.0 + x) : 1.0 / (1.0 + x * x);
}

double smoothStep(double s) {
    s = std::clamp(s, 0.0, 1.0);
    return s * s * (3.0 - 2.0 * s);
}

struct Expected {
    const char* what = "";
    bool lit = false;
    bool ambientSet = false;  // else _ambient stays as it came
    double strength = 0.0;    // of _ambient, and of _color when lit, over the light's colour
    D3 direction;
    double cosine = 0.0;
    bool nearBoundary = false;  // within rounding of a decision: not compared
};

// What a light at lightToWorld gives the world point p of normal n, from its geometry in world
// space.
Expected oracle(const SdStdLight& l, const M& lightToWorld, const D3& p, const D3& n) {
    Expected e;
    const D3 toLight = GeVector3<double>(lightToWorld.getTranslation()) - p;
    const double dist = toLight.length(), eps = 1e-4;
    auto turnedAway = [&](double decay, const char* what) {
        e.what = what;
        e.ambientSet = l._emitAmbient;
        e.strength = decay > 0.0 ? l._intensity * decay : 0.0;
        return e;
    };
    if (l._kind == Kind::omni) {
        e.cosine = n.dot(toLight) / dist;
        e.nearBoundary = std::fabs(e.cosine) < eps;
        if (e.cosine <= 0.0) return turnedAway(decayOf(l, dist), "omni turned away");
        return {"omni lit", true, true, l._intensity * decayOf(l, dist), toLight / dist, e.cosine, e.nearBoundary};
    }
    if (l._kind == Kind::direct) {
        const D3 axis = -GeVector3<double>(lightToWorld.getColumn(2)).getNormalized();
        const double cosine = -axis.dot(n), decay = decayOf(l, -inLightFrame(lightToWorld, p).z);
        e.nearBoundary = std::fabs(cosine) < eps || std::fabs(1.0 / decay) < 0.05;
        if (cosine <= 0.0) return turnedAway(decay, "direct turned away");
        if (decay <= 0.0) return e.what = "direct behind its decay pole", e;
        return {"direct lit", true, true, l._intensity * decay, -axis, cosine, e.nearBoundary};
    }
    // Spot: the point's place across the cone, in units of the cone's half-width and half-height.
    const D3 q = inLightFrame(lightToWorld, p);
    const double outerTan = std::tan(0.5 * l._outerConeAngle);
    const double start =
        l._innerConeAngle >= l._outerConeAngle ? 1.0 : std::tan(0.5 * l._innerConeAngle) / outerTan;
    e.ambientSet = true;
    e.nearBoundary = std::fabs(q.z) < eps;
    if (q.z >= 0.0) return e.what = "spot behind", e;
    const double cx = q.x / (l._aspect * outerTan * -q.z), cy = q.y / (outerTan * -q.z);
    // Across the penumbra the light ramps from 0 at the cone's edge to 1 at the inner cone.
    auto ramp = [&](double f) { return start >= 1.0 ? 1.0 : std::min(1.0, (1.0 - f) / (1.0 - start)); };
    double cone;
    if (l._coneShape == SdStdLight::ConeShape::circular) {
        e.nearBoundary |= std::fabs(std::hypot(cx, cy) - 1.0) < eps;
        if (std::hypot(cx, cy) > 1.0) return e.what = "outside the round cone", e;
        cone = smoothStep(ramp(std::hypot(cx, cy)));
    } else {
        e.nearBoundary |= std::fabs(std::max(std::fabs(cx), std::fabs(cy)) - 1.0) < eps;
        if (std::max(std::fabs(cx), std::fabs(cy)) > 1.0) return e.what = "outside the square cone", e;
        cone = smoothStep(ramp(std::fabs(cx)) * ramp(std::fabs(cy)));
    }
    e.strength = l._intensity * cone * decayOf(l, dist);
    e.direction = toLight / dist;
    e.cosine = n.dot(e.direction);
    e.nearBoundary |= std::fabs(e.cosine) < eps;
    e.lit = e.cosine > 0.0;
    e.what = e.lit ? "spot lit" : "spot turned away";
    return e;
}

void expectNear(double got, double want, const std::string& where) {
    EXPECT_NEAR(got, want, 2e-4 * std::max(1.0, std::fabs(want))) << where;
}

void expectColour(const Rgb& got, const Rgb& colour, double factor, const std::string& where) {
    expectNear(got.r, colour.r * factor, where + " r");
    expectNear(got.g, colour.g * factor, where + " g");
    expectNear(got.b, colour.b * factor, where + " b");
}

// Random lights of each kind: placement, colour, intensity, decay, cone shape, angles and aspect,
// the inner angle sometimes beyond the outer (a hard edge); fragments all around, inside and
// outside the cone, in front and behind, facing and turned away, seen through a random camera.
TEST(RsStdLightShader, IlluminationMatchesTheClosedFormsAtRandomPoints) {
    std::mt19937 rng(11);
    std::map<std::string, int> seen;
    for (int round = 0; round < 300; ++round) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_color = Rgb(uniform(rng, 0.2f, 1), uniform(rng, 0.2f, 1), uniform(rng, 0.2f, 1));
        light->_intensity = uniform(rng, 0.5f, 2);
        light->_decayType = static_cast<SdStdLight::DecayType>(rng() % 3);
        light->_decayParameter = uniform(rng, 1, 10);
        light->_emitAmbient = rng() % 2;
        light->_coneShape = static_cast<SdStdLight::ConeShape>(rng() % 2);
        light->_aspect = uniform(rng, 0.5f, 2);
        light->_outerConeAngle = uniform(rng, 0.3f, 2.0f);
        light->_innerConeAngle = uniform(rng, 0.1f, 2.2f);
        const M lightToWorld = randomRigid(rng, 5), worldToCamera = randomRigid(rng, 5);
        const float outerTan = std::tan(0.5f * light->_outerConeAngle);

        forEachKind(light, lightToWorld, [&](RsStdLightShader& shader) {
            shader.setupRender(worldToCamera);
            for (int i = 0; i < 20; ++i) {
                // Spot fragments mostly about the cone, the others anywhere near the light.
                GePoint3<float> inLight(uniform(rng, -12, 12), uniform(rng, -12, 12), uniform(rng, -12, 12));
                if (light->_kind == Kind::spot && i % 5 != 0) {
                    const float depth = uniform(rng, 0.2f, 15);
                    inLight = {uniform(rng, -1.3f, 1.3f) * light->_aspect * outerTan * depth,
                               uniform(rng, -1.3f, 1.3f) * outerTan * depth, -depth};
                }
                const GePoint3<float> p = lightToWorld.transformPoint(inLight);
                const GeVector3<float> n = randomUnit(rng);
                const Expected e = oracle(*light, lightToWorld, toD3(p), D3(n));
                if (e.nearBoundary) continue;

                RsShadingContext context;
                context._eyeCoord = worldToCamera.transformPoint(p);
                context._normal = worldToCamera.transformVector(n);
                Illumination got;
                got._ambient = Rgb(-7.0f);
                const bool lit = shader.illuminate(context, got);
                const std::string where = std::string(e.what) + " round " + std::to_string(round);
                ++seen[e.what];
                ASSERT_EQ(lit, e.lit) << where;
                expectColour(got._ambient, e.ambientSet ? light->_color : Rgb(-7.0f),
                             e.ambientSet ? e.strength : 1.0, where + " ambient");
                if (!lit) continue;
                expectColour(got._color, light->_color, e.strength, where + " colour");
                expectNear(got._cosine, e.cosine, where + " cosine");
                // Back to world space through the camera's transpose.
                const GeVector3<float> d = worldToCamera.mulOnRight(got._direction);
                expectColour(Rgb(d.x, d.y, d.z), Rgb(e.direction.x, e.direction.y, e.direction.z), 1.0, where);
            }
        });
    }
    for (const char* what : {"omni lit", "omni turned away", "direct lit", "direct turned away",
                             "direct behind its decay pole", "spot lit", "spot turned away", "spot behind",
                             "outside the round cone", "outside the square cone"})
        EXPECT_GE(seen[what], 40) << what;
}

// Exactly on and just beyond the cone's edge, and at the light itself, which the random points
// cannot reach: a white spot of intensity 1 at the origin looking down -z, the outer cone 90
// degrees across (its surface lies where x or y equals |z|), lighting a floor facing +z.
TEST(RsSpotLightShader, ConeEdgesPenumbraAndRejections) {
    const float right = 1.5707964f, inner = 1.0471976f, out = std::nextafter(1.0f, 2.0f);
    ASSERT_EQ(std::tan(right * 0.5f), 1.0f) << "the cone's edge must be exact for this test";
    const auto round = SdStdLight::ConeShape::circular, square = SdStdLight::ConeShape::rectangular;
    const struct {
        const char* what;
        SdStdLight::ConeShape shape;
        float inner;
        GePoint3<float> point;
        bool lit;
        float strength, cosine;
    } cases[] = {
        {"on the round edge: t = 0, yet not rejected", round, inner, {1, 0, -1}, true, 0, 0.70710678f},
        {"on the round edge of a hard cone", round, right, {1, 0, -1}, true, 1, 0.70710678f},
        {"just outside the round edge", round, inner, {out, 0, -1}, false, 0, 0},
        {"on the square's side: t = 0", square, inner, {1, 0.5f, -1}, true, 0, 0.66666667f},
        {"just outside the square", square, inner, {out, 0.2f, -1}, false, 0, 0},
        {"at the light itself", round, inner, {0, 0, 0}, false, 0, 0},
    };
    for (const auto& c : cases) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_coneShape = c.shape;
        light->_outerConeAngle = right;
        light->_innerConeAngle = c.inner;
        RsSpotLightShader spot(1, M(), light);
        spot.setupRender(M());
        RsShadingContext context;
        context._eyeCoord = c.point;
        Illumination got;
        got._ambient = Rgb(-7.0f);
        EXPECT_EQ(spot.illuminate(context, got), c.lit) << c.what;
        EXPECT_NEAR(got._ambient.g, c.strength, 1e-6) << c.what;
        if (c.lit) {
            EXPECT_NEAR(got._color.g, c.strength, 1e-6) << c.what;
            EXPECT_NEAR(got._cosine, c.cosine, 1e-6) << c.what;
        }
    }
}

// The projected image spans the cone's cross-section from 0 to 1; its footprint, when the map
// filters over one, is the change of that coordinate between the ends of each pixel step centred
// on the fragment. The image scales the light by sample x weight, fading out with the shadow.
// Random placements; the camera is the world.
TEST(RsSpotLightShader, ProjectedImageFollowsTheConesProjection) {
    std::mt19937 rng(5);
    for (int round = 0; round < 40; ++round) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_aspect = uniform(rng, 0.5f, 2);
        light->_outerConeAngle = uniform(rng, 0.4f, 1.6f);
        light->_innerConeAngle = 3.0f;  // a hard edge: the whole cone at full strength
        light->_color = Rgb(0.8f, 0.6f, 0.4f);
        light->_useProjectedMap = true;
        RCShdPtr<ConstantParams> map = makeShared<ConstantParams>(Rgba(0.5f, 0.25f, 2.0f, 1.0f), 0.75f);
        if (round % 2) map->_filter = SdTextureParams::Filter::footprint;
        light->_projectedMap = map;
        const M lightToWorld = randomRigid(rng, 5);
        Probe<RsSpotLightShader> spot(1, lightToWorld, light);
        spot.setupRender(M());
        spot.lockMemory();
        StubShadow stub(Rgb(1.0f, 0.5f, 0.0f));
        spot.useEvaluator(&stub);
        const float w = std::tan(0.5f * light->_outerConeAngle) * light->_aspect, h = w / light->_aspect;
        auto imageAt = [&](const GePoint3<float>& p) {
            const D3 q = inLightFrame(lightToWorld, toD3(p));
            return std::pair(0.5 + 0.5 * q.x / (w * -q.z), 0.5 + 0.5 * q.y / (h * -q.z));
        };
        for (int i = 0; i < 10; ++i) {
            const float depth = uniform(rng, 1, 10);
            RsShadingContext context;
            context._eyeCoord = lightToWorld.transformPoint(
                {uniform(rng, -0.6f, 0.6f) * w * depth, uniform(rng, -0.6f, 0.6f) * h * depth, -depth});
            context._normal = lightToWorld.transformVector({0, 0, 1});
            context._dEyeCoord_dx = randomUnit(rng) * uniform(rng, 0.01f, 0.1f);
            context._dEyeCoord_dy = randomUnit(rng) * uniform(rng, 0.01f, 0.1f);
            context._texCoordDerivatives = GeLinearMatrix2<double>(1, 2, 3, 4);
            context._receivesShadows = i % 3 != 0;
            Illumination got;
            ASSERT_TRUE(spot.illuminate(context, got));

            const auto [s, t] = imageAt(context._eyeCoord);
            EXPECT_NEAR(spot.sampler()._lastTexCoord.x, s, 1e-5);
            EXPECT_NEAR(spot.sampler()._lastTexCoord.y, t, 1e-5);
            const GeLinearMatrix2<double> footprint = spot.sampler()._lastDerivatives;
            if (!map->needsDerivatives()) {
                EXPECT_EQ(footprint, context._texCoordDerivatives);
            }
            for (int axis = 0; axis < 2 && map->needsDerivatives(); ++axis) {
                const GeVector3<float> half = (axis ? context._dEyeCoord_dy : context._dEyeCoord_dx) * 0.5f;
                const auto [s1, t1] = imageAt(context._eyeCoord + half);
                const auto [s0, t0] = imageAt(context._eyeCoord - half);
                EXPECT_NEAR(footprint(axis, 0), s1 - s0, 2e-5 + 1e-3 * std::fabs(s1 - s0)) << "ds, axis " << axis;
                EXPECT_NEAR(footprint(axis, 1), t1 - t0, 2e-5 + 1e-3 * std::fabs(t1 - t0)) << "dt, axis " << axis;
            }
            // Image (0.375, 0.1875, 1.5). Under the stub's shadow the image counts only where
            // light arrives (green half, blue not at all), then the black shadow colour darkens.
            const Rgb want = context._receivesShadows ? Rgb(0.3f, 0.6f * (0.5f * 0.1875f + 0.5f) * 0.5f, 0.0f)
                                                      : Rgb(0.3f, 0.6f * 0.1875f, 0.4f * 1.5f);
            expectColour(got._color, want, 1.0, "projected colour");
        }
        spot.unlockMemory();
    }
}

// The shadow colour mix, k = (1 - shadow) x strength, below 0, within [0, 1] and above 1 in the
// three channels at once (shadow strength 2), with and without the multiply flag; the
// single-factor form agrees with three equal factors.
TEST(RsStdLightShader, ShadowColourMixByRangeOfK) {
    const Rgb colour(0.8f, 0.6f, 0.4f), shadowColour(0.25f, 0.5f, 2.0f), shadow(1.25f, 0.75f, 0.25f);
    const struct {
        bool multiplies;
        Rgb want;  // k = -0.5, 0.5, 1.5 in r, g, b
    } rows[] = {
        {false, {0.8f - 0.125f, 0.6f * 0.5f + 0.25f, 3.0f}},
        {true, {0.8f * (-0.5f + 0.25f), 0.6f * (0.5f + 0.25f), 0.4f * 2.0f * 1.5f}},
    };
    for (const auto& row : rows) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_shadowStrength = 2.0f;
        light->_shadowColorMultiplies = row.multiplies;
        Probe<RsOmniLightShader> omni(1, M(), light);
        Rgb got = colour;
        omni.applyShadowColor(got, shadowColour, shadow);
        expectColour(got, row.want, 1.0, row.multiplies ? "multiplying" : "replacing");
        for (const float s : {shadow.r, shadow.g, shadow.b}) {
            Rgb single = colour, triple = colour;
            omni.applyShadowColor(single, shadowColour, s);
            omni.applyShadowColor(triple, shadowColour, Rgb(s));
            EXPECT_EQ(single, triple) << "shadow " << s;
        }
    }
}

// The end of every light's illumination: a shadow of exactly 1 leaves the colour alone, even with
// a shadow colour that would poison any mix; a fragment that does not receive shadows is not
// asked about; no evaluator means fully lit; a partial shadow mixes in the shadow colour per
// channel. shadow() is that mix applied to white, whether or not the fragment receives shadows.
TEST(RsStdLightShader, ShadowStepWithAStubEvaluator) {
    RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
    light->_color = Rgb(0.8f, 0.6f, 0.4f);
    light->_intensity = 2.0f;
    const Rgb full = light->_color * 2.0f;
    forEachKind(light, M::makeTranslation({0, 0, 3}), [&](auto& shader) {
        const std::string kind = std::to_string(static_cast<int>(light->_kind));
        shader.setupRender(M());
        RsShadingContext context;
        context._eyeCoord = {0, 0, 1};
        auto colourUnder = [&](const Rgb& shadow, const Rgb& shadowColour, bool receives) {
            light->_shadowColor = shadowColour;
            context._receivesShadows = receives;
            StubShadow stub(shadow);
            shader.useEvaluator(&stub);
            Illumination got;
            EXPECT_TRUE(shader.illuminate(context, got)) << kind;
            shader.useEvaluator(nullptr);
            return std::pair(got._color, stub._calls);
        };
        const Rgb inf(std::numeric_limits<float>::infinity());
        EXPECT_EQ(colourUnder(Rgb(1.0f), inf, true), std::pair(full, 1)) << kind;
        EXPECT_EQ(colourUnder(Rgb(0.0f), Rgb(0.0f), false), std::pair(full, 0)) << kind;
        // k = 0.5, 0, 0.75: each channel moves that far towards the shadow colour, then x 2.
        const Rgb mixed = colourUnder(Rgb(0.5f, 1.0f, 0.25f), Rgb(0.5f, 9.0f, 1.0f), true).first;
        expectColour(mixed, Rgb(2.0f * (0.4f + 0.25f), 1.2f, 2.0f * (0.1f + 0.75f)), 1.0, kind + " partial");
        StubShadow partial(Rgb(0.5f, 1.0f, 0.25f));
        shader.useEvaluator(&partial);
        context._receivesShadows = false;
        expectColour(shader.shadow(context), Rgb(0.75f, 1.0f, 1.0f), 1.0, kind + " shadow()");
        shader.useEvaluator(nullptr);
        EXPECT_EQ(shader.shadow(context), Rgb(1.0f)) << kind;
        Illumination got;
        context._receivesShadows = true;
        EXPECT_TRUE(shader.illuminate(context, got));
        EXPECT_EQ(got._color, full) << kind << ": no evaluator";
    });
}

// The spot's and the direct light's own maps, once set up, see a fragment from the light: filled
// with a depth just nearer to the light than the fragment, they shadow it; just beyond, they
// light it. Placements of light and camera are random.
TEST(RsStdLightShader, OwnShadowMapSeesTheFragmentFromTheLight) {
    std::mt19937 rng(8);
    for (int round = 0; round < 20; ++round) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_shadowMapSize = 16;
        light->_shadowRange = 0.0f;  // one cell decides, exactly
        light->_aspect = uniform(rng, 0.5f, 2);
        light->_width = uniform(rng, 2, 20);
        const M lightToWorld = randomRigid(rng, 5), worldToCamera = randomRigid(rng, 5);
        const float depth = uniform(rng, 1, 10);
        auto check = [&](auto& shader, float halfWidth, float halfHeight) {
            shader.setupRender(worldToCamera);
            shader.useOwnMap();
            double* cells = shader.getShadowMap().getMap();
            RsShadingContext context;
            context._eyeCoord = worldToCamera.transformPoint(lightToWorld.transformPoint(
                {uniform(rng, -0.8f, 0.8f) * halfWidth, uniform(rng, -0.8f, 0.8f) * halfHeight, -depth}));
            for (const double offset : {0.5, -0.5}) {
                std::fill(cells, cells + 16 * 16, -depth + offset);
                EXPECT_EQ(shader.shadow(context), Rgb(offset > 0 ? 0.0f : 1.0f)) << "round " << round;
            }
        };
        light->_kind = Kind::spot;
        Probe<RsSpotLightShader> spot(1, lightToWorld, light);
        const float coneHeight = std::tan(0.5f * light->_outerConeAngle) * depth;
        check(spot, light->_aspect * coneHeight, coneHeight);
        light->_kind = Kind::direct;
        Probe<RsDirectLightShader> direct(1, lightToWorld, light);
        check(direct, light->_width * 0.5f, light->_width * 0.5f);
    }
}

// Linking: with the include mode a light reaches the instances that list it, with the exclude
// mode those that do not; an empty list finds nothing.
TEST(RsStdLightShader, IncludesByLinkMode) {
    using Mode = SdLight::LinkMode;
    const std::set<unsigned int> lists[] = {{7}, {1, 8}, {}};
    const bool reaches[2][3] = {{true, false, false}, {false, true, true}};
    for (const Mode mode : {Mode::include, Mode::exclude}) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_linkMode = mode;
        for (int i = 0; i < 3; ++i)
            EXPECT_EQ(RsOmniLightShader(7, M(), light).includes(lists[i]), reaches[int(mode)][i]) << int(mode) << i;
    }
}

// Locks count; an unlock beyond them fails with the fixed text and position. Every light needs
// a description.
TEST(RsStdLightShader, LockCountAndNullLight) {
    RsOmniLightShader omni(1, M(), makeShared<SdStdLight>());
    omni.lockMemory();
    omni.lockMemory();
    omni.unlockMemory();
    omni.unlockMemory();
    try {
        omni.unlockMemory();
        ADD_FAILURE() << "an unbalanced unlock must fail";
    } catch (const ExAssertionFailed& e) {
        EXPECT_EQ(e.getFile() + ":" + std::to_string(e.getLine()), "render\\yarp\\src\\rsLightShader:144");
        EXPECT_NE(std::string(e.what()).find("_lockCount > 0"), std::string::npos);
    }
    const RCShdPtr<const SdStdLight> none;
    EXPECT_THROW(RsOmniLightShader(1, M(), none), ExNullPtr);
    EXPECT_THROW(RsDirectLightShader(1, M(), none), ExNullPtr);
    EXPECT_THROW(RsSpotLightShader(1, M(), none), ExNullPtr);
}

}  // namespace
}  // namespace Zr
