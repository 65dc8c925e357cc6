// The renderer's scene records: what an instance keeps of its description, its world box against
// corner-by-corner arithmetic in double, and the scene's bounds and epsilon, including the cases
// of no instance, a flat instance, a mirroring matrix and a null instance.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "exBase.h"
#include "rsSceneTestUtil.h"

namespace Zr {
namespace {

using namespace SceneTest;

constexpr float smallestNormal = 1.1754944e-38f;

GeAffineMatrix3<float> randomAffine(std::mt19937& rng, float scaleRange) {
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f);
    std::uniform_real_distribution<float> angle(0.0f, 6.2831853f);
    const GeAffineMatrix3<float> rotation =
        GeAffineMatrix3<float>::makeRotation({unit(rng), unit(rng), unit(rng) + 1.5f}, angle(rng));
    // Scales of either sign, so that mirroring matrices appear too.
    auto factor = [&] {
        const float f = 0.25f + (scaleRange - 0.25f) * (unit(rng) * 0.5f + 0.5f);
        return unit(rng) < 0.0f ? -f : f;
    };
    GeAffineMatrix3<float> m = rotation * GeAffineMatrix3<float>::makeScale(factor(), factor(), factor());
    m.setTranslation({10.0f * unit(rng), 10.0f * unit(rng), 10.0f * unit(rng)});
    return m;
}

GeAlignedBox3<float> randomBox(std::mt19937& rng) {
    std::uniform_real_distribution<float> centre(-5.0f, 5.0f);
    std::uniform_real_distribution<float> half(0.01f, 3.0f);
    const float cx = centre(rng), cy = centre(rng), cz = centre(rng);
    const float hx = half(rng), hy = half(rng), hz = half(rng);
    return GeAlignedBox3<float>({cx - hx, cy - hy, cz - hz}, {cx + hx, cy + hy, cz + hz});
}

// The world box of an object box through m, from the eight corners in double.
struct DoubleBox {
    double lo[3] = {1e300, 1e300, 1e300};
    double hi[3] = {-1e300, -1e300, -1e300};
};

DoubleBox worldBoxInDouble(const GeAffineMatrix3<float>& m, const GeAlignedBox3<float>& objectBox) {
    DoubleBox box;
    for (int c = 0; c < 8; ++c) {
        const GePoint3<double> p = applyInDouble(m, cornerOf(objectBox, c));
        const double v[3] = {p.x, p.y, p.z};
        for (int a = 0; a < 3; ++a) {
            box.lo[a] = std::min(box.lo[a], v[a]);
            box.hi[a] = std::max(box.hi[a], v[a]);
        }
    }
    return box;
}

void expectBoxNear(const GeAlignedBox3<float>& actual, const DoubleBox& expected, double tolerance) {
    EXPECT_NEAR(actual.xMin, expected.lo[0], tolerance);
    EXPECT_NEAR(actual.xMax, expected.hi[0], tolerance);
    EXPECT_NEAR(actual.yMin, expected.lo[1], tolerance);
    EXPECT_NEAR(actual.yMax, expected.hi[1], tolerance);
    EXPECT_NEAR(actual.zMin, expected.lo[2], tolerance);
    EXPECT_NEAR(actual.zMax, expected.hi[2], tolerance);
}

TEST(RsGeomInstance, KeepsItsDescriptionAndStartsWithBlankPerCallMembers) {
    const auto mesh = makeBoxMesh({0, 0, 0}, {1, 1, 1});
    const auto matrix = GeAffineMatrix3<float>::makeTranslation({1, 2, 3});
    // Every combination of the five flags, with orders of both signs.
    for (int bits = 0; bits < 32; ++bits) {
        SdInstanceAttributes attributes;
        attributes._renderOrder = (bits - 16) * 1000003;
        attributes._visible = bits & 1;
        attributes._castsShadows = bits & 2;
        attributes._receivesShadows = bits & 4;
        attributes._drawFrontFaces = bits & 8;
        attributes._drawBackFaces = bits & 16;
        RsGeomInstance instance(matrix, mesh, {}, {}, attributes, {});
        EXPECT_EQ(instance.getAttributes(), attributes) << bits;
        EXPECT_EQ(instance._renderOrder, attributes._renderOrder);
        EXPECT_EQ(instance._visible, attributes._visible);
        EXPECT_EQ(instance._castsShadows, attributes._castsShadows);
        EXPECT_EQ(instance._receivesShadows, attributes._receivesShadows);
        EXPECT_EQ(instance._drawFrontFaces, attributes._drawFrontFaces);
        EXPECT_EQ(instance._drawBackFaces, attributes._drawBackFaces);
        EXPECT_EQ(instance._matrix, matrix);
        EXPECT_EQ(instance._mesh.get(), mesh.get());
        EXPECT_EQ(instance._toCamera, GeAffineMatrix3<float>::makeIdentity());
        EXPECT_TRUE(instance._cameraBox.isEmpty());
        EXPECT_EQ(instance._cameraBox, GeAlignedBox3<float>());
        EXPECT_EQ(instance._clipMask, 0u);
    }
}

TEST(RsGeomInstance, LightTableBecomesASetWithoutRepeats) {
    const auto mesh = makeBoxMesh({0, 0, 0}, {1, 1, 1});
    const std::vector<std::vector<unsigned int>> tables = {
        {}, {7}, {3, 1, 3, 2, 1}, {5, 5, 5, 5}, {0, 4294967295u, 0}, {9, 8, 7, 6, 5, 4, 3, 2, 1, 0}};
    for (const auto& table : tables) {
        RsGeomInstance instance(GeAffineMatrix3<float>(), mesh, {}, {}, SdInstanceAttributes(), table);
        std::vector<unsigned int> expected = table;
        std::sort(expected.begin(), expected.end());
        expected.erase(std::unique(expected.begin(), expected.end()), expected.end());
        EXPECT_EQ(std::vector<unsigned int>(instance._lights.begin(), instance._lights.end()), expected);
    }
}

TEST(RsGeomInstance, ShaderListsAreSharedElementByElement) {
    const auto mesh = makeBoxMesh({0, 0, 0}, {1, 1, 1});
    for (std::size_t n : {0u, 1u, 4u}) {
        RsGeomInstance::MaterialList materials, shadowMaterials;
        for (std::size_t i = 0; i < n; ++i) {
            materials.push_back(makeShared<TestMaterial>());
            shadowMaterials.push_back(makeShared<TestMaterial>());
        }
        {
            RsGeomInstance instance(GeAffineMatrix3<float>(), mesh, materials, shadowMaterials,
                                    SdInstanceAttributes(), {});
            // The caller's lists are untouched, and each shader has gained the instance's reference.
            ASSERT_EQ(materials.size(), n);
            ASSERT_EQ(instance._materials.size(), n);
            ASSERT_EQ(instance._shadowMaterials.size(), n);
            for (std::size_t i = 0; i < n; ++i) {
                EXPECT_EQ(instance._materials[i].get(), materials[i].get());
                EXPECT_EQ(instance._shadowMaterials[i].get(), shadowMaterials[i].get());
                EXPECT_EQ(materials[i]->getReferenceCount(), 2);
                EXPECT_EQ(shadowMaterials[i]->getReferenceCount(), 2);
            }
        }
        for (std::size_t i = 0; i < n; ++i) {
            EXPECT_EQ(materials[i]->getReferenceCount(), 1);
            EXPECT_EQ(shadowMaterials[i]->getReferenceCount(), 1);
        }
    }
}

TEST(RsGeomInstance, WorldBoxHoldsTheTransformedCornersTightly) {
    std::mt19937 rng(1234);
    for (int trial = 0; trial < 500; ++trial) {
        const GeAlignedBox3<float> objectBox = randomBox(rng);
        const GeAffineMatrix3<float> matrix = randomAffine(rng, 3.0f);
        const auto mesh = makeBoxMesh(objectBox.getMin(), objectBox.getMax());
        RsGeomInstance instance(matrix, mesh, {}, {}, SdInstanceAttributes(), {});
        const GeAlignedBox3<float> box = instance.getBoundingBox();
        ASSERT_FALSE(box.isEmpty());
        EXPECT_LE(box.xMin, box.xMax);
        expectBoxNear(box, worldBoxInDouble(matrix, objectBox), 1e-4);
    }
}

TEST(RsGeomInstance, MirroringMatrixGivesAWellOrderedBox) {
    const auto mesh = makeBoxMesh({1, 2, 3}, {2, 4, 7});
    // x mirrored and doubled, y kept, z mirrored, then moved.
    GeAffineMatrix3<float> matrix = GeAffineMatrix3<float>::makeScale(-2.0f, 1.0f, -1.0f);
    matrix.setTranslation({10.0f, 0.0f, 1.0f});
    RsGeomInstance instance(matrix, mesh, {}, {}, SdInstanceAttributes(), {});
    EXPECT_EQ(instance.getBoundingBox(), GeAlignedBox3<float>({6, 2, -6}, {8, 4, -2}));
}

TEST(RsGeomInstance, MissingMeshIsANullPointerFailure) {
    RsGeomInstance instance(GeAffineMatrix3<float>(), RCShdPtr<const SdMesh>(), {}, {}, SdInstanceAttributes(), {});
    EXPECT_THROW(instance.getBoundingBox(), ExNullPtr);
}

TEST(RsScene, TakesTheListsWithoutTouchingReferenceCounts) {
    const auto mesh = makeBoxMesh({0, 0, 0}, {1, 1, 1});
    std::vector<RCShdPtr<RsGeomInstance>> instances;
    for (int i = 0; i < 5; ++i)
        instances.push_back(makeInstance(GeAffineMatrix3<float>::makeTranslation({float(i), 0, 0}), mesh));
    RsScene::LightList lights = {makeShared<TestLight>(), makeShared<TestLight>()};
    RsScene::CameraList cameras = {makeShared<SdInstance>()};
    const auto instancesBefore = instances;
    const auto lightsBefore = lights;
    const auto camerasBefore = cameras;
    // Each object is now held twice: by the list handed over and by the copy kept here.
    {
        RCShdPtr<RsScene> scene = makeShared<RsScene>(instances, lights, cameras);
        EXPECT_TRUE(instances.empty());
        EXPECT_TRUE(lights.empty());
        EXPECT_TRUE(cameras.empty());
        ASSERT_EQ(scene->_geomInstances.size(), 5u);
        for (std::size_t i = 0; i < instancesBefore.size(); ++i) {
            EXPECT_EQ(scene->_geomInstances[i].get(), instancesBefore[i].get());
            EXPECT_EQ(instancesBefore[i]->getReferenceCount(), 2);
        }
        ASSERT_EQ(scene->_lights.size(), 2u);
        for (std::size_t i = 0; i < lightsBefore.size(); ++i) {
            EXPECT_EQ(scene->_lights[i].get(), lightsBefore[i].get());
            EXPECT_EQ(lightsBefore[i]->getReferenceCount(), 2);
        }
        ASSERT_EQ(scene->_cameras.size(), 1u);
        EXPECT_EQ(scene->_cameras[0].get(), camerasBefore[0].get());
        EXPECT_EQ(camerasBefore[0]->getReferenceCount(), 2);
    }
    // The scene's death releases its share of everything.
    for (const auto& instance : instancesBefore) EXPECT_EQ(instance->getReferenceCount(), 1);
    for (const auto& light : lightsBefore) EXPECT_EQ(light->getReferenceCount(), 1);
    EXPECT_EQ(camerasBefore[0]->getReferenceCount(), 1);
}

TEST(RsScene, WithoutInstancesTheBoundsAreEmpty) {
    const RCShdPtr<RsScene> scene = makeScene({});
    EXPECT_TRUE(scene->_bounds.isEmpty());
    EXPECT_EQ(scene->_bounds, GeAlignedBox3<float>());
    EXPECT_EQ(scene->_boundsEpsilon, smallestNormal);
    EXPECT_EQ(scene->_boundsEpsilon, std::numeric_limits<float>::min());
}

TEST(RsScene, OneInstanceGivesItsBoxAndAMillionthOfItsDiagonal) {
    const struct {
        GePoint3<float> min, max;
    } cases[] = {{{0, 0, 0}, {3, 4, 12}}, {{-1, -1, -1}, {1, 1, 1}}, {{100, 200, -300}, {100.5f, 201, -299}}};
    for (const auto& c : cases) {
        const RCShdPtr<RsScene> scene = makeScene({makeInstance(GeAffineMatrix3<float>(), makeBoxMesh(c.min, c.max))});
        EXPECT_EQ(scene->_bounds, GeAlignedBox3<float>(c.min, c.max));
        const double dx = c.max.x - c.min.x, dy = c.max.y - c.min.y, dz = c.max.z - c.min.z;
        const double expected = std::sqrt(dx * dx + dy * dy + dz * dz) * 1e-6;
        EXPECT_NEAR(scene->_boundsEpsilon, expected, expected * 1e-6);
    }
    // A 3-4-12 box has a diagonal of exactly 13.
    const RCShdPtr<RsScene> scene = makeScene({makeInstance(GeAffineMatrix3<float>(), makeBoxMesh({0, 0, 0}, {3, 4, 12}))});
    EXPECT_FLOAT_EQ(scene->_boundsEpsilon, 13e-6f);
}

TEST(RsScene, AFlatAxisOfAnInstanceLeavesThatAxisOfTheSceneAlone) {
    const auto cube = makeInstance(GeAffineMatrix3<float>(), makeBoxMesh({0, 0, 0}, {1, 1, 1}));
    // Flat in z at 10: it must widen x and y but must not pull z out to 10.
    const auto flatZ = makeInstance(GeAffineMatrix3<float>(), makeBoxMesh({-5, 2, 10}, {-4, 3, 10}));
    for (bool flatFirst : {false, true}) {
        const RCShdPtr<RsScene> scene = flatFirst ? makeScene({flatZ, cube}) : makeScene({cube, flatZ});
        EXPECT_EQ(scene->_bounds, GeAlignedBox3<float>({-5, 0, 0}, {1, 3, 1})) << flatFirst;
    }
    // Alone, the flat instance leaves z empty; the diagonal is that of x and y.
    const RCShdPtr<RsScene> alone = makeScene({flatZ});
    EXPECT_EQ(alone->_bounds.xMin, -5.0f);
    EXPECT_EQ(alone->_bounds.xMax, -4.0f);
    EXPECT_EQ(alone->_bounds.yMin, 2.0f);
    EXPECT_EQ(alone->_bounds.yMax, 3.0f);
    EXPECT_FALSE(alone->_bounds.zMin < alone->_bounds.zMax);
    EXPECT_FLOAT_EQ(alone->_boundsEpsilon, std::sqrt(2.0f) * 1e-6f);
    // Flat on all three axes: a point, which adds nothing anywhere.
    const RCShdPtr<RsScene> point = makeScene({makeInstance(GeAffineMatrix3<float>(), makeBoxMesh({1, 2, 3}, {1, 2, 3}))});
    EXPECT_FALSE(point->_bounds.xMin < point->_bounds.xMax);
    EXPECT_FALSE(point->_bounds.yMin < point->_bounds.yMax);
    EXPECT_FALSE(point->_bounds.zMin < point->_bounds.zMax);
    EXPECT_EQ(point->_boundsEpsilon, smallestNormal);
}

TEST(RsScene, BoundsAreTheUnionOfTheInstanceBoxes) {
    std::mt19937 rng(99);
    std::uniform_int_distribution<int> count(1, 12);
    for (int trial = 0; trial < 200; ++trial) {
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        DoubleBox expected;
        const int n = count(rng);
        for (int i = 0; i < n; ++i) {
            const GeAlignedBox3<float> objectBox = randomBox(rng);
            const GeAffineMatrix3<float> matrix = randomAffine(rng, 2.0f);
            instances.push_back(makeInstance(matrix, makeBoxMesh(objectBox.getMin(), objectBox.getMax())));
            const DoubleBox box = worldBoxInDouble(matrix, objectBox);
            for (int a = 0; a < 3; ++a) {
                expected.lo[a] = std::min(expected.lo[a], box.lo[a]);
                expected.hi[a] = std::max(expected.hi[a], box.hi[a]);
            }
        }
        const RCShdPtr<RsScene> scene = makeScene(instances);
        expectBoxNear(scene->_bounds, expected, 1e-4);
        double squares = 0.0;
        for (int a = 0; a < 3; ++a) squares += (expected.hi[a] - expected.lo[a]) * (expected.hi[a] - expected.lo[a]);
        EXPECT_NEAR(scene->_boundsEpsilon, std::sqrt(squares) * 1e-6, 1e-10);
    }
}

TEST(RsScene, NullInstanceIsANullPointerFailure) {
    const auto good = makeInstance(GeAffineMatrix3<float>(), makeBoxMesh({0, 0, 0}, {1, 1, 1}));
    EXPECT_THROW(makeScene({good, RCShdPtr<RsGeomInstance>()}), ExNullPtr);
    EXPECT_THROW(makeScene({makeInstance(GeAffineMatrix3<float>(), RCShdPtr<const SdMesh>())}), ExNullPtr);
}

}  // namespace
}  // namespace Zr
