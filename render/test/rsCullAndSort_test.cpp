// The culling and ordering pass: which instances survive against a brute-force test of the
// camera box's corners in clip space, the planes left in _clipMask, the camera box against
// corner arithmetic in double, the order against a stable reference sort, and the caster variant.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

#include "exBase.h"
#include "geFrustum.h"
#include "geProjectiveMatrix3.h"
#include "rsCullAndSort.h"
#include "rsSceneTestUtil.h"

namespace Zr {
namespace {

using namespace SceneTest;

// A perspective projection looking down negative z, possibly off centre: the clip coordinates
// satisfy -w <= x, y, z <= w inside the volume from near to far.
GeProjectiveMatrix3<double> perspective(double left, double right, double bottom, double top, double n, double f) {
    return {2 * n / (right - left), 0, (right + left) / (right - left), 0,
            0, 2 * n / (top - bottom), (top + bottom) / (top - bottom), 0,
            0, 0, -(f + n) / (f - n), -2 * f * n / (f - n),
            0, 0, -1, 0};
}

GeProjectiveMatrix3<double> orthographic(double left, double right, double bottom, double top, double n, double f) {
    return {2 / (right - left), 0, 0, -(right + left) / (right - left),
            0, 2 / (top - bottom), 0, -(top + bottom) / (top - bottom),
            0, 0, -2 / (f - n), -(f + n) / (f - n),
            0, 0, 0, 1};
}

GeProjectiveMatrix3<double> randomProjection(std::mt19937& rng) {
    std::uniform_real_distribution<double> u(0.0, 1.0);
    const double n = 0.1 + 2.0 * u(rng);
    const double f = n + 1.0 + 40.0 * u(rng);
    const double halfWidth = (u(rng) < 0.5 ? n : 4.0) * (0.2 + 1.5 * u(rng));
    const double halfHeight = halfWidth * (0.5 + u(rng));
    const double shiftX = halfWidth * (u(rng) - 0.5), shiftY = halfHeight * (u(rng) - 0.5);
    if (u(rng) < 0.25)
        return orthographic(shiftX - halfWidth, shiftX + halfWidth, shiftY - halfHeight, shiftY + halfHeight, n, f);
    return perspective(shiftX - halfWidth, shiftX + halfWidth, shiftY - halfHeight, shiftY + halfHeight, n, f);
}

GeAffineMatrix3<float> randomPlacement(std::mt19937& rng, float spread) {
    std::uniform_real_distribution<float> u(-1.0f, 1.0f);
    GeAffineMatrix3<float> m =
        GeAffineMatrix3<float>::makeRotation({u(rng), u(rng), u(rng) + 1.5f}, 3.14159265f * u(rng)) *
        GeAffineMatrix3<float>::makeScale(1.0f + 0.5f * u(rng), u(rng) < 0 ? -1.0f : 1.0f, 1.0f + 0.5f * u(rng));
    m.setTranslation({spread * u(rng), spread * u(rng), spread * u(rng)});
    return m;
}

// The six clip inequalities of a camera-space point, in the plane order of the frustum (x min,
// y min, x max, y max, near, far); each is satisfied when its value is at least 0.
void clipValues(const GeProjectiveMatrix3<double>& projection, const GePoint3<double>& p, double values[6]) {
    const GeHomogeneousCoord3<double> c = projection.transform(p);
    values[0] = c.w + c.x;
    values[1] = c.w + c.y;
    values[2] = c.w - c.x;
    values[3] = c.w - c.y;
    values[4] = c.w + c.z;
    values[5] = c.w - c.z;
}

// What the brute force expects of one camera box: dropped when all eight corners fail one
// inequality, and otherwise a mask bit for each inequality that some corner fails. Unsure when a
// corner lies so near a plane that rounding could decide.
struct Verdict {
    bool outside = false;
    unsigned int mask = 0;
    bool unsure = false;
};

Verdict bruteForce(const GeProjectiveMatrix3<double>& projection, const GeAlignedBox3<float>& box) {
    double lo[6], hi[6], scale = 0.0;
    std::fill(lo, lo + 6, 1e300);
    std::fill(hi, hi + 6, -1e300);
    for (int c = 0; c < 8; ++c) {
        double v[6];
        clipValues(projection, cornerOf(box, c), v);
        for (int i = 0; i < 6; ++i) {
            lo[i] = std::min(lo[i], v[i]);
            hi[i] = std::max(hi[i], v[i]);
            scale = std::max(scale, std::abs(v[i]));
        }
    }
    Verdict verdict;
    const double tolerance = 1e-9 * (1.0 + scale);
    for (int i = 0; i < 6; ++i) {
        if (std::abs(lo[i]) < tolerance || std::abs(hi[i]) < tolerance) verdict.unsure = true;
        if (hi[i] < 0) verdict.outside = true;
        if (lo[i] < 0) verdict.mask |= GeFrustum<double>::getPlaneBit(i);
    }
    return verdict;
}

// The camera box must hold the eight object corners taken through the view and the placement
// in double, and touch the outermost of them on every side.
void expectTightCameraBox(const RsGeomInstance& instance, const GeAffineMatrix3<float>& worldToView,
                          const GeAlignedBox3<float>& objectBox) {
    double lo[3] = {1e300, 1e300, 1e300}, hi[3] = {-1e300, -1e300, -1e300};
    for (int c = 0; c < 8; ++c) {
        const GePoint3<double> p = applyInDouble(worldToView, applyInDouble(instance._matrix, cornerOf(objectBox, c)));
        const double v[3] = {p.x, p.y, p.z};
        for (int a = 0; a < 3; ++a) {
            lo[a] = std::min(lo[a], v[a]);
            hi[a] = std::max(hi[a], v[a]);
        }
    }
    const GeAlignedBox3<float>& box = instance._cameraBox;
    const double tolerance = 1e-3;
    EXPECT_NEAR(box.xMin, lo[0], tolerance);
    EXPECT_NEAR(box.xMax, hi[0], tolerance);
    EXPECT_NEAR(box.yMin, lo[1], tolerance);
    EXPECT_NEAR(box.yMax, hi[1], tolerance);
    EXPECT_NEAR(box.zMin, lo[2], tolerance);
    EXPECT_NEAR(box.zMax, hi[2], tolerance);
}

float zMiddle(const RsGeomInstance& instance) {
    return (instance._cameraBox.zMin + instance._cameraBox.zMax) * 0.5f;
}

// The reference order: the survivors in scene order, reversed so that a stable sort puts the
// later of two equal keys first, then stably sorted by the keys alone.
std::vector<RsGeomInstance*> referenceOrder(std::vector<RsGeomInstance*> survivors, bool byRenderOrder) {
    std::reverse(survivors.begin(), survivors.end());
    std::stable_sort(survivors.begin(), survivors.end(), [&](RsGeomInstance* a, RsGeomInstance* b) {
        if (byRenderOrder && a->_renderOrder != b->_renderOrder) return a->_renderOrder < b->_renderOrder;
        return zMiddle(*a) > zMiddle(*b);
    });
    return survivors;
}

std::vector<RsGeomInstance*> pointersOf(const RsGeomInstanceList& list) {
    std::vector<RsGeomInstance*> pointers;
    for (const auto& p : list) pointers.push_back(p.get());
    return pointers;
}

// A random scene, view and frustum, run through both passes and compared with brute force.
TEST(RsCullAndSort, SelectionMatchesBruteForceOnRandomScenes) {
    std::mt19937 rng(2024);
    std::uniform_real_distribution<float> u(-1.0f, 1.0f);
    int kept = 0, dropped = 0, crossing = 0, checked = 0;
    for (int trial = 0; trial < 300; ++trial) {
        const GeProjectiveMatrix3<double> projection = randomProjection(rng);
        const GeFrustum<double> frustum(projection);
        const GeAffineMatrix3<float> worldToView = randomPlacement(rng, 3.0f);
        const bool casterPass = trial % 3 == 2;

        std::vector<RCShdPtr<RsGeomInstance>> instances;
        std::vector<GeAlignedBox3<float>> objectBoxes;
        for (int i = 0; i < 20; ++i) {
            const GePoint3<float> centre(2.0f * u(rng), 2.0f * u(rng), 2.0f * u(rng));
            const GePoint3<float> half(0.05f + std::abs(u(rng)), 0.05f + std::abs(u(rng)), 0.05f + std::abs(u(rng)));
            objectBoxes.emplace_back(GePoint3<float>(centre.x - half.x, centre.y - half.y, centre.z - half.z),
                                     GePoint3<float>(centre.x + half.x, centre.y + half.y, centre.z + half.z));
            const bool flag = u(rng) < 0.6f;
            instances.push_back(makeInstance(randomPlacement(rng, 25.0f),
                                             makeBoxMesh(objectBoxes.back().getMin(), objectBoxes.back().getMax()),
                                             makeAttributes(0, flag, !flag)));
        }
        const RCShdPtr<RsScene> scene = makeScene(instances);

        RsGeomInstanceList result;
        if (casterPass)
            cullAndSortShadowCasters(scene, frustum, worldToView, result);
        else
            cullAndSortInstances(scene, true, frustum, worldToView, result);
        const std::vector<RsGeomInstance*> got = pointersOf(result);

        std::vector<RsGeomInstance*> survivors;
        bool anyUnsure = false;
        for (std::size_t i = 0; i < instances.size(); ++i) {
            RsGeomInstance& instance = *instances[i];
            if (!(casterPass ? instance._castsShadows : instance._visible)) continue;
            EXPECT_EQ(instance._toCamera, worldToView * instance._matrix);
            expectTightCameraBox(instance, worldToView, objectBoxes[i]);
            const Verdict verdict = bruteForce(projection, instance._cameraBox);
            const bool present = std::find(got.begin(), got.end(), &instance) != got.end();
            if (!verdict.outside) survivors.push_back(&instance);
            if (verdict.unsure) {
                anyUnsure = true;
                continue;
            }
            ++checked;
            EXPECT_EQ(present, !verdict.outside) << "trial " << trial << " instance " << i;
            if (!verdict.outside) {
                EXPECT_EQ(instance._clipMask, verdict.mask) << "trial " << trial << " instance " << i;
            }
            (verdict.outside ? dropped : kept)++;
            if (!verdict.outside && verdict.mask != 0) ++crossing;
        }
        if (!anyUnsure) {
            EXPECT_EQ(got, referenceOrder(survivors, !casterPass)) << "trial " << trial;
        }
    }
    // The random scenes must exercise all three outcomes.
    EXPECT_GT(kept, 200);
    EXPECT_GT(dropped, 200);
    EXPECT_GT(crossing, 100);
    EXPECT_GT(checked, 3000);
}

// Orders and depths from small sets, so that equal keys abound; the frustum holds everything.
TEST(RsCullAndSort, OrderMatchesAStableReferenceWithManyTies) {
    std::mt19937 rng(77);
    std::uniform_int_distribution<int> order(-1, 1);
    std::uniform_int_distribution<int> depth(0, 3);
    std::uniform_int_distribution<int> sizeOf(0, 2);
    std::uniform_int_distribution<int> count(0, 70);  // past 32 entries too
    const GeFrustum<double> frustum(orthographic(-100, 100, -100, 100, 1, 1000));
    const GeAffineMatrix3<float> worldToCamera = GeAffineMatrix3<float>::makeTranslation({0, 0, -50});
    const GeAlignedBox3<float> boxes[3] = {GeAlignedBox3<float>({-1, -1, -1}, {1, 1, 1}),
                                           GeAlignedBox3<float>({-2, 0, -4}, {0, 3, 4}),
                                           GeAlignedBox3<float>({0, 0, -1}, {1, 1, 1})};
    std::vector<RCShdPtr<const SdMesh>> meshes;
    for (const auto& box : boxes) meshes.push_back(makeBoxMesh(box.getMin(), box.getMax()));

    for (int trial = 0; trial < 300; ++trial) {
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        const int n = count(rng);
        for (int i = 0; i < n; ++i) {
            const float z = 2.0f * float(depth(rng));
            const float x = float(order(rng)) * 10.0f;
            instances.push_back(makeInstance(GeAffineMatrix3<float>::makeTranslation({x, 0, z}), meshes[sizeOf(rng)],
                                             makeAttributes(order(rng), order(rng) != 1, order(rng) != -1)));
        }
        const RCShdPtr<RsScene> scene = makeScene(instances);

        for (bool caster : {false, true}) {
            RsGeomInstanceList withDepth, withoutDepth;
            if (caster) {
                cullAndSortShadowCasters(scene, frustum, worldToCamera, withDepth);
            } else {
                cullAndSortInstances(scene, true, frustum, worldToCamera, withDepth);
                cullAndSortInstances(scene, false, frustum, worldToCamera, withoutDepth);
                EXPECT_EQ(pointersOf(withDepth), pointersOf(withoutDepth)) << "trial " << trial;
            }
            std::vector<RsGeomInstance*> admitted;
            for (const auto& instance : instances)
                if (caster ? instance->_castsShadows : instance->_visible) admitted.push_back(instance.get());
            EXPECT_EQ(pointersOf(withDepth), referenceOrder(admitted, !caster)) << "trial " << trial;
        }
    }
}

TEST(RsCullAndSort, DocumentedOrderCases) {
    const GeFrustum<double> frustum(perspective(-1, 1, -1, 1, 1, 100));
    const GeAffineMatrix3<float> identity;
    const auto mesh = makeBoxMesh({-0.5f, -0.5f, -0.5f}, {0.5f, 0.5f, 0.5f});
    auto at = [&](float z, int renderOrder) {
        return makeInstance(GeAffineMatrix3<float>::makeTranslation({0, 0, z}), mesh, makeAttributes(renderOrder));
    };
    struct Case {
        const char* what;
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        std::vector<int> expectedPositions;
    };
    const Case cases[] = {
        {"equal keys: the later one first", {at(-10, 0), at(-10, 0), at(-10, 0)}, {2, 1, 0}},
        {"nearer first within an order", {at(-20, 0), at(-5, 0), at(-10, 0)}, {1, 2, 0}},
        {"a nearer higher order still comes after", {at(-5, 1), at(-30, 0)}, {1, 0}},
        {"orders ascending, negative first", {at(-5, 3), at(-6, -2), at(-7, 0)}, {1, 2, 0}},
        {"one partly inside stays", {makeInstance(GeAffineMatrix3<float>::makeTranslation({0.8f * 10, 0, -10}),
                                                  makeBoxMesh({-0.5f, -0.5f, -0.5f}, {30, 0.5f, 0.5f}))},
         {0}},
        {"one behind the eye goes", {at(10, 0), at(-10, 0)}, {1}},
    };
    for (const Case& c : cases) {
        const RCShdPtr<RsScene> scene = makeScene(c.instances);
        for (bool zBuffer : {true, false}) {
            RsGeomInstanceList result;
            cullAndSortInstances(scene, zBuffer, frustum, identity, result);
            std::vector<RsGeomInstance*> expected;
            for (int p : c.expectedPositions) expected.push_back(c.instances[p].get());
            EXPECT_EQ(pointersOf(result), expected) << c.what << ", zBuffer " << zBuffer;
        }
    }
}

TEST(RsCullAndSort, InstancesNotAdmittedKeepTheirPerCallMembers) {
    const GeFrustum<double> frustum(perspective(-1, 1, -1, 1, 1, 100));
    const auto mesh = makeBoxMesh({-1, -1, -1}, {1, 1, 1});
    const auto place = GeAffineMatrix3<float>::makeTranslation({0, 0, -10});
    const auto view = GeAffineMatrix3<float>::makeTranslation({0.5f, 0, 0});
    const GeAffineMatrix3<float> oldToCamera = GeAffineMatrix3<float>::makeScale(3, 4, 5);
    const GeAlignedBox3<float> oldBox({7, 7, 7}, {8, 8, 8});
    const unsigned int oldMask = 0x2a;

    // Seen by the camera only, by the lights only, by neither, by both.
    for (int flags = 0; flags < 4; ++flags) {
        const bool visible = flags & 1, casts = flags & 2;
        const auto instance = makeInstance(place, mesh, makeAttributes(0, visible, casts));
        const RCShdPtr<RsScene> scene = makeScene({instance});
        for (bool caster : {false, true}) {
            instance->_toCamera = oldToCamera;
            instance->_cameraBox = oldBox;
            instance->_clipMask = oldMask;
            RsGeomInstanceList result;
            if (caster)
                cullAndSortShadowCasters(scene, frustum, view, result);
            else
                cullAndSortInstances(scene, true, frustum, view, result);
            const bool admitted = caster ? casts : visible;
            EXPECT_EQ(result.size(), admitted ? 1u : 0u) << flags << caster;
            if (admitted) {
                EXPECT_EQ(instance->_toCamera, view * place);
                EXPECT_EQ(instance->_cameraBox, GeAlignedBox3<float>({-0.5f, -1, -11}, {1.5f, 1, -9}));
                EXPECT_EQ(instance->_clipMask, 0u);
            } else {
                EXPECT_EQ(instance->_toCamera, oldToCamera);
                EXPECT_EQ(instance->_cameraBox, oldBox);
                EXPECT_EQ(instance->_clipMask, oldMask);
            }
        }
    }
}

TEST(RsCullAndSort, MissingMeshIsANullPointerFailure) {
    const auto good = makeInstance(GeAffineMatrix3<float>(), makeBoxMesh({0, 0, -3}, {1, 1, -2}));
    const RCShdPtr<RsScene> scene = makeScene({good});
    // The scene checked its instances when it was made; a mesh lost since then is found here.
    scene->_geomInstances[0]->_mesh = nullptr;
    const GeFrustum<double> frustum(perspective(-1, 1, -1, 1, 1, 100));
    RsGeomInstanceList result;
    EXPECT_THROW(cullAndSortInstances(scene, true, frustum, GeAffineMatrix3<float>(), result), ExNullPtr);
    EXPECT_THROW(cullAndSortInstances(RCShdPtr<RsScene>(), true, frustum, GeAffineMatrix3<float>(), result), ExNullPtr);
}

}  // namespace
}  // namespace Zr
