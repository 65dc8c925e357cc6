#include <gtest/gtest.h>

#include <cmath>

#include "geCameraBuilder.h"
#include "geTestRandom.h"

namespace Zr {
namespace {

TEST(GeCameraBuilderTest, PerspectiveMapsNearAndFarToMinusOneAndOne) {
    GeTest::Random rnd(51);
    for (int trial = 0; trial < 300; ++trial) {
        const double fov = rnd.uniform(0.1, 3.0);
        const double nearD = rnd.uniform(0.01, 10);
        const double farD = nearD * rnd.uniform(1.5, 1000);
        const double aspect = rnd.uniform(0.3, 3);
        const auto p = GeCameraBuilder<double>::makePerspective(fov, nearD, farD, aspect);
        EXPECT_FALSE(p.isOrthographic());
        EXPECT_EQ(p._m[11], -1.0);  // w = -z: the distance in front of the camera
        const double halfHeight = std::tan(fov / 2);
        for (const double depth : {nearD, farD, std::sqrt(nearD * farD)}) {
            // The corners of the view's cross-section at that depth land on the NDC square.
            for (const double sx : {-1.0, 1.0}) {
                for (const double sy : {-1.0, 1.0}) {
                    const GePoint3<double> corner(sx * aspect * halfHeight * depth, sy * halfHeight * depth, -depth);
                    const auto ndc = p.transformAndProject(corner);
                    EXPECT_NEAR(ndc.x, sx, 1e-9);
                    EXPECT_NEAR(ndc.y, sy, 1e-9);
                    if (depth == nearD) {
                        EXPECT_NEAR(ndc.z, -1.0, 1e-9);
                    }
                    if (depth == farD) {
                        EXPECT_NEAR(ndc.z, 1.0, 1e-9);
                    }
                    if (depth != nearD && depth != farD) {
                        EXPECT_GT(ndc.z, -1.0);
                        EXPECT_LT(ndc.z, 1.0);
                    }
                }
            }
        }
    }
    // In float as the shadow maps use it: 95 degrees, aspect 1.
    const float nearF = 0.25F;
    const float farF = 2500.0F;
    const auto pf = GeCameraBuilder<float>::makePerspective(1.6580628F, nearF, farF, 1.0F);
    EXPECT_NEAR(pf.transformAndProject({0, 0, -nearF}).z, -1.0F, 1e-5F);
    EXPECT_NEAR(pf.transformAndProject({0, 0, -farF}).z, 1.0F, 1e-4F);
    EXPECT_NEAR(pf(0, 0), 1.0F / std::tan(1.6580628F / 2), 1e-6F);
}

TEST(GeCameraBuilderTest, OffCentreFrustumMapsItsWindowOntoTheNdcSquare) {
    GeTest::Random rnd(52);
    for (int trial = 0; trial < 200; ++trial) {
        const double l = rnd.uniform(-3, 1), r = l + rnd.uniform(0.1, 4);
        const double b = rnd.uniform(-3, 1), t = b + rnd.uniform(0.1, 4);
        const double n = rnd.uniform(0.1, 5), f = n + rnd.uniform(0.1, 100);
        const auto p = GeCameraBuilder<double>::makeFrustum(l, r, b, t, n, f);
        for (int c = 0; c < 4; ++c) {
            const double x = (c & 1) ? r : l;
            const double y = (c & 2) ? t : b;
            const auto atNear = p.transformAndProject({x, y, -n});
            EXPECT_NEAR(atNear.x, (c & 1) ? 1.0 : -1.0, 1e-9);
            EXPECT_NEAR(atNear.y, (c & 2) ? 1.0 : -1.0, 1e-9);
            EXPECT_NEAR(atNear.z, -1.0, 1e-9);
            // The ray through the window's corner meets the far plane at the same NDC corner.
            const auto atFar = p.transformAndProject({x * f / n, y * f / n, -f});
            EXPECT_NEAR(atFar.x, atNear.x, 1e-9);
            EXPECT_NEAR(atFar.y, atNear.y, 1e-9);
            EXPECT_NEAR(atFar.z, 1.0, 1e-9);
        }
    }
}

TEST(GeCameraBuilderTest, OrthographicMapsItsBoxOntoTheNdcCube) {
    GeTest::Random rnd(53);
    for (int trial = 0; trial < 200; ++trial) {
        const double l = rnd.uniform(-3, 1), r = l + rnd.uniform(0.1, 4);
        const double b = rnd.uniform(-3, 1), t = b + rnd.uniform(0.1, 4);
        const double n = rnd.uniform(-5, 5), f = n + rnd.uniform(0.1, 100);
        const auto p = GeCameraBuilder<double>::makeOrthographic(l, r, b, t, n, f);
        EXPECT_TRUE(p.isOrthographic());
        for (int c = 0; c < 8; ++c) {
            const GePoint3<double> corner((c & 1) ? r : l, (c & 2) ? t : b, (c & 4) ? -f : -n);
            const auto h = p.transform(corner);
            EXPECT_EQ(h.w, 1.0);
            EXPECT_NEAR(h.x, (c & 1) ? 1.0 : -1.0, 1e-9);
            EXPECT_NEAR(h.y, (c & 2) ? 1.0 : -1.0, 1e-9);
            EXPECT_NEAR(h.z, (c & 4) ? 1.0 : -1.0, 1e-9);
        }
    }
}

}  // namespace
}  // namespace Zr
