// The shading context: the normalisation rule, the view vector against its closed form, and bump
// mapping against a double-precision reference in randomly turned tangent frames and at its
// degenerate cases.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>
#include <string>
#include <vector>

#include "rsShadingContext.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using RsTest::ConstantSampler;

struct D3 {
    double x, y, z;
};

D3 toD3(const GeVector3<float>& v) { return {v.x, v.y, v.z}; }
double dot(const D3& a, const D3& b) { return a.x * b.x + a.y * b.y + a.z * b.z; }
D3 scaled(const D3& a, double s) { return {a.x * s, a.y * s, a.z * s}; }
D3 plus(const D3& a, const D3& b) { return {a.x + b.x, a.y + b.y, a.z + b.z}; }
D3 unit(const D3& a) {
    const double l = std::sqrt(dot(a, a));
    return l == 0.0 ? D3{0, 0, 0} : scaled(a, 1.0 / l);
}
GeVector3<float> toF(const D3& a) {
    return {static_cast<float>(a.x), static_cast<float>(a.y), static_cast<float>(a.z)};
}

void expectNear(const GeVector3<float>& got, const D3& want, double tolerance,
                const std::string& what) {
    EXPECT_NEAR(got.x, want.x, tolerance) << what;
    EXPECT_NEAR(got.y, want.y, tolerance) << what;
    EXPECT_NEAR(got.z, want.z, tolerance) << what;
}

TEST(RsShadingContext, NormalizeOrZeroGivesTheUnitDirectionOrZero) {
    std::mt19937 rng(7);
    std::uniform_real_distribution<double> component(-1.0, 1.0);
    std::uniform_int_distribution<int> exponent(-15, 15);
    for (int i = 0; i < 2000; ++i) {
        const double scale = std::pow(10.0, exponent(rng));
        const D3 v{component(rng) * scale, component(rng) * scale, component(rng) * scale};
        const GeVector3<float> vf = toF(v);
        const GeVector3<float> n = RsShadingContext::normalizeOrZero(vf);
        expectNear(n, unit(toD3(vf)), 4e-7, "scale " + std::to_string(scale));
    }

    // Exactly zero, and so small that the squared length underflows to zero in single precision:
    // both give the zero vector rather than a failure or a NaN.
    for (const GeVector3<float>& tiny :
         {GeVector3<float>(0.0f, 0.0f, 0.0f), GeVector3<float>(-0.0f, 0.0f, -0.0f),
          GeVector3<float>(1e-30f, -1e-30f, 1e-30f)}) {
        const GeVector3<float> n = RsShadingContext::normalizeOrZero(tiny);
        EXPECT_EQ(n, GeVector3<float>(0.0f, 0.0f, 0.0f));
    }
}

TEST(RsShadingContext, ViewVectorPointsFromTheSurfaceToTheEye) {
    std::mt19937 rng(11);
    std::uniform_real_distribution<float> coordinate(-50.0f, 50.0f);
    RsShadingContext context;
    for (int i = 0; i < 1000; ++i) {
        context._eyeCoord = GePoint3<float>(coordinate(rng), coordinate(rng), coordinate(rng));
        const D3 e{context._eyeCoord.x, context._eyeCoord.y, context._eyeCoord.z};
        const GeVector3<float> v = context.computeViewVector();
        expectNear(v, unit(scaled(e, -1.0)), 4e-7, "perspective");
    }

    // A fragment at the eye itself has no direction to the viewer.
    context._eyeCoord = GePoint3<float>(0.0f, 0.0f, 0.0f);
    EXPECT_EQ(context.computeViewVector(), GeVector3<float>(0.0f, 0.0f, 0.0f));

    // Orthographic: the position does not matter, and the view direction is taken as it stands,
    // without normalising it again.
    context._orthographic = true;
    for (const GeVector3<float>& direction :
         {GeVector3<float>(0.0f, 0.0f, -1.0f), GeVector3<float>(0.6f, 0.0f, -0.8f),
          GeVector3<float>(0.0f, 2.0f, -2.0f)}) {
        context._viewDirection = direction;
        for (int i = 0; i < 20; ++i) {
            context._eyeCoord = GePoint3<float>(coordinate(rng), coordinate(rng), coordinate(rng));
            EXPECT_EQ(context.computeViewVector(), -direction);
        }
    }
}

// A context with the canonical tangent frame: tangent x, binormal y, normal z.
RsShadingContext canonicalFrame() {
    RsShadingContext context;
    context._tangent = GeVector3<float>(1.0f, 0.0f, 0.0f);
    context._binormal = GeVector3<float>(0.0f, 1.0f, 0.0f);
    context._normal = GeVector3<float>(0.0f, 0.0f, 1.0f);
    return context;
}

TEST(RsShadingContext, BumpMapOfNegligibleWeightLeavesTheNormalAndSamplesNothing) {
    const float smallestNormal = std::numeric_limits<float>::min();
    const float denormal = std::numeric_limits<float>::denorm_min();
    const ConstantSampler sampler(CoRgbaColorTyped<float>(1.0f, 0.0f, 0.3f, 1.0f));
    for (float weight : {0.0f, -0.0f, denormal, -denormal, smallestNormal, -smallestNormal,
                         std::numeric_limits<float>::quiet_NaN()}) {
        RsShadingContext context = canonicalFrame();
        context._normal = GeVector3<float>(0.0f, 0.6f, 0.8f);
        // A stale, unnormalised frame must not be read either.
        context._tangent = GeVector3<float>(5.0f, 5.0f, 5.0f);
        context.applyBumpMap(sampler, weight);
        EXPECT_EQ(context._normal, GeVector3<float>(0.0f, 0.6f, 0.8f)) << weight;
    }
    EXPECT_EQ(sampler._lookups, 0);

    // The first weight above the threshold does bump.
    RsShadingContext context = canonicalFrame();
    context.applyBumpMap(sampler, std::nextafter(smallestNormal, 1.0f));
    EXPECT_EQ(sampler._lookups, 1);
}

TEST(RsShadingContext, BumpMapMatchesWorkedValues) {
    const double r = 1.0 / std::sqrt(2.0);
    struct Case {
        CoRgbaColorTyped<float> sample;
        float weight;
        D3 normal;
    };
    const Case cases[] = {
        // A flat bump texel points along the normal: nothing changes, whatever the weight.
        {{0.5f, 0.5f, 1.0f, 1.0f}, 0.5f, {0, 0, 1}},
        {{0.5f, 0.5f, 1.0f, 1.0f}, 3.0f, {0, 0, 1}},
        // Full weight takes the texel's direction.
        {{1.0f, 0.5f, 0.5f, 1.0f}, 1.0f, {1, 0, 0}},
        {{0.5f, 0.0f, 0.5f, 1.0f}, 1.0f, {0, -1, 0}},
        {{1.0f, 1.0f, 1.0f, 1.0f}, 1.0f, {1 / std::sqrt(3.0), 1 / std::sqrt(3.0), 1 / std::sqrt(3.0)}},
        // Half weight halves the way: N + (b - N) / 2 = (0.5, 0, 0.5).
        {{1.0f, 0.5f, 0.5f, 1.0f}, 0.5f, {r, 0, r}},
        // A weight above 1 overshoots: N + 2 (b - N) = (2, 0, -1).
        {{1.0f, 0.5f, 0.5f, 1.0f}, 2.0f, {2 / std::sqrt(5.0), 0, -1 / std::sqrt(5.0)}},
        // A negative weight leans the other way: N - (b - N) = (-1, 0, 2).
        {{1.0f, 0.5f, 0.5f, 1.0f}, -1.0f, {-1 / std::sqrt(5.0), 0, 2 / std::sqrt(5.0)}},
        // A grey texel has no direction: b is zero and n = (1 - w) N, normalised.
        {{0.5f, 0.5f, 0.5f, 1.0f}, 0.5f, {0, 0, 1}},
        {{0.5f, 0.5f, 0.5f, 1.0f}, 1.0f, {0, 0, 0}},
        {{0.5f, 0.5f, 0.5f, 1.0f}, 2.0f, {0, 0, -1}},
        // Alpha plays no part.
        {{1.0f, 0.5f, 0.5f, 0.0f}, 0.5f, {r, 0, r}},
    };
    for (const Case& c : cases) {
        const ConstantSampler sampler(c.sample);
        RsShadingContext context = canonicalFrame();
        context.applyBumpMap(sampler, c.weight);
        expectNear(context._normal, c.normal, 2e-7, "weight " + std::to_string(c.weight) + " red " + std::to_string(c.sample.r));
        // The frame itself stays as it was.
        EXPECT_EQ(context._tangent, GeVector3<float>(1.0f, 0.0f, 0.0f));
        EXPECT_EQ(context._binormal, GeVector3<float>(0.0f, 1.0f, 0.0f));
    }
}

TEST(RsShadingContext, BumpMapTurnsWithTheTangentFrame) {
    std::mt19937 rng(23);
    std::uniform_real_distribution<double> component(-1.0, 1.0);
    std::uniform_real_distribution<float> channel(0.0f, 1.0f);
    std::uniform_real_distribution<float> weightOf(-1.5f, 2.5f);
    int checked = 0;
    for (int i = 0; i < 3000; ++i) {
        // A random orthonormal frame.
        const D3 n = unit({component(rng), component(rng), component(rng)});
        D3 t{component(rng), component(rng), component(rng)};
        t = unit(plus(t, scaled(n, -dot(t, n))));
        const D3 b{n.y * t.z - n.z * t.y, n.z * t.x - n.x * t.z, n.x * t.y - n.y * t.x};

        const CoRgbaColorTyped<float> sample(channel(rng), channel(rng), channel(rng), 1.0f);
        const float weight = weightOf(rng);

        // The reference in frame coordinates, where the frame is the identity.
        const D3 c{sample.r - 0.5, sample.g - 0.5, sample.b - 0.5};
        const D3 bumped = unit(c);
        const D3 blended = plus(D3{0, 0, 1}, scaled(plus(bumped, D3{0, 0, -1}), weight));
        if (std::sqrt(dot(blended, blended)) < 0.1 || std::sqrt(dot(c, c)) < 0.05) continue;
        const D3 local = unit(blended);
        const D3 expected = plus(plus(scaled(t, local.x), scaled(b, local.y)), scaled(n, local.z));

        RsShadingContext context;
        context._tangent = toF(t);
        context._binormal = toF(b);
        context._normal = toF(n);
        const ConstantSampler sampler(sample);
        context.applyBumpMap(sampler, weight);
        expectNear(context._normal, expected, 2e-5, "case " + std::to_string(i));
        EXPECT_NEAR(context._normal.length(), 1.0f, 1e-6f);
        ++checked;
    }
    EXPECT_GT(checked, 2000);
}

TEST(RsShadingContext, BumpMapLooksUpAtTheFragmentsTextureFootprint) {
    const ConstantSampler sampler(CoRgbaColorTyped<float>(0.7f, 0.2f, 0.9f, 1.0f));
    RsShadingContext context = canonicalFrame();
    context._texCoord = GePoint2<double>(0.125, -3.75);
    context._texCoordDerivatives = GeLinearMatrix2<double>(0.01, 0.02, -0.03, 0.04);
    context.applyBumpMap(sampler, 0.75f);
    EXPECT_EQ(sampler._lookups, 1);
    EXPECT_EQ(sampler._lastTexCoord, GePoint2<double>(0.125, -3.75));
    EXPECT_EQ(sampler._lastDerivatives, GeLinearMatrix2<double>(0.01, 0.02, -0.03, 0.04));
    // The lookup position is the fragment's; bumping does not move it.
    EXPECT_EQ(context._texCoord, GePoint2<double>(0.125, -3.75));
}

}  // namespace
}  // namespace Zr
