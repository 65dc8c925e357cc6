// The culling and ordering pass: which instances survive against a brute-force test of the
// camera box's corners in clip space, the planes left in _clipMask, the camera box against corner
// arithmetic in double, and the order against a stable reference sort, for the camera and for
// the casters of a light.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

#include "exBase.h"
#include "geFrustum.h"
#include "rsCullAndSort.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;

// A projection looking down negative z, possibly off centre, perspective or parallel.
GeProjectiveMatrix3<double> frustumProjection(bool parallel, double l, double r, double b, double t, double n,
                                              double f) {
    if (parallel)
        return {2 / (r - l), 0, 0, -(r + l) / (r - l), 0, 2 / (t - b), 0, -(t + b) / (t - b),
                0, 0, -2 / (f - n), -(f + n) / (f - n), 0, 0, 0, 1};
    return {2 * n / (r - l), 0, (r + l) / (r - l), 0, 0, 2 * n / (t - b), (t + b) / (t - b), 0,
            0, 0, -(f + n) / (f - n), -2 * f * n / (f - n), 0, 0, -1, 0};
}

GeProjectiveMatrix3<double> randomProjection(std::mt19937& rng) {
    std::uniform_real_distribution<double> u(0.0, 1.0);
    const double n = 0.1 + 2.0 * u(rng), f = n + 1.0 + 40.0 * u(rng);
    const double halfWidth = (u(rng) < 0.5 ? n : 4.0) * (0.2 + 1.5 * u(rng)), halfHeight = halfWidth * (0.5 + u(rng));
    const double shiftX = halfWidth * (u(rng) - 0.5), shiftY = halfHeight * (u(rng) - 0.5);
    return frustumProjection(u(rng) < 0.25, shiftX - halfWidth, shiftX + halfWidth, shiftY - halfHeight,
                             shiftY + halfHeight, n, f);
}

GeAffineMatrix3<float> randomPlacement(std::mt19937& rng, float spread) {
    std::uniform_real_distribution<float> u(-1.0f, 1.0f);
    GeAffineMatrix3<float> m =
        GeAffineMatrix3<float>::makeRotation({u(rng), u(rng), u(rng) + 1.5f}, 3.14159265f * u(rng)) *
        GeAffineMatrix3<float>::makeScale(1.0f + 0.5f * u(rng), u(rng) < 0 ? -1.0f : 1.0f, 1.0f + 0.5f * u(rng));
    m.setTranslation({spread * u(rng), spread * u(rng), spread * u(rng)});
    return m;
}

// What the brute force expects of a camera box: dropped when all eight corners fail one of the
// six clip inequalities (in the frustum's plane order x min, y min, x max, y max, near, far), and
// otherwise a mask bit for each inequality that some corner fails. Unsure when a corner lies so
// near a plane that rounding could decide.
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
        const GeHomogeneousCoord3<double> p = projection.transform(cornerOf(box, c));
        const double v[6] = {p.w + p.x, p.w + p.y, p.w - p.x, p.w - p.y, p.w + p.z, p.w - p.z};
        for (int i = 0; i < 6; ++i) {
            lo[i] = std::min(lo[i], v[i]);
            hi[i] = std::max(hi[i], v[i]);
            scale = std::max(scale, std::abs(v[i]));
        }
    }
    Verdict verdict;
    for (int i = 0; i < 6; ++i) {
        const double tolerance = 1e-9 * (1.0 + scale);
        verdict.unsure |= std::abs(lo[i]) < tolerance || std::abs(hi[i]) < tolerance;
        verdict.outside |= hi[i] < 0;
        if (lo[i] < 0) verdict.mask |= GeFrustum<double>::getPlaneBit(i);
    }
    return verdict;
}

// The reference order: the survivors in scene order, reversed so that a stable sort puts the later
// of two equal keys first, then stably sorted by render order (camera only) and nearer middle.
std::vector<RsGeomInstance*> referenceOrder(std::vector<RsGeomInstance*> survivors, bool byRenderOrder) {
    auto middle = [](const RsGeomInstance* i) { return (i->_cameraBox.zMin + i->_cameraBox.zMax) * 0.5f; };
    std::reverse(survivors.begin(), survivors.end());
    std::stable_sort(survivors.begin(), survivors.end(), [&](RsGeomInstance* a, RsGeomInstance* b) {
        if (byRenderOrder && a->_renderOrder != b->_renderOrder) return a->_renderOrder < b->_renderOrder;
        return middle(a) > middle(b);
    });
    return survivors;
}

std::vector<RsGeomInstance*> run(const RCShdPtr<RsScene>& scene, bool casters, const GeFrustum<double>& frustum,
                                 const GeAffineMatrix3<float>& worldToView, bool zBuffer = true) {
    RsGeomInstanceList result;
    if (casters) cullAndSortShadowCasters(scene, frustum, worldToView, result);
    else cullAndSortInstances(scene, zBuffer, frustum, worldToView, result);
    std::vector<RsGeomInstance*> pointers;
    for (const auto& p : result) pointers.push_back(p.get());
    return pointers;
}

TEST(RsCullAndSort, SelectionMatchesBruteForceOnRandomScenes) {
    std::mt19937 rng(2024);
    std::uniform_real_distribution<float> u(-1.0f, 1.0f);
    int kept = 0, dropped = 0, crossing = 0;
    for (int trial = 0; trial < 300; ++trial) {
        const GeProjectiveMatrix3<double> projection = randomProjection(rng);
        const GeAffineMatrix3<float> worldToView = randomPlacement(rng, 3.0f);
        const bool casters = trial % 3 == 2;
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        std::vector<GeAlignedBox3<float>> boxes;
        for (int i = 0; i < 20; ++i) {
            const GePoint3<float> c(2 * u(rng), 2 * u(rng), 2 * u(rng));
            const GePoint3<float> h(0.05f + std::abs(u(rng)), 0.05f + std::abs(u(rng)), 0.05f + std::abs(u(rng)));
            boxes.emplace_back(GePoint3<float>(c.x - h.x, c.y - h.y, c.z - h.z),
                               GePoint3<float>(c.x + h.x, c.y + h.y, c.z + h.z));
            const bool flag = u(rng) < 0.6f;
            instances.push_back(makeInstance(makeBoxMesh(boxes.back().getMin(), boxes.back().getMax()),
                                             randomPlacement(rng, 25.0f), makeAttributes(0, flag, !flag)));
        }
        const std::vector<RsGeomInstance*> got =
            run(makeScene(instances), casters, GeFrustum<double>(projection), worldToView);
        std::vector<RsGeomInstance*> survivors;
        bool anyUnsure = false;
        for (std::size_t i = 0; i < instances.size(); ++i) {
            RsGeomInstance& instance = *instances[i];
            if (!(casters ? instance._castsShadows : instance._visible)) continue;
            EXPECT_EQ(instance._toCamera, worldToView * instance._matrix);
            // The camera box holds the object corners through the placement and the view, tightly.
            double lo[3] = {1e300, 1e300, 1e300}, hi[3] = {-1e300, -1e300, -1e300};
            growBoxInDouble({worldToView, instance._matrix}, boxes[i], lo, hi);
            expectBoxNear(instance._cameraBox, lo, hi, 1e-3);
            const Verdict verdict = bruteForce(projection, instance._cameraBox);
            if (!verdict.outside) survivors.push_back(&instance);
            anyUnsure |= verdict.unsure;
            if (verdict.unsure) continue;
            EXPECT_EQ(std::count(got.begin(), got.end(), &instance), verdict.outside ? 0 : 1) << trial << " " << i;
            if (!verdict.outside) {
                EXPECT_EQ(instance._clipMask, verdict.mask) << trial << " " << i;
            }
            (verdict.outside ? dropped : kept)++;
            crossing += !verdict.outside && verdict.mask != 0;
        }
        if (!anyUnsure) {
            EXPECT_EQ(got, referenceOrder(survivors, !casters)) << "trial " << trial;
        }
    }
    // The random scenes exercise all three outcomes.
    EXPECT_GT(kept, 200);
    EXPECT_GT(dropped, 200);
    EXPECT_GT(crossing, 100);
    EXPECT_GT(kept + dropped, 3000);
}

// Orders and depths from small sets, so that equal keys abound; the frustum holds everything, and
// the order does not depend on the depth test.
TEST(RsCullAndSort, OrderMatchesAStableReferenceWithManyTies) {
    std::mt19937 rng(77);
    std::uniform_int_distribution<int> order(-1, 1), depth(0, 3), shape(0, 2), count(0, 70);
    const GeFrustum<double> frustum(frustumProjection(true, -100, 100, -100, 100, 1, 1000));
    const GeAffineMatrix3<float> view = GeAffineMatrix3<float>::makeTranslation({0, 0, -50});
    const RCShdPtr<const SdMesh> meshes[3] = {makeBoxMesh({-1, -1, -1}, {1, 1, 1}), makeBoxMesh({-2, 0, -4}, {0, 3, 4}),
                                              makeBoxMesh({0, 0, -1}, {1, 1, 1})};
    for (int trial = 0; trial < 300; ++trial) {
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        for (int i = count(rng); i > 0; --i)
            instances.push_back(makeInstance(
                meshes[shape(rng)], GeAffineMatrix3<float>::makeTranslation({10.0f * order(rng), 0, 2.0f * depth(rng)}),
                makeAttributes(order(rng), order(rng) != 1, order(rng) != -1)));
        const RCShdPtr<RsScene> scene = makeScene(instances);
        for (bool casters : {false, true}) {
            std::vector<RsGeomInstance*> admitted;
            for (const auto& instance : instances)
                if (casters ? instance->_castsShadows : instance->_visible) admitted.push_back(instance.get());
            const std::vector<RsGeomInstance*> got = run(scene, casters, frustum, view);
            EXPECT_EQ(got, referenceOrder(admitted, !casters)) << "trial " << trial;
            if (!casters) {
                EXPECT_EQ(run(scene, false, frustum, view, false), got);
            }
        }
    }
}

TEST(RsCullAndSort, MissingMeshIsANullPointerFailure) {
    const RCShdPtr<RsScene> scene = makeScene({makeInstance(makeBoxMesh({0, 0, -3}, {1, 1, -2}))});
    // The scene checked its instances when it was made; a mesh lost since then is found here.
    scene->_geomInstances[0]->_mesh = nullptr;
    const GeFrustum<double> frustum(frustumProjection(false, -1, 1, -1, 1, 1, 100));
    EXPECT_THROW(run(scene, false, frustum, {}), ExNullPtr);
    EXPECT_THROW(run(RCShdPtr<RsScene>(), false, frustum, {}), ExNullPtr);
}

}  // namespace
}  // namespace Zr
