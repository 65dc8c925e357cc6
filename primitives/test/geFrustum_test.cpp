#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "geAffineMatrix3.h"
#include "geAlignedBox3.h"
#include "geCameraBuilder.h"
#include "geFrustum.h"
#include "geProjectiveMatrix3.h"

namespace Zr {
namespace {

using Frustum = GeFrustum<double>;

// The six clip-space inequalities, each as (mask bit, value that must be >= 0 inside).
struct ClipTest {
    unsigned int bit;
    double (*value)(const GeHomogeneousCoord3<double>&);
};
const ClipTest kClipTests[6] = {
    {0x01, [](const GeHomogeneousCoord3<double>& c) { return c.w + c.x; }},  // x >= -w
    {0x02, [](const GeHomogeneousCoord3<double>& c) { return c.w - c.x; }},  // x <= w
    {0x04, [](const GeHomogeneousCoord3<double>& c) { return c.w + c.y; }},  // y >= -w
    {0x08, [](const GeHomogeneousCoord3<double>& c) { return c.w - c.y; }},  // y <= w
    {0x10, [](const GeHomogeneousCoord3<double>& c) { return c.w + c.z; }},  // near: z >= -w
    {0x20, [](const GeHomogeneousCoord3<double>& c) { return c.w - c.z; }},  // far: z <= w
};
// Which inequalities planeCount 4, 5 and 6 select: the sides, then near, then far.
unsigned int testedBits(unsigned int planeCount) {
    return planeCount >= 6 ? 0x3f : planeCount == 5 ? 0x1f : 0x0f;
}

struct Reference {
    unsigned int classification;
    unsigned int mask;
    bool ambiguous;  // a corner lies so close to a plane that rounding may decide
};

// Brute force: every corner of the box against every tested clip-space inequality.
Reference classifyByCorners(const GeProjectiveMatrix3<double>& projection, const GeAlignedBox3<double>& box,
                            unsigned int planeCount) {
    Reference ref{Frustum::INSIDE, 0, false};
    bool outside = false;
    for (const ClipTest& test : kClipTests) {
        if ((test.bit & testedBits(planeCount)) == 0) continue;
        int in = 0;
        for (int c = 0; c < 8; ++c) {
            const auto clip = projection.transform(box.getCorner(c));
            const double v = test.value(clip);
            const double scale = std::fabs(clip.x) + std::fabs(clip.y) + std::fabs(clip.z) + std::fabs(clip.w);
            if (std::fabs(v) <= 1e-9 * scale) ref.ambiguous = true;
            in += v >= 0 ? 1 : 0;
        }
        if (in == 0) outside = true;
        if (in > 0 && in < 8) ref.mask |= test.bit;
    }
    ref.classification = outside ? Frustum::OUTSIDE : ref.mask ? Frustum::INTERSECTING : Frustum::INSIDE;
    return ref;
}

class RandomScenes {
public:
    explicit RandomScenes(unsigned seed) : _engine(seed) {}
    double uniform(double lo, double hi) { return std::uniform_real_distribution<double>(lo, hi)(_engine); }

    // Perspective (symmetric or off centre) or orthographic, sometimes after a view transform,
    // since the planes are those of whatever space the matrix takes as input.
    GeProjectiveMatrix3<double> projection(int kind) {
        GeProjectiveMatrix3<double> p;
        const double n = std::exp(uniform(std::log(0.01), std::log(10.0)));
        const double f = n * std::exp(uniform(std::log(1.2), std::log(1e4)));
        if (kind == 0) {
            p = GeCameraBuilder<double>::makePerspective(uniform(0.1, 2.8), n, f, uniform(0.3, 3));
        } else if (kind == 1) {
            const double l = uniform(-2, 1), b = uniform(-2, 1);
            p = GeCameraBuilder<double>::makeFrustum(l * n, (l + uniform(0.1, 3)) * n, b * n, (b + uniform(0.1, 3)) * n, n, f);
        } else {
            const double l = uniform(-20, 10), b = uniform(-20, 10);
            const double on = uniform(-50, 50);
            p = GeCameraBuilder<double>::makeOrthographic(l, l + uniform(0.1, 30), b, b + uniform(0.1, 30), on,
                                                          on + uniform(0.1, 100));
        }
        if (uniform(0, 1) < 0.5) {
            GeVector3<double> axis(uniform(-1, 1), uniform(-1, 1), uniform(-1, 1));
            if (axis.length() < 0.1) axis = {0, 1, 0};
            const auto view = GeAffineMatrix3<double>::makeTranslation({uniform(-5, 5), uniform(-5, 5), uniform(-5, 5)}) *
                              GeAffineMatrix3<double>::makeRotation(axis, uniform(-3, 3));
            p = p * view;
        }
        return p;
    }

    // A box near the viewing volume: the volume's bound (the NDC cube's corners taken back
    // through the inverse) widened by a third, with box sizes from tiny to larger than it.
    GeAlignedBox3<double> box(const GeProjectiveMatrix3<double>& projection) {
        const auto inverse = projection.computeInverse();
        GeAlignedBox3<double> volume;
        for (int c = 0; c < 8; ++c) {
            const GeHomogeneousCoord3<double> ndc((c & 1) ? 1 : -1, (c & 2) ? 1 : -1, (c & 4) ? 1 : -1, 1);
            volume.grow(inverse.transform(ndc).project());
        }
        const GeVector3<double> extent = volume.getMax() - volume.getMin();
        const GePoint3<double> centre(uniform(volume.xMin - extent.x / 3, volume.xMax + extent.x / 3),
                                      uniform(volume.yMin - extent.y / 3, volume.yMax + extent.y / 3),
                                      uniform(volume.zMin - extent.z / 3, volume.zMax + extent.z / 3));
        const double size = std::exp(uniform(std::log(1e-4), std::log(1.5)));
        const GeVector3<double> half(extent.x * size * uniform(0, 1), extent.y * size * uniform(0, 1),
                                     extent.z * size * uniform(0, 1));
        return GeAlignedBox3<double>(centre - half, centre + half);
    }

private:
    std::mt19937 _engine;
};

TEST(GeFrustumTest, ClassifyMatchesCornerTestsInClipSpace) {
    RandomScenes rnd(61);
    int counts[3] = {0, 0, 0};
    unsigned int bitsSeen = 0;
    int compared = 0;
    for (int scene = 0; scene < 300; ++scene) {
        const int kind = scene % 3;
        const auto projection = rnd.projection(kind);
        const Frustum frustum(projection);
        EXPECT_EQ(frustum.isOrthographic(), kind == 2);
        for (int i = 0; i < Frustum::PLANE_COUNT; ++i) EXPECT_NEAR(frustum.getPlane(i).normal.length(), 1.0, 1e-12);
        for (int b = 0; b < 100; ++b) {
            const auto box = rnd.box(projection);
            for (unsigned int planeCount : {4U, 5U, 6U}) {
                const Reference ref = classifyByCorners(projection, box, planeCount);
                if (ref.ambiguous) continue;
                unsigned int mask = 0xdeadbeef;  // stale contents must be replaced
                const auto got = frustum.classify(box, mask, planeCount);
                ++compared;
                ASSERT_EQ(got, ref.classification) << "kind " << kind << " planes " << planeCount << box;
                ASSERT_EQ(mask, ref.mask) << "kind " << kind << " planes " << planeCount << box;
                if (planeCount == 6) {
                    ++counts[got];
                    bitsSeen |= mask;
                }
            }
        }
    }
    // The random boxes exercise every outcome and every plane.
    EXPECT_GT(compared, 80000);
    EXPECT_GT(counts[Frustum::INSIDE], 1000);
    EXPECT_GT(counts[Frustum::OUTSIDE], 1000);
    EXPECT_GT(counts[Frustum::INTERSECTING], 1000);
    EXPECT_EQ(bitsSeen, 0x3fU);
}

}  // namespace
}  // namespace Zr
