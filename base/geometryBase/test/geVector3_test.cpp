#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <sstream>

#include "exBase.h"
#include "geHomogeneousCoord3.h"
#include "gePoint2.h"
#include "gePoint3.h"
#include "geTestRandom.h"
#include "geVector2.h"
#include "geVector3.h"

namespace Zr {
namespace {

TEST(GeVector3Test, NormalizeGivesUnitLengthInTheSameDirection) {
    GeTest::Random rnd(11);
    for (int i = 0; i < 500; ++i) {
        // Lengths over many orders of magnitude.
        const float scale = static_cast<float>(std::pow(10.0, rnd.uniform(-15, 15)));
        const GeVector3<float> v = rnd.direction<float>() * scale;
        GeVector3<float> n = v;
        n.normalize();
        EXPECT_NEAR(n.length(), 1.0F, 1e-6F);
        // Same direction: parallel (cross product 0) and pointing the same way.
        const GeVector3<double> vd(v), nd(n);
        EXPECT_NEAR(nd.cross(vd).length() / vd.length(), 0.0, 1e-6);
        EXPECT_GT(nd.dot(vd), 0.0);
        EXPECT_EQ(v.getNormalized(), n);
    }
}

TEST(GeVector3Test, NormalizingAZeroOrNanVectorFailsTheAssertion) {
    const float nan = std::numeric_limits<float>::quiet_NaN();
    for (const GeVector3<float>& bad : {GeVector3<float>(0, 0, 0), GeVector3<float>(nan, 1, 0)}) {
        GeVector3<float> v = bad;
        try {
            v.normalize();
            FAIL() << "no exception for" << bad;
        } catch (const ExAssertionFailed& e) {
            EXPECT_EQ(e.getFile(), ".\\base/geometryBase/src/geVector3.inline");
            EXPECT_EQ(e.getLine(), 511);
            EXPECT_EQ(e.getMessage(), "len > 0");
        }
    }
    // The zero vector is left as it was.
    GeVector3<float> zero;
    EXPECT_THROW(zero.normalize(), ExAssertionFailed);
    EXPECT_EQ(zero, GeVector3<float>(0, 0, 0));
    EXPECT_THROW(GeVector3<double>().getNormalized(), ExAssertionFailed);
}

TEST(GeVector3Test, CrossAndDotSatisfyTheirIdentities) {
    GeTest::Random rnd(12);
    for (int i = 0; i < 500; ++i) {
        const auto a = rnd.vector<double>(-5, 5);
        const auto b = rnd.vector<double>(-5, 5);
        const auto c = a.cross(b);
        // Perpendicular to both, Lagrange's identity, anticommutative, right-handed basis.
        EXPECT_NEAR(c.dot(a), 0.0, 1e-9);
        EXPECT_NEAR(c.dot(b), 0.0, 1e-9);
        EXPECT_NEAR(c.lengthSquared(), a.lengthSquared() * b.lengthSquared() - a.dot(b) * a.dot(b), 1e-8);
        EXPECT_EQ(b.cross(a), -c);
        // Linear in each argument.
        const auto d = rnd.vector<double>(-5, 5);
        const auto lhs = a.cross(b + d * 3.0);
        const auto rhs = c + a.cross(d) * 3.0;
        EXPECT_NEAR((lhs - rhs).length(), 0.0, 1e-9);
    }
    // The identities also hold for a negated cross product: x cross y = z fixes the handedness.
    EXPECT_EQ(GeVector3<float>(1, 0, 0).cross(GeVector3<float>(0, 1, 0)), GeVector3<float>(0, 0, 1));
    EXPECT_FLOAT_EQ(GeVector3<float>(2, 3, 6).length(), 7.0F);
    EXPECT_EQ(GeVector2<double>(3, 4).length(), 5.0);
    EXPECT_EQ(GeVector2<double>(1, 0).cross(GeVector2<double>(0, 1)), 1.0);
}

TEST(GeVector3Test, PointsAndVectorsCombineAffinely) {
    GeTest::Random rnd(13);
    for (int i = 0; i < 100; ++i) {
        const auto p = rnd.point<double>(-10, 10);
        const auto q = rnd.point<double>(-10, 10);
        const auto v = q - p;
        EXPECT_NEAR(((p + v) - q).length(), 0.0, 1e-12);
        EXPECT_NEAR(((q - v) - p).length(), 0.0, 1e-12);
        GePoint3<double> r = p;
        r += v;
        r -= v * 2.0;
        EXPECT_NEAR((r - (p - v)).length(), 0.0, 1e-12);
    }
    EXPECT_EQ(GePoint2<double>(5, 7) - GePoint2<double>(1, 2), GeVector2<double>(4, 5));
    EXPECT_EQ(GePoint2<double>(1, 2) + GeVector2<double>(4, 5), GePoint2<double>(5, 7));
    // Homogeneous coordinates: a point has w 1 and projects back onto itself; a scaled one too.
    const GePoint3<double> p(1, -2, 3);
    EXPECT_EQ(GeHomogeneousCoord3<double>(p).w, 1.0);
    EXPECT_EQ((GeHomogeneousCoord3<double>(p) * 4.0).project(), p);
}

TEST(GeVector3Test, DumpPrintsMembersByName) {
    std::ostringstream os;
    GeHomogeneousCoord3<double>(1, 2.5, -3, 0.25).dump(os);
    EXPECT_EQ(os.str(), " x: 1 y: 2.5 z: -3 w: 0.25");
}

}  // namespace
}  // namespace Zr
