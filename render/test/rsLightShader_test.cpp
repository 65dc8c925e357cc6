// The standard lights: illumination at random points, normals and placements against closed
// forms worked in world space (Lambert's cosine, the decay curves, the spot's cone and smooth
// penumbra), the spot's edge cases, the projected image's coordinates and footprint against the
// projection's own differences, the shadow colour mix as a table, the shadow step with a stub
// evaluator, the shadow map placed where the light looks, light linking and the lock count.
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

// A light whose shadow evaluator, shadow colour mix and projected sampler the tests reach.
template <class Light>
class Probe : public Light {
public:
    using Light::Light;
    using RsStdLightShader::applyShadowColor;
    void useEvaluator(const RsShadowEvaluator* evaluator) { this->_shadowEvaluator = evaluator; }
    void useOwnMap() { this->_shadowEvaluator = &this->_shadowMap; }
    const ConstantSampler& projectedSampler() const {
        return dynamic_cast<const ConstantSampler&>(*this->_projectedSampler);
    }
};

// Answers one fixed shadow and counts the questions.
class StubShadow : public RsShadowEvaluator {
public:
    explicit StubShadow(const Rgb& answer) : _answer(answer) {}
    Rgb computeFastShadow(const GePoint3<float>&) const override { return ++_calls, _answer; }
    Rgb computeBestShadow(const GePoint3<float>&) const override { return ++_calls, _answer; }
    Rgb _answer;
    mutable int _calls = 0;
};

// Runs f on a probe of each kind built from light (whose kind is set to match).
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

// ---- The world-space oracle ------------------------------------------------------------------

struct V3 {
    double x, y, z;
};
V3 sub(V3 a, V3 b) { return {a.x - b.x, a.y - b.y, a.z - b.z}; }
double dot(V3 a, V3 b) { return a.x * b.x + a.y * b.y + a.z * b.z; }
double len(V3 a) { return std::sqrt(dot(a, a)); }
V3 scaled(V3 a, double s) { return {a.x * s, a.y * s, a.z * s}; }
V3 column(const M& m, int c) { return {m(0, c), m(1, c), m(2, c)}; }
V3 toV3(const GePoint3<float>& p) { return {p.x, p.y, p.z}; }

// The strength a decaying light keeps at distance d: half at the decay parameter, falling as
// 1 / (1 + d / p) or 1 / (1 + (d / p)^2).
double decayOf(const SdStdLight& l, double d) {
    const double p = l._decayParameter;
    switch (l._decayType) {
        case SdStdLight::DecayType::none: return 1.0;
        case SdStdLight::DecayType::linear: return 1.0 / (1.0 + d / p);
        case SdStdLight::DecayType::quadratic: return 1.0 / (1.0 + (d / p) * (d / p));
    }
    return 1.0;
}

double smoothStep(double s) {
    s = std::clamp(s, 0.0, 1.0);
    return s * s * (3.0 - 2.0 * s);
}

struct Expected {
    bool lit = false;
    bool ambientTouched = false;  // else the record's _ambient stays as it came
    double ambient = 0.0;         // times the light's colour
    double strength = 0.0;        // _color over the light's colour, when lit
    V3 direction{};
    double cosine = 0.0;
    bool nearBoundary = false;  // within rounding of a decision: not compared
    const char* what = "";
};

// What a light at lightToWorld gives the world point p of normal n, by the light's geometry in
// world space. The light's space is rigid: its coordinates are dot products with its axes.
Expected oracle(const SdStdLight& l, const M& lightToWorld, V3 p, V3 n) {
    Expected e;
    const double eps = 1e-4;
    const V3 origin = column(lightToWorld, 3);
    const V3 toLight = sub(origin, p);
    const double dist = len(toLight);
    const double intensity = l._intensity;
    auto turnedAway = [&](double decay, const char* what) {
        e.what = what;
        if (l._emitAmbient) {
            e.ambientTouched = true;
            e.ambient = decay > 0.0 ? intensity * decay : 0.0;
        }
        return e;
    };

    if (l._kind == Kind::omni) {
        const double facing = dot(n, toLight) / dist;
        e.nearBoundary = std::fabs(facing) < eps;
        if (facing <= 0.0) return turnedAway(decayOf(l, dist), "omni turned away");
        e = Expected{true, true, intensity * decayOf(l, dist), intensity * decayOf(l, dist),
                     scaled(toLight, 1.0 / dist), facing, e.nearBoundary, "omni lit"};
        return e;
    }
    if (l._kind == Kind::direct) {
        const V3 axis = scaled(column(lightToWorld, 2), -1.0 / len(column(lightToWorld, 2)));
        const double cosine = -dot(axis, n);
        const double along = dot(sub(p, origin), axis);
        const double decay = decayOf(l, along);
        e.nearBoundary = std::fabs(cosine) < eps || std::fabs(1.0 / decay) < 0.05;
        if (cosine <= 0.0) return turnedAway(decay, "direct turned away");
        if (decay <= 0.0) return e.what = "direct behind its decay pole", e;
        return Expected{true, true, intensity * decay, intensity * decay, scaled(axis, -1.0), cosine,
                        e.nearBoundary, "direct lit"};
    }

    // Spot: the point in the light's frame, then in units of the cone's half-width and height.
    const V3 rel = sub(p, origin);
    const double lx = dot(rel, column(lightToWorld, 0)), ly = dot(rel, column(lightToWorld, 1));
    const double lz = dot(rel, column(lightToWorld, 2));
    const double outerTan = std::tan(0.5 * l._outerConeAngle);
    const double startRatio = l._innerConeAngle >= l._outerConeAngle
                                  ? 1.0
                                  : std::tan(0.5 * l._innerConeAngle) / outerTan;
    e.ambientTouched = true;
    e.nearBoundary = std::fabs(lz) < eps;
    if (lz >= 0.0) return e.what = "spot behind", e;
    const double depth = -lz;
    const double cx = lx / (l._aspect * outerTan) / depth, cy = ly / outerTan / depth;
    // Across the penumbra the light ramps from the cone's edge (ratio 1) in to the inner cone.
    auto ramp = [&](double ratio) { return startRatio >= 1.0 ? 1.0 : (1.0 - ratio) / (1.0 - startRatio); };
    double cone;
    if (l._coneShape == SdStdLight::ConeShape::circular) {
        const double ratio = std::hypot(cx, cy);
        e.nearBoundary |= std::fabs(ratio - 1.0) < eps;
        if (ratio > 1.0) return e.what = "outside the round cone", e;
        cone = smoothStep(ramp(ratio));
    } else {
        e.nearBoundary |= std::fabs(std::fabs(cx) - 1.0) < eps || std::fabs(std::fabs(cy) - 1.0) < eps;
        if (std::fabs(cx) > 1.0 || std::fabs(cy) > 1.0) return e.what = "outside the square cone", e;
        cone = smoothStep(std::min(1.0, ramp(std::fabs(cx))) * std::min(1.0, ramp(std::fabs(cy))));
    }
    const double strength = intensity * cone * decayOf(l, dist);
    const double cosine = dot(n, toLight) / dist;
    e.nearBoundary |= std::fabs(cosine) < eps;
    e.ambient = strength;
    e.direction = scaled(toLight, 1.0 / dist);
    e.cosine = cosine;
    if (cosine <= 0.0) return e.what = "spot turned away", e;
    e.lit = true;
    e.strength = strength;
    e.what = "spot lit";
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

// A random light of each kind: random placement, colour, intensity, decay, cone and aspect, with
// the inner angle sometimes beyond the outer one (a hard edge); fragments all around it, inside
// and outside the cone, in front and behind, facing and turned away, seen through a random camera.
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
        const M lightToWorld = randomRigid(rng, 5);
        const M worldToCamera = randomRigid(rng, 5);
        const double outerTan = std::tan(0.5 * light->_outerConeAngle);

        forEachKind(light, lightToWorld, [&](RsStdLightShader& shader) {
            shader.setupRender(worldToCamera);
            for (int i = 0; i < 20; ++i) {
                // Spot fragments mostly within about the cone, the others anywhere near the light.
                V3 p;
                if (light->_kind == Kind::spot && i % 5 != 0) {
                    const double depth = uniform(rng, 0.2f, 15);
                    const double u = uniform(rng, -1.3f, 1.3f) * light->_aspect * outerTan * depth;
                    const double v = uniform(rng, -1.3f, 1.3f) * outerTan * depth;
                    V3 o = column(lightToWorld, 3);
                    for (int a = 0; a < 3; ++a) {
                        const V3 c = column(lightToWorld, a);
                        const double w = a == 0 ? u : a == 1 ? v : -depth;
                        o = {o.x + c.x * w, o.y + c.y * w, o.z + c.z * w};
                    }
                    p = o;
                } else {
                    const V3 o = column(lightToWorld, 3);
                    p = {o.x + uniform(rng, -12, 12), o.y + uniform(rng, -12, 12), o.z + uniform(rng, -12, 12)};
                }
                const GeVector3<float> nWorld = randomUnit(rng);
                const GePoint3<float> pWorld(static_cast<float>(p.x), static_cast<float>(p.y), static_cast<float>(p.z));
                const Expected e = oracle(*light, lightToWorld, toV3(pWorld), {nWorld.x, nWorld.y, nWorld.z});
                if (e.nearBoundary) continue;

                RsShadingContext context;
                context._eyeCoord = worldToCamera.transformPoint(pWorld);
                context._normal = worldToCamera.transformVector(nWorld);
                Illumination got;
                const Rgb untouched(-7.0f, -7.0f, -7.0f);
                got._ambient = untouched;
                const bool lit = shader.illuminate(context, got);
                const std::string where = std::string(e.what) + " round " + std::to_string(round);
                ++seen[e.what];
                ASSERT_EQ(lit, e.lit) << where;
                if (e.ambientTouched) {
                    expectColour(got._ambient, light->_color, e.ambient, where + " ambient");
                } else {
                    EXPECT_EQ(got._ambient, untouched) << where;
                }
                if (!lit) continue;
                expectColour(got._color, light->_color, e.strength, where + " colour");
                expectNear(got._cosine, e.cosine, where + " cosine");
                // The direction comes back to world space through the camera's transpose.
                const GeVector3<float> dWorld = worldToCamera.mulOnRight(got._direction);
                expectNear(dWorld.x, e.direction.x, where + " direction x");
                expectNear(dWorld.y, e.direction.y, where + " direction y");
                expectNear(dWorld.z, e.direction.z, where + " direction z");
            }
        });
    }
    for (const char* what : {"omni lit", "omni turned away", "direct lit", "direct turned away",
                             "direct behind its decay pole", "spot lit", "spot turned away", "spot behind",
                             "outside the round cone", "outside the square cone"})
        EXPECT_GE(seen[what], 40) << what;
}

// A white spot of intensity 1 at the origin looking down -z, the outer cone 90 degrees across
// (so its surface lies where x or y equals |z|) and the inner 60, lighting a floor facing +z.
TEST(RsSpotLightShader, ConeEdgesPenumbraAndRejections) {
    const float right = 1.5707964f;
    ASSERT_EQ(std::tan(right * 0.5f), 1.0f) << "the cone's edge must be exact for this test";
    struct Case {
        const char* what;
        SdStdLight::ConeShape shape;
        float inner;
        GePoint3<float> point;
        GeVector3<float> normal;
        bool lit;
        float ambient, colour, cosine;
    };
    const float outside = std::nextafter(1.0f, 2.0f);
    const GeVector3<float> up(0, 0, 1);
    const auto round = SdStdLight::ConeShape::circular, square = SdStdLight::ConeShape::rectangular;
    const Case cases[] = {
        {"on the round edge: t = 0, yet not rejected", round, 1.0471976f, {1, 0, -1}, up, true, 0, 0, 0.70710678f},
        {"on the round edge of a hard cone", round, right, {1, 0, -1}, up, true, 1, 1, 0.70710678f},
        {"inner beyond outer is a hard edge too", round, 2.5f, {0, 1, -1}, up, true, 1, 1, 0.70710678f},
        {"just outside the round edge", round, 1.0471976f, {outside, 0, -1}, up, false, 0, 0, 0},
        {"in the round penumbra", round, 1.0471976f, {0.6f, 0, -1}, up, true, 0.99169219f, 0.99169219f, 0.85749293f},
        {"on the square's side: t = 0", square, 1.0471976f, {1, 0.5f, -1}, up, true, 0, 0, 0.66666667f},
        {"in the square's penumbra on both axes", square, 1.0471976f, {0.8f, 0.8f, -1}, up, true, 0.12796891f,
         0.12796891f, 0.66226618f},
        {"inside the inner square", square, 1.0471976f, {0.5f, 0.5f, -1}, up, true, 1, 1,
         0.81649658f},
        {"just outside the square", square, 1.0471976f, {outside, 0.2f, -1}, up, false, 0, 0, 0},
        {"behind the light", round, 1.0471976f, {0, 0, 1}, up, false, 0, 0, 0},
        {"at the light itself", round, 1.0471976f, {0, 0, 0}, up, false, 0, 0, 0},
        {"turned away inside keeps its ambient", round, 1.0471976f, {0, 0, -2}, -up, false, 1, 0, 0},
    };
    for (const Case& c : cases) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_kind = Kind::spot;
        light->_coneShape = c.shape;
        light->_outerConeAngle = right;
        light->_innerConeAngle = c.inner;
        RsSpotLightShader spot(1, M(), light);
        spot.setupRender(M());
        RsShadingContext context;
        context._eyeCoord = c.point;
        context._normal = c.normal;
        Illumination got;
        got._ambient = Rgb(-7.0f);
        EXPECT_EQ(spot.illuminate(context, got), c.lit) << c.what;
        EXPECT_NEAR(got._ambient.g, c.ambient, 1e-6) << c.what;
        if (c.lit) {
            EXPECT_NEAR(got._color.g, c.colour, 1e-6) << c.what;
            EXPECT_NEAR(got._cosine, c.cosine, 1e-6) << c.what;
        }
    }
    // A cone without width lights nothing.
    RCShdPtr<SdStdLight> flat = makeShared<SdStdLight>();
    flat->_aspect = 0.0f;
    RsSpotLightShader spot(1, M(), flat);
    spot.setupRender(M());
    RsShadingContext context;
    context._eyeCoord = {0, 0, -1};
    Illumination got;
    got._ambient = Rgb(-7.0f);
    EXPECT_FALSE(spot.illuminate(context, got));
    EXPECT_EQ(got._ambient, Rgb(0.0f));
}

// The projected image spans the cone's cross-section: its coordinate is the point's place across
// the cone's width and height, from 0 to 1; its footprint, when the map filters over one, is the
// change of that coordinate between the ends of a pixel step centred on the fragment; the image
// scales the light by its sample times its weight, fading out with the shadow, and is not looked
// at where the shadow is total. Placements are random; the camera is the world.
TEST(RsSpotLightShader, ProjectedImageFollowsTheConesProjection) {
    std::mt19937 rng(5);
    const Rgba sample(0.5f, 0.25f, 2.0f, 1.0f);
    for (int round = 0; round < 40; ++round) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_kind = Kind::spot;
        light->_aspect = uniform(rng, 0.5f, 2);
        light->_outerConeAngle = uniform(rng, 0.4f, 1.6f);
        light->_innerConeAngle = 3.0f;  // a hard edge: the whole cone at full strength
        light->_color = Rgb(0.8f, 0.6f, 0.4f);
        light->_useProjectedMap = true;
        RCShdPtr<ConstantParams> map = makeShared<ConstantParams>(sample, 0.75f);
        if (round % 2) map->_filter = SdTextureParams::Filter::footprint;
        light->_projectedMap = map;
        const M lightToWorld = randomRigid(rng, 5);
        Probe<RsSpotLightShader> spot(1, lightToWorld, light);
        spot.setupRender(M());
        spot.lockMemory();
        StubShadow stub(Rgb(1.0f, 0.5f, 0.0f));
        spot.useEvaluator(&stub);

        const double outerTan = std::tan(0.5 * light->_outerConeAngle);
        // The image coordinate of a world point, in double through the light's axes.
        auto imageAt = [&](V3 p) {
            const V3 rel = sub(p, column(lightToWorld, 3));
            const double depth = -dot(rel, column(lightToWorld, 2));
            return std::pair(0.5 + 0.5 * dot(rel, column(lightToWorld, 0)) / (light->_aspect * outerTan * depth),
                             0.5 + 0.5 * dot(rel, column(lightToWorld, 1)) / (outerTan * depth));
        };
        for (int i = 0; i < 10; ++i) {
            const float depth = uniform(rng, 1, 10);
            const GePoint3<float> inLight(uniform(rng, -0.6f, 0.6f) * light->_aspect * outerTan * depth,
                                          uniform(rng, -0.6f, 0.6f) * outerTan * depth, -depth);
            RsShadingContext context;
            context._eyeCoord = lightToWorld.transformPoint(inLight);
            context._normal = lightToWorld.transformVector({0, 0, 1});
            context._dEyeCoord_dx = randomUnit(rng) * uniform(rng, 0.01f, 0.1f);
            context._dEyeCoord_dy = randomUnit(rng) * uniform(rng, 0.01f, 0.1f);
            context._texCoordDerivatives = GeLinearMatrix2<double>(1, 2, 3, 4);
            context._receivesShadows = i % 3 != 0;
            Illumination got;
            const int lookups = spot.projectedSampler()._lookups;
            ASSERT_TRUE(spot.illuminate(context, got));

            const auto [s, t] = imageAt(toV3(context._eyeCoord));
            const GePoint2<double> seen = spot.projectedSampler()._lastTexCoord;
            EXPECT_NEAR(seen.x, s, 1e-5);
            EXPECT_NEAR(seen.y, t, 1e-5);
            const GeLinearMatrix2<double> footprint = spot.projectedSampler()._lastDerivatives;
            if (map->needsDerivatives()) {
                const GeVector3<float>* steps[2] = {&context._dEyeCoord_dx, &context._dEyeCoord_dy};
                for (int axis = 0; axis < 2; ++axis) {
                    const GeVector3<float> h = *steps[axis] * 0.5f;
                    const auto [s1, t1] = imageAt(toV3(context._eyeCoord + h));
                    const auto [s0, t0] = imageAt(toV3(context._eyeCoord - h));
                    EXPECT_NEAR(footprint(axis, 0), s1 - s0, 2e-5 + 1e-3 * std::fabs(s1 - s0)) << "ds, axis " << axis;
                    EXPECT_NEAR(footprint(axis, 1), t1 - t0, 2e-5 + 1e-3 * std::fabs(t1 - t0)) << "dt, axis " << axis;
                }
            } else {
                EXPECT_EQ(footprint, context._texCoordDerivatives) << "the fragment's own footprint";
            }
            EXPECT_EQ(spot.projectedSampler()._lookups, lookups + 1);

            // Lit, the image scales the light; under the stub's shadow the image counts only
            // where light arrives (g channel half, b channel not at all), and then the black
            // shadow colour of full strength scales by the shadow factor.
            const Rgb image(sample.r * 0.75f, sample.g * 0.75f, sample.b * 0.75f);
            const Rgb want = context._receivesShadows
                                 ? Rgb(0.8f * image.r, 0.6f * (0.5f * image.g + 0.5f) * 0.5f, 0.0f)
                                 : light->_color * image;
            expectColour(got._color, want, 1.0, "projected colour");
        }
        // A total shadow leaves the image alone.
        stub._answer = Rgb(0.0f);
        RsShadingContext context;
        context._eyeCoord = lightToWorld.transformPoint({0, 0, -2});
        context._normal = lightToWorld.transformVector({0, 0, 1});
        context._receivesShadows = true;
        const int lookups = spot.projectedSampler()._lookups;
        Illumination got;
        EXPECT_TRUE(spot.illuminate(context, got));
        EXPECT_EQ(spot.projectedSampler()._lookups, lookups);
        spot.unlockMemory();
    }
}

// The shadow colour mix, k = (1 - shadow) x strength, with k below 0, within [0, 1] and above 1
// in the three channels at once (shadow strength 2), with and without the multiply flag; the
// single-factor form agrees with three equal factors.
TEST(RsStdLightShader, ShadowColourMixByRangeOfK) {
    const Rgb colour(0.8f, 0.6f, 0.4f), shadowColour(0.25f, 0.5f, 2.0f), shadow(1.25f, 0.75f, 0.25f);
    struct Row {
        bool multiplies;
        Rgb want;  // k = -0.5, 0.5, 1.5 in r, g, b
    };
    const Row rows[] = {
        {false, {0.8f - 0.125f, 0.6f * 0.5f + 0.25f, 3.0f}},
        {true, {0.8f * (-0.5f + 0.25f), 0.6f * (0.5f + 0.25f), 0.4f * 2.0f * 1.5f}},
    };
    for (const Row& row : rows) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_shadowStrength = 2.0f;
        light->_shadowColorMultiplies = row.multiplies;
        Probe<RsOmniLightShader> omni(1, M(), light);
        Rgb got = colour;
        omni.applyShadowColor(got, shadowColour, shadow);
        expectColour(got, row.want, 1.0, row.multiplies ? "multiplying" : "replacing");
        for (const float s : {shadow.r, shadow.g, shadow.b, 1.0f, -3.0f}) {
            Rgb single = colour, triple = colour;
            omni.applyShadowColor(single, shadowColour, s);
            omni.applyShadowColor(triple, shadowColour, Rgb(s));
            EXPECT_EQ(single, triple) << "shadow " << s;
        }
    }
}

// The end of every light's illumination: a shadow of exactly 1 leaves the colour as it is, even
// with a shadow colour that would poison any mix; a fragment that does not receive shadows is not
// asked about; no evaluator means fully lit; a partial shadow mixes in the shadow colour per
// channel. shadow() gives the mix applied to white, whether or not the fragment receives shadows.
TEST(RsStdLightShader, ShadowStepWithAStubEvaluator) {
    RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
    light->_color = Rgb(0.8f, 0.6f, 0.4f);
    light->_intensity = 2.0f;
    const float inf = std::numeric_limits<float>::infinity();
    forEachKind(light, M::makeTranslation({0, 0, 3}), [&](auto& shader) {
        const std::string kind = std::to_string(static_cast<int>(light->_kind));
        shader.setupRender(M());
        RsShadingContext context;
        context._eyeCoord = {0, 0, 1};
        context._receivesShadows = true;
        Illumination got;
        auto colourUnder = [&](const Rgb& shadow, const Rgb& shadowColour) {
            light->_shadowColor = shadowColour;
            StubShadow stub(shadow);
            shader.useEvaluator(&stub);
            EXPECT_TRUE(shader.illuminate(context, got)) << kind;
            shader.useEvaluator(nullptr);
            return std::pair(got._color, stub._calls);
        };
        const Rgb full = light->_color * 2.0f;
        EXPECT_EQ(colourUnder(Rgb(1.0f), Rgb(inf)), std::pair(full, 1)) << kind;
        context._receivesShadows = false;
        EXPECT_EQ(colourUnder(Rgb(0.0f), Rgb(0.0f)), std::pair(full, 0)) << kind;
        context._receivesShadows = true;
        EXPECT_TRUE(shader.illuminate(context, got));
        EXPECT_EQ(got._color, full) << kind << ": no evaluator";
        const auto [mixed, calls] = colourUnder(Rgb(0.5f, 1.0f, 0.25f), Rgb(0.5f, 9.0f, 1.0f));
        // k = 0.5, 0, 0.75: each channel moves that far towards the shadow colour, then x 2.
        expectColour(mixed, Rgb(2.0f * (0.4f + 0.25f), 1.2f, 2.0f * (0.1f + 0.75f)), 1.0, kind + " partial");

        StubShadow stub(Rgb(0.5f, 1.0f, 0.25f));
        shader.useEvaluator(&stub);
        context._receivesShadows = false;
        expectColour(shader.shadow(context), Rgb(0.75f, 1.0f, 0.25f + 0.75f), 1.0, kind + " shadow()");
        shader.useEvaluator(nullptr);
        EXPECT_EQ(shader.shadow(context), Rgb(1.0f)) << kind;
    });
}

// The spot's and the direct light's own maps, once set up, look at a fragment from where the
// light is: a map filled with a depth just nearer to the light than the fragment shadows it, one
// just beyond lights it. Placements of light and camera are random.
TEST(RsStdLightShader, OwnShadowMapSeesTheFragmentFromTheLight) {
    std::mt19937 rng(8);
    for (int round = 0; round < 20; ++round) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_shadowMapSize = 16;
        light->_shadowBias = 0.01f;
        light->_shadowRange = 0.0f;  // one cell decides, exactly
        light->_aspect = uniform(rng, 0.5f, 2);
        light->_width = uniform(rng, 2, 20);
        const M lightToWorld = randomRigid(rng, 5);
        const M worldToCamera = randomRigid(rng, 5);
        const float depth = uniform(rng, 1, 10);
        auto check = [&](auto& shader, float halfWidth, float halfHeight) {
            shader.setupRender(worldToCamera);
            shader.useOwnMap();
            double* cells = shader.getShadowMap().getMap();
            const GePoint3<float> inLight(uniform(rng, -0.8f, 0.8f) * halfWidth, uniform(rng, -0.8f, 0.8f) * halfHeight,
                                          -depth);
            RsShadingContext context;
            context._eyeCoord = worldToCamera.transformPoint(lightToWorld.transformPoint(inLight));
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
    struct Row {
        Mode mode;
        std::set<unsigned int> lights;
        bool reaches;
    };
    const Row rows[] = {
        {Mode::include, {7}, true},  {Mode::include, {1, 8}, false}, {Mode::include, {}, false},
        {Mode::exclude, {3, 7}, false}, {Mode::exclude, {6}, true},     {Mode::exclude, {}, true},
    };
    for (const Row& row : rows) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_linkMode = row.mode;
        RsOmniLightShader omni(7, M(), light);
        EXPECT_EQ(omni.includes(row.lights), row.reaches) << static_cast<int>(row.mode) << " " << row.lights.size();
    }
}

// Locks count; an unlock beyond them fails with the fixed text and position and changes nothing.
// The spot makes its image's sampler at the first lock. Every light needs a description.
TEST(RsStdLightShader, LockCountAndNullLight) {
    RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
    light->_kind = Kind::spot;
    light->_useProjectedMap = true;
    light->_projectedMap = makeShared<ConstantParams>(Rgba(1, 1, 1, 1));
    Probe<RsSpotLightShader> spot(1, M(), light);
    spot.lockMemory();
    spot.lockMemory();
    EXPECT_EQ(spot.projectedSampler()._lookups, 0) << "the sampler stands after the first lock";
    spot.unlockMemory();
    spot.unlockMemory();
    try {
        spot.unlockMemory();
        ADD_FAILURE() << "an unbalanced unlock must fail";
    } catch (const ExAssertionFailed& e) {
        EXPECT_EQ(e.getFile(), "render\\yarp\\src\\rsLightShader");
        EXPECT_EQ(e.getLine(), 144);
        EXPECT_NE(std::string(e.what()).find("_lockCount > 0"), std::string::npos);
    }
    EXPECT_EQ(spot._lockCount, 0);

    const RCShdPtr<const SdStdLight> none;
    EXPECT_THROW(RsOmniLightShader(1, M(), none), ExNullPtr);
    EXPECT_THROW(RsDirectLightShader(1, M(), none), ExNullPtr);
    EXPECT_THROW(RsSpotLightShader(1, M(), none), ExNullPtr);
}

}  // namespace
}  // namespace Zr
