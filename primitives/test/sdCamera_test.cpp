// Camera projections: the viewing volume lands on normalised device space, a lens offset keeps the
// focal plane fixed on screen while everything off it moves; the frustum's planes of a projection.
#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <utility>

#include "exBase.h"
#include "geCameraBuilder.h"
#include "geFrustum.h"
#include "sdCamera.h"

namespace Zr {
namespace {

using Projection = SdCamera::Projection;

GePoint3<double> project(const GeProjectiveMatrix3<double>& m, double x, double y, double z) {
    return m.transformAndProject({x, y, z});
}

// Random cameras of both kinds: the corners of the near and far windows land on the corners of
// device space. Seen through a lens at (lx, ly), with the view moved by the offset as a renderer
// does, a point of the focal plane keeps its pixel and any other moves by the parallax of the lens:
// the offset times (depth / focal - 1), scaled to device space (and divided by depth in perspective).
TEST(SdCamera, VolumeLandsOnDeviceSpaceAndALensMovesAllButTheFocalPlane) {
    std::mt19937 rng(7);
    std::uniform_real_distribution<float> fov(0.2f, 2.5f), aspect(0.4f, 2.5f), focal(0.5f, 80.0f), height(0.5f, 30.0f),
        unit(-1.0f, 1.0f), lens(-1.5f, 1.5f);
    std::uniform_real_distribution<double> nearFactor(0.3, 0.8), farFactor(1.3, 3.0);
    for (int trial = 0; trial < 400; ++trial) {
        SdCamera camera;
        camera._projection = trial % 2 ? Projection::orthographic : Projection::perspective;
        camera._fieldOfView = fov(rng), camera._aspect = aspect(rng);
        camera._focalDistance = focal(rng), camera._orthographicHeight = height(rng);
        camera._near = 0.05f, camera._far = 500.0f;
        const bool ortho = camera._projection == Projection::orthographic;
        // Half the height of the view at distance d.
        const auto halfHeight = [&](double d) {
            return ortho ? 0.5 * camera._orthographicHeight : d * std::tan(0.5 * camera._fieldOfView);
        };
        GeProjectiveMatrix3<double> m, zeroOffset, shifted;
        camera.computeProjection(m);
        EXPECT_EQ(m.isOrthographic(), ortho);
        for (int c = 0; c < 8; ++c) {
            const double d = (c & 4) ? camera._far : camera._near, hy = halfHeight(d), hx = hy * camera._aspect;
            const auto ndc = project(m, (c & 1) ? hx : -hx, (c & 2) ? hy : -hy, -d);
            EXPECT_NEAR(ndc.x, (c & 1) ? 1.0 : -1.0, 1e-9);
            EXPECT_NEAR(ndc.y, (c & 2) ? 1.0 : -1.0, 1e-9);
            EXPECT_NEAR(ndc.z, (c & 4) ? 1.0 : -1.0, 1e-6);
        }
        const std::pair<float, float> offset(lens(rng), lens(rng));
        camera.computeProjection(zeroOffset, {0.0f, 0.0f});
        camera.computeProjection(shifted, offset);
        EXPECT_EQ(m, zeroOffset);
        EXPECT_EQ(shifted.isOrthographic(), ortho);
        const double f = camera._focalDistance, y = unit(rng) * halfHeight(f);
        const double x = unit(rng) * halfHeight(f) * camera._aspect;
        for (double depth : {f, f * (trial % 4 < 2 ? nearFactor(rng) : farFactor(rng))}) {
            const auto centred = project(m, x, y, -depth);
            const auto moved = project(shifted, x - offset.first, y - offset.second, -depth);
            const double parallax = (depth / f - 1.0) / (ortho ? 1.0 : depth);
            const double expectX = m(0, 0) * offset.first * parallax, expectY = m(1, 1) * offset.second * parallax;
            const double tolerance = depth == f ? 2e-4 : 5e-4;
            EXPECT_NEAR(moved.x - centred.x, expectX, tolerance + 1e-4 * std::fabs(expectX));
            EXPECT_NEAR(moved.y - centred.y, expectY, tolerance + 1e-4 * std::fabs(expectY));
            EXPECT_NEAR(moved.z, centred.z, 2e-4);
        }
    }
}

TEST(SdCamera, InvalidSettingsAreRejected) {
    const struct {
        void (*spoil)(SdCamera&);
        Projection kind;
    } cases[] = {
        {[](SdCamera& c) { c._fieldOfView = 0.0f; }, Projection::perspective},
        {[](SdCamera& c) { c._fieldOfView = 3.1415927f; }, Projection::perspective},
        {[](SdCamera& c) { c._aspect = 0.0f; }, Projection::perspective},
        {[](SdCamera& c) { c._near = 0.0f; }, Projection::perspective},
        {[](SdCamera& c) { c._far = 0.01f; }, Projection::orthographic},
        {[](SdCamera& c) { c._focalDistance = 0.0f; }, Projection::orthographic},
        {[](SdCamera& c) { c._orthographicHeight = 0.0f; }, Projection::orthographic},
    };
    for (const auto& c : cases) {
        SdCamera camera;
        camera._projection = c.kind;
        c.spoil(camera);
        GeProjectiveMatrix3<double> m;
        EXPECT_THROW(camera.computeProjection(m), ExAssertionFailed) << &c - cases;
    }
    SdCamera orthographic;  // may have its near plane at or behind the eye
    orthographic._projection = Projection::orthographic;
    orthographic._near = -5.0f;
    GeProjectiveMatrix3<double> m;
    EXPECT_NO_THROW(orthographic.computeProjection(m));
}

// With fewer planes tested, the far plane and then the near plane are left out.
TEST(GeFrustum, ClassifyTestsTheSidesThenNearThenFarWithUnitNormals) {
    using F = GeFrustum<double>;
    for (const auto& projection : {GeCameraBuilder<double>::makeFrustum(-1, 3, -2, 1, 1, 10),
                                   GeCameraBuilder<double>::makeOrthographic(-1, 3, -2, 1, 1, 10)}) {
        const F frustum(projection);
        EXPECT_EQ(frustum.isOrthographic(), projection.isOrthographic());
        for (int i = 0; i < F::PLANE_COUNT; ++i) EXPECT_NEAR(frustum.getPlane(i).normal.length(), 1.0, 1e-12);
        const struct {
            GeAlignedBox3<double> box;
            unsigned int planes, classification, mask;
        } cases[] = {
            {{{0, -0.4, -0.5}, {0.4, 0.2, -0.5}}, 4, F::INSIDE, 0},  // in front of near, within the sides
            {{{0, -0.4, -0.5}, {0.4, 0.2, -0.5}}, 5, F::OUTSIDE, 0},
            {{{0, 0, -20}, {0.4, 0.4, -5}}, 5, F::INSIDE, 0},
            {{{0, 0, -20}, {0.4, 0.4, -5}}, 6, F::INTERSECTING, F::FAR_BIT},
            {{{0, 0, -30}, {0.4, 0.4, -20}}, 9, F::OUTSIDE, 0},  // more than six planes test six
            {{{0, 0, -5}, {0.4, 0.4, -1.01}}, 6, F::INSIDE, 0},
            {{{0, 0, -5}, {0.4, 0.4, -0.5}}, 6, F::INTERSECTING, F::NEAR_BIT},
            {{{-50, -50, -5}, {50, 50, -2}}, 4, F::INTERSECTING, F::SIDE_BITS},
        };
        for (const auto& c : cases) {
            unsigned int mask = 0xdeadbeef;  // stale contents are replaced
            EXPECT_EQ(frustum.classify(c.box, mask, c.planes), c.classification) << &c - cases;
            EXPECT_EQ(mask, c.mask) << &c - cases;
        }
    }
}

}  // namespace
}  // namespace Zr
