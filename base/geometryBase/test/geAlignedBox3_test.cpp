#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <vector>

#include "geAlignedBox3.h"
#include "geTestRandom.h"

namespace Zr {
namespace {

GeAlignedBox3<float> randomBox(GeTest::Random& rnd) {
    GeAlignedBox3<float> box;
    box.grow(rnd.point<float>(-5, 5));
    box.grow(rnd.point<float>(-5, 5));
    return box;
}

TEST(GeAlignedBox3Test, DefaultBoxIsEmptyAndTheFirstGrowthReplacesIt) {
    const GeAlignedBox3<float> empty;
    EXPECT_TRUE(empty.isEmpty());
    EXPECT_FALSE(empty.contains({0, 0, 0}));
    for (const GePoint3<float>& p : {GePoint3<float>(0, 0, 0), GePoint3<float>(1e30F, -1e30F, 3),
                                     GePoint3<float>(-7, 2, -1e-30F)}) {
        GeAlignedBox3<float> box;
        box.grow(p);
        EXPECT_FALSE(box.isEmpty());
        EXPECT_EQ(box, GeAlignedBox3<float>(p, p));
    }
    // An empty box grown by an empty box stays empty; growth by an empty box changes nothing.
    GeAlignedBox3<double> e;
    e.grow(GeAlignedBox3<double>());
    EXPECT_TRUE(e.isEmpty());
    GeAlignedBox3<double> unit({0, 0, 0}, {1, 1, 1});
    unit.grow(GeAlignedBox3<double>());
    EXPECT_EQ(unit, GeAlignedBox3<double>({0, 0, 0}, {1, 1, 1}));
    // A box with one inverted axis is empty.
    EXPECT_TRUE(GeAlignedBox3<double>({0, 2, 0}, {1, 1, 1}).isEmpty());
}

TEST(GeAlignedBox3Test, GrowthGivesTheBoundsOfAllPoints) {
    GeTest::Random rnd(31);
    for (int trial = 0; trial < 50; ++trial) {
        std::vector<GePoint3<float>> points;
        const int count = rnd.uniformInt(1, 40);
        GeAlignedBox3<float> box;
        for (int i = 0; i < count; ++i) {
            points.push_back(rnd.point<float>(-100, 100));
            box.grow(points.back());
        }
        const auto byX = [](auto a, auto b) { return a.x < b.x; };
        const auto byY = [](auto a, auto b) { return a.y < b.y; };
        const auto byZ = [](auto a, auto b) { return a.z < b.z; };
        EXPECT_EQ(box.xMin, std::min_element(points.begin(), points.end(), byX)->x);
        EXPECT_EQ(box.xMax, std::max_element(points.begin(), points.end(), byX)->x);
        EXPECT_EQ(box.yMin, std::min_element(points.begin(), points.end(), byY)->y);
        EXPECT_EQ(box.yMax, std::max_element(points.begin(), points.end(), byY)->y);
        EXPECT_EQ(box.zMin, std::min_element(points.begin(), points.end(), byZ)->z);
        EXPECT_EQ(box.zMax, std::max_element(points.begin(), points.end(), byZ)->z);
        for (const auto& p : points) EXPECT_TRUE(box.contains(p));

        // Growing by a box is growing by its two corners; the union contains both.
        const auto other = randomBox(rnd);
        GeAlignedBox3<float> united = box;
        united.grow(other);
        for (int c = 0; c < 8; ++c) {
            EXPECT_TRUE(united.contains(box.getCorner(c)));
            EXPECT_TRUE(united.contains(other.getCorner(c)));
        }
    }
}

TEST(GeAlignedBox3Test, MinMaxDistanceVectorsMatchBruteForce) {
    GeTest::Random rnd(32);
    for (int trial = 0; trial < 2000; ++trial) {
        const auto box = randomBox(rnd);
        // Points inside, outside and on the box's planes.
        GePoint3<float> p = rnd.point<float>(-8, 8);
        if (trial % 5 == 0) p.x = box.xMin;
        if (trial % 7 == 0) p.y = box.yMax;
        GeVector3<float> nearest, farthest;
        box.computeMinMaxDistanceVectors(p, nearest, farthest);

        // Farthest: p + farthest is a corner, and no corner is farther.
        float farthestCorner = 0.0F;
        bool landsOnCorner = false;
        for (int c = 0; c < 8; ++c) {
            const auto corner = box.getCorner(c);
            farthestCorner = std::max(farthestCorner, (corner - p).length());
            landsOnCorner = landsOnCorner || (p + farthest - corner).length() < 1e-5F;
        }
        EXPECT_TRUE(landsOnCorner);
        EXPECT_FLOAT_EQ(farthest.length(), farthestCorner);

        // Nearest: p + nearest lies in the box, and no sampled point of the box (a grid over
        // its volume and faces, in double) is nearer.
        const GePoint3<float> hit = p + nearest;
        const float slack = 1e-5F;
        EXPECT_TRUE(box.xMin - slack <= hit.x && hit.x <= box.xMax + slack);
        EXPECT_TRUE(box.yMin - slack <= hit.y && hit.y <= box.yMax + slack);
        EXPECT_TRUE(box.zMin - slack <= hit.z && hit.z <= box.zMax + slack);
        double bruteNearest = 1e30;
        const int n = 8;
        for (int i = 0; i <= n; ++i)
            for (int j = 0; j <= n; ++j)
                for (int k = 0; k <= n; ++k) {
                    const GePoint3<double> q(box.xMin + (box.xMax - box.xMin) * double(i) / n,
                                             box.yMin + (box.yMax - box.yMin) * double(j) / n,
                                             box.zMin + (box.zMax - box.zMin) * double(k) / n);
                    bruteNearest = std::min(bruteNearest, (q - GePoint3<double>(p)).length());
                }
        EXPECT_LE(nearest.length(), bruteNearest + 1e-5);
        if (box.contains(p)) {
            EXPECT_EQ(nearest, GeVector3<float>(0, 0, 0));
        }
    }
}

TEST(GeAlignedBox3Test, TransformedBoxIsTheBoundOfTheTransformedCorners) {
    GeTest::Random rnd(33);
    for (int trial = 0; trial < 300; ++trial) {
        const auto box = randomBox(rnd);
        const auto m = rnd.wellConditionedAffine<float>();
        GeAlignedBox3<float> expected;
        for (int c = 0; c < 8; ++c) expected.grow(m.transformPoint(box.getCorner(c)));
        const auto got = box.computeTransformed(m);
        const float tol = 1e-4F;
        EXPECT_NEAR(got.xMin, expected.xMin, tol);
        EXPECT_NEAR(got.xMax, expected.xMax, tol);
        EXPECT_NEAR(got.yMin, expected.yMin, tol);
        EXPECT_NEAR(got.yMax, expected.yMax, tol);
        EXPECT_NEAR(got.zMin, expected.zMin, tol);
        EXPECT_NEAR(got.zMax, expected.zMax, tol);
    }
    EXPECT_TRUE(GeAlignedBox3<float>().computeTransformed(GeAffineMatrix3<float>()).isEmpty());
}

TEST(GeAlignedBox3Test, IntersectsMatchesOverlapOfIntervals) {
    GeTest::Random rnd(34);
    for (int trial = 0; trial < 500; ++trial) {
        // Integer corners so that touching boxes occur often.
        const auto intBox = [&rnd] {
            GeAlignedBox3<double> b;
            for (int k = 0; k < 2; ++k) b.grow({double(rnd.uniformInt(0, 4)), double(rnd.uniformInt(0, 4)),
                                                double(rnd.uniformInt(0, 4))});
            return b;
        };
        const auto a = intBox();
        const auto b = intBox();
        // Brute force: some point of a half-unit lattice lies in both.
        bool shared = false;
        for (int i = 0; i <= 8 && !shared; ++i)
            for (int j = 0; j <= 8 && !shared; ++j)
                for (int k = 0; k <= 8 && !shared; ++k) {
                    const GePoint3<double> q(i * 0.5, j * 0.5, k * 0.5);
                    shared = a.contains(q) && b.contains(q);
                }
        EXPECT_EQ(a.intersects(b), shared);
        EXPECT_EQ(b.intersects(a), shared);
    }
}

}  // namespace
}  // namespace Zr
