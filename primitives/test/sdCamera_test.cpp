// Camera projections: the frustum lands on normalised device space, and a lens offset keeps the
// focal plane fixed on screen while everything off it moves.
#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <utility>

#include "exBase.h"
#include "sdCamera.h"

namespace Zr {
namespace {

GePoint3<double> project(const GeProjectiveMatrix3<double>& m, const GePoint3<double>& p) {
    const GeHomogeneousCoord3<double> h = m.transform(p);
    return GePoint3<double>(h.x / h.w, h.y / h.w, h.z / h.w);
}

SdCamera makeCamera(SdCamera::Projection projection, std::mt19937& rng) {
    std::uniform_real_distribution<float> fov(0.2f, 2.5f), aspect(0.4f, 2.5f), focal(0.5f, 80.0f),
        height(0.5f, 30.0f);
    SdCamera camera;
    camera._projection = projection;
    camera._fieldOfView = fov(rng);
    camera._aspect = aspect(rng);
    camera._focalDistance = focal(rng);
    camera._orthographicHeight = height(rng);
    camera._near = 0.05f;
    camera._far = 500.0f;
    return camera;
}

// Half the width and height of the view at distance d along the view direction.
std::pair<double, double> halfExtent(const SdCamera& camera, double d) {
    const double halfHeight = camera._projection == SdCamera::Projection::orthographic
                                  ? 0.5 * camera._orthographicHeight
                                  : d * std::tan(0.5 * camera._fieldOfView);
    return {halfHeight * camera._aspect, halfHeight};
}

TEST(SdCamera, FrustumCornersLandOnTheCornersOfDeviceSpace) {
    std::mt19937 rng(7);
    for (SdCamera::Projection kind :
         {SdCamera::Projection::perspective, SdCamera::Projection::orthographic}) {
        for (int trial = 0; trial < 50; ++trial) {
            const SdCamera camera = makeCamera(kind, rng);
            GeProjectiveMatrix3<double> m;
            camera.computeProjection(m);
            EXPECT_EQ(m.isOrthographic(), kind == SdCamera::Projection::orthographic);
            for (double distance : {static_cast<double>(camera._near), static_cast<double>(camera._far)}) {
                const auto [hx, hy] = halfExtent(camera, distance);
                const double depth = distance == camera._near ? -1.0 : 1.0;
                for (int corner = 0; corner < 4; ++corner) {
                    const double sx = (corner & 1) ? 1.0 : -1.0;
                    const double sy = (corner & 2) ? 1.0 : -1.0;
                    const GePoint3<double> ndc = project(m, GePoint3<double>(sx * hx, sy * hy, -distance));
                    EXPECT_NEAR(ndc.x, sx, 1e-9);
                    EXPECT_NEAR(ndc.y, sy, 1e-9);
                    EXPECT_NEAR(ndc.z, depth, 1e-6);
                }
            }
        }
    }
}

// The renderer's use: the camera instance's matrix is inverted to world-to-camera, the offset is
// subtracted from its translation, and the projection for that offset is applied.
GePoint3<double> renderWithOffset(const SdCamera& camera, const GeAffineMatrix3<float>& worldToCamera,
                                  std::pair<float, float> offset, const GePoint3<float>& world) {
    GeAffineMatrix3<float> moved = worldToCamera;
    moved(0, 3) -= offset.first;
    moved(1, 3) -= offset.second;
    GeProjectiveMatrix3<double> projection;
    camera.computeProjection(projection, offset);
    return project(projection, GePoint3<double>(moved.transformPoint(world)));
}

GeAffineMatrix3<float> randomPlacement(std::mt19937& rng) {
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f), angle(-3.0f, 3.0f), spread(-20.0f, 20.0f);
    GeAffineMatrix3<float> m = GeAffineMatrix3<float>::makeRotation(
        GeVector3<float>(unit(rng), unit(rng), unit(rng) + 2.0f), angle(rng));
    m.setTranslation(GeVector3<float>(spread(rng), spread(rng), spread(rng)));
    return m;
}

TEST(SdCamera, LensOffsetKeepsTheFocalPlaneAndMovesTheRest) {
    std::mt19937 rng(1234);
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f), lens(-1.5f, 1.5f);
    std::uniform_real_distribution<double> nearFactor(0.3, 0.8), farFactor(1.3, 3.0);
    for (SdCamera::Projection kind :
         {SdCamera::Projection::perspective, SdCamera::Projection::orthographic}) {
        for (int trial = 0; trial < 200; ++trial) {
            const SdCamera camera = makeCamera(kind, rng);
            const GeAffineMatrix3<float> cameraToWorld = randomPlacement(rng);
            const GeAffineMatrix3<float> worldToCamera = cameraToWorld.computeInverse();
            const std::pair<float, float> offset(lens(rng), lens(rng));
            const double focal = camera._focalDistance;

            // A point of the focal plane within the view keeps its pixel.
            const auto [hx, hy] = halfExtent(camera, focal);
            const GePoint3<float> onPlane(static_cast<float>(unit(rng) * hx),
                                          static_cast<float>(unit(rng) * hy), static_cast<float>(-focal));
            const GePoint3<float> world = cameraToWorld.transformPoint(onPlane);
            const GePoint3<double> centred = renderWithOffset(camera, worldToCamera, {0.0f, 0.0f}, world);
            const GePoint3<double> shifted = renderWithOffset(camera, worldToCamera, offset, world);
            EXPECT_NEAR(shifted.x, centred.x, 2e-4);
            EXPECT_NEAR(shifted.y, centred.y, 2e-4);
            EXPECT_NEAR(shifted.z, centred.z, 2e-4);

            // A point nearer or farther moves, by the parallax of a lens: the view's offset
            // against the focal plane's, seen at the point's depth.
            const double depth = focal * (trial % 2 ? nearFactor(rng) : farFactor(rng));
            const GePoint3<float> offPlane(onPlane.x, onPlane.y, static_cast<float>(-depth));
            const GePoint3<float> offWorld = cameraToWorld.transformPoint(offPlane);
            const GePoint3<double> offCentred = renderWithOffset(camera, worldToCamera, {0.0f, 0.0f}, offWorld);
            const GePoint3<double> offShifted = renderWithOffset(camera, worldToCamera, offset, offWorld);
            GeProjectiveMatrix3<double> m, zeroOffset, shiftedMatrix;
            camera.computeProjection(m);
            camera.computeProjection(zeroOffset, {0.0f, 0.0f});
            camera.computeProjection(shiftedMatrix, offset);
            EXPECT_EQ(m, zeroOffset);
            EXPECT_EQ(shiftedMatrix.isOrthographic(), kind == SdCamera::Projection::orthographic);
            // Camera-space displacement of the point relative to the sheared view, in x and y.
            const double parallax = depth / focal - 1.0;
            double expectX = m(0, 0) * offset.first * parallax;
            double expectY = m(1, 1) * offset.second * parallax;
            if (kind == SdCamera::Projection::perspective) {
                expectX /= depth;
                expectY /= depth;
            }
            EXPECT_NEAR(offShifted.x - offCentred.x, expectX, 5e-4 + 1e-4 * std::fabs(expectX));
            EXPECT_NEAR(offShifted.y - offCentred.y, expectY, 5e-4 + 1e-4 * std::fabs(expectY));
            if (std::fabs(expectX) > 1e-2) {
                EXPECT_NE(offShifted.x, offCentred.x);
            }
            EXPECT_NEAR(offShifted.z, offCentred.z, 2e-4);
        }
    }
}

TEST(SdCamera, InvalidSettingsAreRejected) {
    struct Case {
        const char* what;
        void (*spoil)(SdCamera&);
        SdCamera::Projection kind;
    };
    const Case cases[] = {
        {"zero field of view", [](SdCamera& c) { c._fieldOfView = 0.0f; }, SdCamera::Projection::perspective},
        {"field of view of pi", [](SdCamera& c) { c._fieldOfView = 3.1415927f; }, SdCamera::Projection::perspective},
        {"zero aspect", [](SdCamera& c) { c._aspect = 0.0f; }, SdCamera::Projection::perspective},
        {"near not positive", [](SdCamera& c) { c._near = 0.0f; }, SdCamera::Projection::perspective},
        {"far before near", [](SdCamera& c) { c._far = 0.01f; }, SdCamera::Projection::orthographic},
        {"focal distance 0", [](SdCamera& c) { c._focalDistance = 0.0f; }, SdCamera::Projection::orthographic},
        {"no height", [](SdCamera& c) { c._orthographicHeight = -1.0f; }, SdCamera::Projection::orthographic},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        SdCamera camera;
        camera._projection = c.kind;
        c.spoil(camera);
        GeProjectiveMatrix3<double> m;
        EXPECT_THROW(camera.computeProjection(m), ExAssertionFailed);
    }
    // An orthographic camera may have its near plane at or behind the eye.
    SdCamera orthographic;
    orthographic._projection = SdCamera::Projection::orthographic;
    orthographic._near = -5.0f;
    GeProjectiveMatrix3<double> m;
    EXPECT_NO_THROW(orthographic.computeProjection(m));
}

}  // namespace
}  // namespace Zr
