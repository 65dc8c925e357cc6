// The standard lights against closed forms, tables and their own maps; linking and locking.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <set>

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
using M = GeAffineMatrix3<float>;
using P = GePoint3<float>;
using D3 = GeVector3<double>;

// A light that can be its own stub shadow evaluator, answering _answer, and shows its sampler.
template <class Light>
struct Probe : Light, RsShadowEvaluator {
    using Light::Light;
    Rgb computeFastShadow(const P&) const override { return _answer; }
    Rgb computeBestShadow(const P&) const override { return _answer; }
    void useEvaluator(const RsShadowEvaluator* evaluator) { this->_shadowEvaluator = evaluator; }
    void useStub(const Rgb& answer) { _answer = answer, useEvaluator(this); }
    const ConstantSampler& sampler() const { return dynamic_cast<const ConstantSampler&>(*this->_projectedSampler); }
    Rgb _answer;
};

std::mt19937 rng(11);
float uniform(float lo, float hi) { return std::uniform_real_distribution<float>(lo, hi)(rng); }
GeVector3<float> randomUnit() {
    std::normal_distribution<float> g;  // isotropic once normalised
    return RsShadingContext::normalizeOrZero({g(rng), g(rng), g(rng)});
}
M randomRigid() { return M::makeTranslation(randomUnit() * 8.0f) * M::makeRotation(randomUnit(), uniform(-3, 3)); }
RsShadingContext at(const P& p, const GeVector3<float>& normal = {0, 0, 1}, bool receivesShadows = false) {
    RsShadingContext context;
    context._eyeCoord = p, context._normal = normal, context._receivesShadows = receivesShadows;
    return context;
}

D3 toLight(const M& lightToWorld, const P& p) { return D3(lightToWorld.getTranslation()) - D3(p.x, p.y, p.z); }

// The decay at d halves the strength at the parameter d0: 1 / (1 + d / d0) or 1 / (1 + (d / d0)^2).
double decayOf(const SdStdLight& l, double d) {
    const double x = d / l._decayParameter, linear = l._decayType == SdStdLight::DecayType::linear;
    return l._decayType == SdStdLight::DecayType::none ? 1.0 : 1.0 / (1.0 + (linear ? x : x * x));
}

// Strength is that of _ambient (untouched unless ambientSet) and of _color over the light's colour.
struct Expected { bool lit, ambientSet; double strength; D3 direction; double cosine; bool nearBoundary; };

// Omni: towards the light's origin; turned away, only the ambient term, still decaying.
Expected omniOracle(const SdStdLight& l, const M& lightToWorld, const P& p, const D3& n) {
    const D3 to = toLight(lightToWorld, p);
    const double d = to.length(), c = n.dot(to) / d;
    return {c > 0, c > 0 || l._emitAmbient, l._intensity * decayOf(l, d), to / d, c, std::fabs(c) < 1e-4};
}

// Direct: along the light's -z, decaying with the signed distance past its plane, if it reaches.
Expected directOracle(const SdStdLight& l, const M& lightToWorld, const P& p, const D3& n) {
    const D3 towards = D3(lightToWorld.getColumn(2)).getNormalized();
    const double c = towards.dot(n), decay = decayOf(l, towards.dot(toLight(lightToWorld, p)));
    const bool near = std::fabs(c) < 1e-4 || std::fabs(1.0 / decay) < 0.05;
    if (decay <= 0) return {false, c <= 0 && l._emitAmbient, 0.0, towards, c, near};
    return {c > 0, c > 0 || l._emitAmbient, l._intensity * decay, towards, c, near};
}

// Spot: omni times a smooth step of a ramp from 0 on the cone to 1 at the inner cone, by the
// distance from the axis in a round cone, by the product of the ramps across a square one.
Expected spotOracle(const SdStdLight& l, const M& lightToWorld, const P& p, const D3& n) {
    Expected e = omniOracle(l, lightToWorld, p, n);
    const GePoint3<double> q = GeAffineMatrix3<double>(lightToWorld).computeInverse().transformPoint({p.x, p.y, p.z});
    const double outerTan = std::tan(0.5 * l._outerConeAngle), innerTan = std::tan(0.5 * l._innerConeAngle);
    const double start = l._innerConeAngle >= l._outerConeAngle ? 1 : innerTan / outerTan;
    const double cx = std::fabs(q.x / (l._aspect * outerTan * q.z)), cy = std::fabs(q.y / (outerTan * q.z));
    const bool round = l._coneShape == SdStdLight::ConeShape::circular;
    const double place = round ? std::hypot(cx, cy) : std::max(cx, cy);
    auto ramp = [&](double f) { return start >= 1 ? 1.0 : std::clamp((1 - f) / (1 - start), 0.0, 1.0); };
    const double t = round ? ramp(place) : ramp(cx) * ramp(cy), inside = q.z < 0 && place <= 1;
    e.nearBoundary |= std::fabs(q.z) < 1e-4 || std::fabs(place - 1) < 1e-4;
    e.ambientSet = true, e.lit = e.lit && inside, e.strength *= inside * t * t * (3 - 2 * t);
    return e;
}

void expectColour(const Rgb& got, const Rgb& colour, double factor, int where) {
    const double want[] = {colour.r * factor, colour.g * factor, colour.b * factor}, has[] = {got.r, got.g, got.b};
    for (int i = 0; i < 3; ++i) EXPECT_NEAR(has[i], want[i], 2e-4 * std::max(1.0, std::fabs(want[i]))) << where;
}

// What a stub's shadow leaves of (0.8, 0.6, 0.4): k = (1 - shadow) x strength below 0, at 0, in
// (0, 1] and above 1, replacing and multiplying; a shadow of 1 leaves it, whatever the shadow colour.
const struct { bool multiplies; float strength; Rgb shadow, shadowColour, want; } shadowRows[] = {
    {false, 2, {1.25f, 0.75f, 0.25f}, {0.25f, 0.5f, 2}, {0.8f - 0.125f, 0.6f * 0.5f + 0.25f, 3}},
    {true, 2, {1.25f, 0.75f, 0.25f}, {0.25f, 0.5f, 2}, {0.8f * (-0.5f + 0.25f), 0.6f * 0.75f, 0.4f * 2 * 1.5f}},
    {false, 1, {0.5f, 1, 0.25f}, {0.5f, 9, 1}, {0.4f + 0.25f, 0.6f, 0.1f + 0.75f}},
    {true, 1, {1, 0.5f, 0.5f}, {0.5f, 0.5f, 0.5f}, {0.8f, 0.6f * 0.75f, 0.4f * 0.75f}},
    {false, 1, {1, 1, 1}, {INFINITY, INFINITY, INFINITY}, {0.8f, 0.6f, 0.4f}}};

// Random lights of each kind lighting random fragments, mostly about the spot's cone, through a
// random camera; half of them receive the stub's shadow, which the others never see.
TEST(RsStdLightShader, IlluminationMatchesTheClosedFormsAtRandomPoints) {
    for (int round = 0; round < 300; ++round) {
        const auto& row = shadowRows[round % 5];
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_color = Rgb(0.8f, 0.6f, 0.4f);
        light->_shadowColorMultiplies = row.multiplies;
        light->_shadowStrength = row.strength;
        light->_shadowColor = row.shadowColour;
        light->_intensity = uniform(0.5f, 2);
        light->_decayType = static_cast<SdStdLight::DecayType>(rng() % 3);
        light->_decayParameter = uniform(1, 10);
        light->_emitAmbient = rng() % 2;
        light->_coneShape = static_cast<SdStdLight::ConeShape>(rng() % 2);
        light->_aspect = uniform(0.5f, 2);
        light->_outerConeAngle = uniform(0.3f, 2.0f);
        light->_innerConeAngle = uniform(0.1f, 2.2f);  // beyond the outer: a hard edge
        const M lightToWorld = randomRigid(), toCamera = randomRigid();
        const float outerTan = std::tan(0.5f * light->_outerConeAngle);
        auto check = [&](auto&& shader, auto oracle) {
            shader.setupRender(toCamera);
            shader.useStub(row.shadow);
            for (int i = 0; i < 20; ++i) {
                const float z = uniform(0.2f, 15) * (i % 4 ? 1 : -1), y = uniform(-1.3f, 1.3f) * outerTan * z;
                const P p = lightToWorld.transformPoint({uniform(-1.3f, 1.3f) * light->_aspect * outerTan * z, y, -z});
                const GeVector3<float> n = randomUnit();
                const Expected e = oracle(*light, lightToWorld, p, D3(n));
                if (e.nearBoundary) continue;
                RsLightShader::Illumination got{{0, 0, 1}, Rgb(-7.0f)};
                const RsShadingContext context = at(toCamera.transformPoint(p), toCamera.transformVector(n), i % 2);
                ASSERT_EQ(shader.illuminate(context, got), e.lit) << round;
                const Rgb ambient = e.ambientSet ? light->_color : Rgb(-7.0f);
                expectColour(got._ambient, ambient, e.ambientSet ? e.strength : 1, round);
                if (!e.lit) continue;
                expectColour(got._color, context._receivesShadows ? row.want : light->_color, e.strength, round);
                EXPECT_NEAR(got._cosine, e.cosine, 2e-4) << round;
                EXPECT_NEAR((D3(toCamera.mulOnRight(got._direction)) - e.direction).length(), 0, 2e-4) << round;
            }
        };
        check(Probe<RsDirectLightShader>(1, lightToWorld, light), directOracle);
        check(Probe<RsOmniLightShader>(1, lightToWorld, light), omniOracle);
        check(Probe<RsSpotLightShader>(1, lightToWorld, light), spotOracle);
    }
}

// On the edge of a cone 90 degrees across, and at the light: the edge is dark but not rejected.
TEST(RsSpotLightShader, ConeEdges) {
    const float right = 1.5707964f, inner = 1.0471976f;  // tan(right / 2) is 1 exactly
    const auto round = SdStdLight::ConeShape::circular, square = SdStdLight::ConeShape::rectangular;
    const struct { SdStdLight::ConeShape shape; float inner; P point; bool lit; float strength, cosine; } cases[] = {
        {round, inner, {1, 0, -1}, true, 0, 0.70710678f}, {round, right, {1, 0, -1}, true, 1, 0.70710678f},
        {round, inner, {0, 0, 0}, false, 0, 0},           {square, inner, {1, 0.5f, -1}, true, 0, 0.66666667f}};
    for (const auto& c : cases) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_coneShape = c.shape;
        light->_outerConeAngle = right;
        light->_innerConeAngle = c.inner;
        RsSpotLightShader spot(1, M(), light);
        spot.setupRender(M());
        RsLightShader::Illumination got;
        EXPECT_EQ(spot.illuminate(at(c.point), got), c.lit) << &c - cases;
        const Rgb want(c.strength, c.lit ? c.strength : 0, c.cosine), has(got._ambient.g, got._color.g, got._cosine);
        expectColour(has, want, 1, &c - cases);
    }
}

// The own map filled just nearer than a fragment in the cone shadows it, just beyond lights it. The
// image spans the cone from 0 to 1, its footprint the change across a pixel step; fades with shadow.
TEST(RsSpotLightShader, OwnMapAndProjectedImage) {
    for (int round = 0; round < 100; ++round) {
        RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
        light->_aspect = uniform(0.5f, 2);
        light->_innerConeAngle = light->_outerConeAngle = uniform(0.4f, 1.6f);  // full strength in the cone
        light->_shadowRange = 0.0f;  // one cell decides, exactly
        light->_useProjectedMap = true;
        RCShdPtr<ConstantParams> map = makeShared<ConstantParams>(Rgba(0.5f, 0.25f, 2.0f, 1.0f), 0.75f);
        if (round % 2) map->_filter = SdTextureParams::Filter::footprint;
        light->_projectedMap = map;
        const M lightToWorld = randomRigid(), worldToCamera = randomRigid();
        const M lightToCamera = worldToCamera * lightToWorld, cameraToLight = lightToCamera.computeInverse();
        const float z = uniform(1, 10), h = std::tan(0.5f * light->_outerConeAngle), w = h * light->_aspect;
        const float x = uniform(-0.6f, 0.6f) * w * z, y = uniform(-0.6f, 0.6f) * h * z;
        const P p = lightToCamera.transformPoint({x, y, -z});
        RsShadingContext context = at(p, lightToCamera.transformVector({0, 0, 1}), true);
        context._dEyeCoord_dx = randomUnit() * uniform(0.01f, 0.1f);
        context._dEyeCoord_dy = randomUnit() * uniform(0.01f, 0.1f);
        Probe<RsSpotLightShader> spot(1, lightToWorld, light);
        spot.setupRender(worldToCamera);
        spot.useEvaluator(&spot.getShadowMap());
        for (const double offset : {0.5, -0.5}) {
            std::fill_n(spot.getShadowMap().getMap(), light->_shadowMapSize * light->_shadowMapSize, -z + offset);
            EXPECT_EQ(spot.shadow(context), Rgb(offset > 0 ? 0.0f : 1.0f)) << round;
        }
        spot.lockMemory();
        spot.useStub(Rgb(1.0f, 0.5f, 0.0f));
        RsLightShader::Illumination got;
        ASSERT_TRUE(spot.illuminate(context, got));
        auto imageAt = [&](const P& p) {
            const P q = cameraToLight.transformPoint(p);
            return D3(0.5 - 0.5 * q.x / (w * q.z), 0.5 - 0.5 * q.y / (h * q.z), 0);
        };
        const GePoint2<double> st = spot.sampler()._lastTexCoord;
        EXPECT_LT((imageAt(context._eyeCoord) - D3(st.x, st.y, 0)).length(), 1e-5) << round;
        const GeLinearMatrix2<double> footprint = spot.sampler()._lastDerivatives;
        for (int axis = 0; axis < 2 && map->needsDerivatives(); ++axis) {
            const GeVector3<float> half = (axis ? context._dEyeCoord_dy : context._dEyeCoord_dx) * 0.5f;
            const D3 step = imageAt(context._eyeCoord + half) - imageAt(context._eyeCoord - half);
            EXPECT_NEAR(footprint(axis, 0), step.x, 2e-5 + 1e-3 * std::fabs(step.x)) << round << " ds " << axis;
            EXPECT_NEAR(footprint(axis, 1), step.y, 2e-5 + 1e-3 * std::fabs(step.y)) << round << " dt " << axis;
        }
        // Image (0.375, 0.1875, 1.5) where light arrives, then the black shadow colour darkens.
        expectColour(got._color, Rgb(0.375f, (0.5f * 0.1875f + 0.5f) * 0.5f, 0), 1, round);
    }
}

// Include mode: the instances that list the light; exclude: the others. Locks count; lights need one.
TEST(RsStdLightShader, LinkingLockingAndNullLight) {
    const std::set<unsigned int> lists[] = {{7}, {1, 8}, {}};
    RCShdPtr<SdStdLight> light = makeShared<SdStdLight>();
    for (const bool include : {true, false}) {
        light->_linkMode = include ? SdLight::LinkMode::include : SdLight::LinkMode::exclude;
        for (int i = 0; i < 3; ++i) EXPECT_EQ(RsOmniLightShader(7, M(), light).includes(lists[i]), (i == 0) == include);
    }
    RsOmniLightShader omni(1, M(), light);
    for (const int step : {1, 1, -1, -1}) step > 0 ? omni.lockMemory() : omni.unlockMemory();
    EXPECT_THROW(omni.unlockMemory(), ExAssertionFailed);
    EXPECT_THROW(RsSpotLightShader(1, M(), RCShdPtr<const SdStdLight>()), ExNullPtr);
}

}  // namespace
}  // namespace Zr
