// The renderer's scene records: an instance's world box against
// corner arithmetic in double, and the scene's bounds and epsilon, including scenes without
// instances, flat instances, and null instances or meshes.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "exBase.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;

constexpr float kSmallestNormal = 1.1754944e-38f;

// A rotation, scales of either sign (mirroring too) and a translation.
GeAffineMatrix3<float> randomAffine(std::mt19937& rng, float scaleRange) {
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f);
    auto factor = [&] {
        const float f = 0.25f + (scaleRange - 0.25f) * (unit(rng) * 0.5f + 0.5f);
        return unit(rng) < 0.0f ? -f : f;
    };
    GeAffineMatrix3<float> m = GeAffineMatrix3<float>::makeRotation({unit(rng), unit(rng), unit(rng) + 1.5f},
                                                                    3.14159265f * (unit(rng) + 1.0f)) *
                               GeAffineMatrix3<float>::makeScale(factor(), factor(), factor());
    m.setTranslation({10.0f * unit(rng), 10.0f * unit(rng), 10.0f * unit(rng)});
    return m;
}

GeAlignedBox3<float> randomBox(std::mt19937& rng) {
    std::uniform_real_distribution<float> centre(-5.0f, 5.0f), half(0.01f, 3.0f);
    const float cx = centre(rng), cy = centre(rng), cz = centre(rng), hx = half(rng), hy = half(rng), hz = half(rng);
    return GeAlignedBox3<float>({cx - hx, cy - hy, cz - hz}, {cx + hx, cy + hy, cz + hz});
}


TEST(RsGeomInstance, WorldBoxHoldsTheTransformedCornersTightly) {
    std::mt19937 rng(1234);
    for (int trial = 0; trial < 500; ++trial) {
        const GeAlignedBox3<float> objectBox = randomBox(rng);
        const GeAffineMatrix3<float> matrix = randomAffine(rng, 3.0f);
        double lo[3] = {1e300, 1e300, 1e300}, hi[3] = {-1e300, -1e300, -1e300};
        growBoxInDouble({matrix}, objectBox, lo, hi);
        expectBoxNear(makeInstance(makeBoxMesh(objectBox.getMin(), objectBox.getMax()), matrix)->getBoundingBox(), lo,
                      hi, 1e-4);
    }
    EXPECT_THROW(makeInstance(RCShdPtr<const SdMesh>())->getBoundingBox(), ExNullPtr);
}

// The bounds unite the instance boxes; the epsilon is a millionth of their diagonal.
TEST(RsScene, BoundsAreTheUnionOfTheInstanceBoxes) {
    std::mt19937 rng(99);
    for (int trial = 0; trial < 200; ++trial) {
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        double lo[3] = {1e300, 1e300, 1e300}, hi[3] = {-1e300, -1e300, -1e300};
        for (int i = std::uniform_int_distribution<int>(1, 12)(rng); i > 0; --i) {
            const GeAlignedBox3<float> objectBox = randomBox(rng);
            const GeAffineMatrix3<float> matrix = randomAffine(rng, 2.0f);
            instances.push_back(makeInstance(makeBoxMesh(objectBox.getMin(), objectBox.getMax()), matrix));
            growBoxInDouble({matrix}, objectBox, lo, hi);
        }
        const std::vector<RCShdPtr<RsGeomInstance>> given = instances;
        RsScene::LightList lights;
        RsScene::CameraList cameras;
        const RCShdPtr<RsScene> scene = makeShared<RsScene>(instances, lights, cameras);
        EXPECT_TRUE(instances.empty()) << "the scene takes the list over";
        EXPECT_EQ(scene->_geomInstances, given);
        expectBoxNear(scene->_bounds, lo, hi, 1e-4);
        const double diagonal = std::hypot(hi[0] - lo[0], hi[1] - lo[1], hi[2] - lo[2]);
        EXPECT_NEAR(scene->_boundsEpsilon, diagonal * 1e-6, 1e-10);
    }
}

// An axis on which an instance is flat (a point, or no instance at all) adds nothing to the
// scene's bounds or diagonal; an epsilon never falls below the smallest normal float.
TEST(RsScene, FlatAndMissingExtentsAddNothing) {
    const auto cube = makeInstance(makeBoxMesh({0, 0, 0}, {1, 1, 1}));
    const auto flatZ = makeInstance(makeBoxMesh({-5, 2, 10}, {-4, 3, 10}));
    for (const auto& scene : {makeScene({flatZ, cube}), makeScene({cube, flatZ})})
        EXPECT_EQ(scene->_bounds, GeAlignedBox3<float>({-5, 0, 0}, {1, 3, 1}));
    const RCShdPtr<RsScene> alone = makeScene({flatZ});
    EXPECT_EQ(std::vector<float>({alone->_bounds.xMin, alone->_bounds.xMax, alone->_bounds.yMin, alone->_bounds.yMax}),
              std::vector<float>({-5, -4, 2, 3}));
    EXPECT_FALSE(alone->_bounds.zMin < alone->_bounds.zMax);
    EXPECT_FLOAT_EQ(alone->_boundsEpsilon, std::sqrt(2.0f) * 1e-6f);
    for (const auto& scene : {makeScene({}), makeScene({makeInstance(makeBoxMesh({1, 2, 3}, {1, 2, 3}))})}) {
        EXPECT_FALSE(scene->_bounds.xMin < scene->_bounds.xMax || scene->_bounds.yMin < scene->_bounds.yMax ||
                     scene->_bounds.zMin < scene->_bounds.zMax);
        EXPECT_EQ(scene->_boundsEpsilon, kSmallestNormal);
    }
    EXPECT_TRUE(makeScene({})->_bounds.isEmpty());
}

TEST(RsScene, NullInstanceOrMeshIsANullPointerFailure) {
    EXPECT_THROW(makeScene({makeInstance(makeBoxMesh({0, 0, 0}, {1, 1, 1})), RCShdPtr<RsGeomInstance>()}), ExNullPtr);
    EXPECT_THROW(makeScene({makeInstance(RCShdPtr<const SdMesh>())}), ExNullPtr);
}

}  // namespace
}  // namespace Zr
