// The shading context: the normalisation rule, the view vector against its
// closed form, and bump mapping against a double-precision reference in randomly turned tangent
// frames and at its degenerate cases.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>
#include <string>

#include "rsShadingContext.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using RsTest::ConstantSampler;
using V = GeVector3<double>;

V toD(const GeVector3<float>& v) { return {v.x, v.y, v.z}; }
GeVector3<float> toF(const V& v) { return {float(v.x), float(v.y), float(v.z)}; }
V unit(const V& v) { return v.length() == 0.0 ? V(0, 0, 0) : v * (1.0 / v.length()); }

void expectNear(const GeVector3<float>& got, const V& want, double tolerance, const std::string& what) {
    EXPECT_NEAR(got.x, want.x, tolerance) << what;
    EXPECT_NEAR(got.y, want.y, tolerance) << what;
    EXPECT_NEAR(got.z, want.z, tolerance) << what;
}

// Directions over thirty orders of magnitude come out as their unit vector; zero, and vectors so
// short that their squared length underflows, give the zero vector rather than a NaN.
TEST(RsShadingContext, NormalizeOrZeroGivesTheUnitDirectionOrZero) {
    std::mt19937 rng(7);
    std::uniform_real_distribution<double> component(-1.0, 1.0);
    for (int i = 0; i < 2000; ++i) {
        const double scale = std::pow(10.0, int(rng() % 31) - 15);
        const GeVector3<float> v = toF(V(component(rng), component(rng), component(rng)) * scale);
        expectNear(RsShadingContext::normalizeOrZero(v), unit(toD(v)), 4e-7, "scale " + std::to_string(scale));
    }
    for (const GeVector3<float>& tiny :
         {GeVector3<float>(0, 0, 0), GeVector3<float>(-0.0f, 0, -0.0f), GeVector3<float>(1e-30f, -1e-30f, 1e-30f)})
        EXPECT_EQ(RsShadingContext::normalizeOrZero(tiny), GeVector3<float>(0.0f, 0.0f, 0.0f));
}

// In perspective the view vector points from the surface to the eye (none at the eye itself);
// parallel, it is the view direction reversed as it stands, wherever the surface lies.
TEST(RsShadingContext, ViewVectorPointsFromTheSurfaceToTheEye) {
    std::mt19937 rng(11);
    std::uniform_real_distribution<float> coordinate(-50.0f, 50.0f);
    RsShadingContext context;
    for (int i = 0; i < 1000; ++i) {
        context._eyeCoord = GePoint3<float>(coordinate(rng), coordinate(rng), coordinate(rng));
        expectNear(context.computeViewVector(),
                   unit(V(-context._eyeCoord.x, -context._eyeCoord.y, -context._eyeCoord.z)), 4e-7, "perspective");
    }
    context._eyeCoord = GePoint3<float>(0.0f, 0.0f, 0.0f);
    EXPECT_EQ(context.computeViewVector(), GeVector3<float>(0.0f, 0.0f, 0.0f));
    context._orthographic = true;
    for (const GeVector3<float>& direction :
         {GeVector3<float>(0, 0, -1), GeVector3<float>(0.6f, 0, -0.8f), GeVector3<float>(0, 2, -2)}) {
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

// A weight of no more than the smallest normal float in magnitude, or not a number, leaves the
// normal alone without a lookup (nor a look at a stale frame); the first weight above it bumps.
TEST(RsShadingContext, BumpMapOfNegligibleWeightLeavesTheNormalAndSamplesNothing) {
    const float smallest = std::numeric_limits<float>::min(), denormal = std::numeric_limits<float>::denorm_min();
    const ConstantSampler sampler(CoRgbaColorTyped<float>(1.0f, 0.0f, 0.3f, 1.0f));
    for (float weight :
         {0.0f, -0.0f, denormal, -denormal, smallest, -smallest, std::numeric_limits<float>::quiet_NaN()}) {
        RsShadingContext context = canonicalFrame();
        context._normal = GeVector3<float>(0.0f, 0.6f, 0.8f);
        context._tangent = GeVector3<float>(5.0f, 5.0f, 5.0f);
        context.applyBumpMap(sampler, weight);
        EXPECT_EQ(context._normal, GeVector3<float>(0.0f, 0.6f, 0.8f)) << weight;
    }
    EXPECT_EQ(sampler._lookups, 0);
    RsShadingContext context = canonicalFrame();
    context.applyBumpMap(sampler, std::nextafter(smallest, 1.0f));
    EXPECT_EQ(sampler._lookups, 1);
}

// The texel, less a half, is a direction in the tangent frame; the normal moves towards it by the
// weight and is normalised. Worked values in the canonical frame (a grey texel has no direction,
// and alpha plays no part), then random frames, texels and weights against the reference in
// double. The frame itself stays, and the lookup is at the fragment's texture footprint.
TEST(RsShadingContext, BumpMapTurnsTheNormalInTheTangentFrame) {
    const double r = 1.0 / std::sqrt(2.0), s3 = 1.0 / std::sqrt(3.0), s5 = 1.0 / std::sqrt(5.0);
    const std::tuple<CoRgbaColorTyped<float>, float, V> worked[] = {
        {{0.5f, 0.5f, 1.0f, 1.0f}, 0.5f, {0, 0, 1}},   {{0.5f, 0.5f, 1.0f, 1.0f}, 3.0f, {0, 0, 1}},
        {{1.0f, 0.5f, 0.5f, 1.0f}, 1.0f, {1, 0, 0}},   {{0.5f, 0.0f, 0.5f, 1.0f}, 1.0f, {0, -1, 0}},
        {{1.0f, 1.0f, 1.0f, 1.0f}, 1.0f, {s3, s3, s3}}, {{1.0f, 0.5f, 0.5f, 1.0f}, 0.5f, {r, 0, r}},
        {{1.0f, 0.5f, 0.5f, 1.0f}, 2.0f, {2 * s5, 0, -s5}}, {{1.0f, 0.5f, 0.5f, 1.0f}, -1.0f, {-s5, 0, 2 * s5}},
        {{0.5f, 0.5f, 0.5f, 1.0f}, 0.5f, {0, 0, 1}},   {{0.5f, 0.5f, 0.5f, 1.0f}, 1.0f, {0, 0, 0}},
        {{0.5f, 0.5f, 0.5f, 1.0f}, 2.0f, {0, 0, -1}},  {{1.0f, 0.5f, 0.5f, 0.0f}, 0.5f, {r, 0, r}},
    };
    for (const auto& [sample, weight, normal] : worked) {
        RsShadingContext context = canonicalFrame();
        context._texCoord = GePoint2<double>(0.125, -3.75);
        context._texCoordDerivatives = GeLinearMatrix2<double>(0.01, 0.02, -0.03, 0.04);
        const ConstantSampler sampler(sample);
        context.applyBumpMap(sampler, weight);
        expectNear(context._normal, normal, 2e-7,
                   "weight " + std::to_string(weight) + " red " + std::to_string(sample.r));
        EXPECT_EQ(context._tangent, GeVector3<float>(1.0f, 0.0f, 0.0f));
        EXPECT_EQ(context._binormal, GeVector3<float>(0.0f, 1.0f, 0.0f));
        EXPECT_EQ(sampler._lastTexCoord, GePoint2<double>(0.125, -3.75));
        EXPECT_EQ(sampler._lastDerivatives, GeLinearMatrix2<double>(0.01, 0.02, -0.03, 0.04));
    }
    std::mt19937 rng(23);
    std::uniform_real_distribution<double> component(-1.0, 1.0);
    std::uniform_real_distribution<float> channel(0.0f, 1.0f), weightOf(-1.5f, 2.5f);
    int checked = 0;
    for (int i = 0; i < 3000; ++i) {
        const V n = unit(V(component(rng), component(rng), component(rng)));
        V t(component(rng), component(rng), component(rng));
        t = unit(t - n * t.dot(n));
        const V b = n.cross(t);
        const CoRgbaColorTyped<float> sample(channel(rng), channel(rng), channel(rng), 1.0f);
        const float weight = weightOf(rng);
        // The reference in frame coordinates, where the frame is the identity.
        const V c(sample.r - 0.5, sample.g - 0.5, sample.b - 0.5);
        const V blended = V(0, 0, 1) + (unit(c) - V(0, 0, 1)) * double(weight);
        if (blended.length() < 0.1 || c.length() < 0.05) continue;
        const V local = unit(blended);
        RsShadingContext context;
        context._tangent = toF(t);
        context._binormal = toF(b);
        context._normal = toF(n);
        context.applyBumpMap(ConstantSampler(sample), weight);
        expectNear(context._normal, t * local.x + b * local.y + n * local.z, 2e-5, "case " + std::to_string(i));
        EXPECT_NEAR(context._normal.length(), 1.0f, 1e-6f);
        ++checked;
    }
    EXPECT_GT(checked, 2000);
}

}  // namespace
}  // namespace Zr
