// Colours, float comparisons, vectors, points, intervals, rectangles, matrices, boxes and
// projections, against definitions, closed forms and brute force.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <vector>

#include "baseTestSupport.h"
#include "coRgbaColorTyped.h"
#include "exBase.h"
#include "floatUtil.h"
#include "geAlignedBox3.h"
#include "geCameraBuilder.h"
#include "geInterval.h"
#include "geLinearMatrix2.h"
#include "gePoint2.h"
#include "geRectangle.h"
#include "geScale3.h"
#include "rational.h"

namespace Zr {
namespace {

using BaseTest::maxDifference;
using BaseTest::Random;
using Box = GeAlignedBox3<float>;

// Distinct powers of two per channel catch channels swapped or left out; nothing is clamped.
TEST(CoRgbaColorTyped, ArithmeticIsComponentwiseOnEveryChannel) {
    using C4 = CoRgbaColorTyped<float>;
    using C3 = CoRgbColorTyped<float>;
    const C4 a(1, 2, 4, -8), b(16, 32, 64, 128);
    C4 c = a;
    EXPECT_EQ((((c += b) -= a) *= a) *= 2.0F, C4(32, 128, 512, -2048));
    EXPECT_EQ(a + b - C4(4, 8, 16, 32), C4(13, 26, 52, 88));
    EXPECT_EQ(a * b * 0.5F, C4(8, 32, 128, -512));
    EXPECT_EQ(0.5F * b / 8.0F, C4(1, 2, 4, 8));
    EXPECT_NE(a, C4(1, 2, 4, 9));
    const C3 x(1, 2, -4), y(16, 32, 64);
    C3 z = x;
    EXPECT_EQ((((z += y) -= x) *= x) *= 2.0F, C3(32, 128, -512));
    EXPECT_EQ(x + y - C3(4, 8, 16), C3(13, 26, 44));
    EXPECT_EQ(x * y * 0.5F, C3(8, 32, -128));
    EXPECT_EQ(0.5F * y / 8.0F, C3(1, 2, 4));
    const float v[3] = {0.25F, -1.0F, 7.0F};  // largest and smallest for every order of three
    for (const int o : {12, 21, 102, 120, 201, 210}) {
        const C3 w(v[o / 100], v[o / 10 % 10], v[o % 10]);
        EXPECT_TRUE(w.getMax() == 7.0F && w.getMin() == -1.0F) << w;
    }
}

TEST(FloatUtil, ToleranceIsEpsilonScaledByTheLargerMagnitude) {
    const float eps = 1.1920929e-07F;
    const struct {
        float a, b;
        bool equal;
    } cases[] = {
        {1.0F, 1.0F, true},           {1.0F, std::nextafter(1.0F, 2.0F), true}, {1.0F, 1.0F + 3 * eps, false},
        {1e6F, 1e6F + 0.0625F, true}, {1e6F, 1e6F + 0.25F, false}, {1e-20F, 1e-20F * (1 + eps / 2), true},
        {0.0F, 1e-30F, false},        {-0.0F, 0.0F, true},         {-2.0F, 2.0F, false},
        {-3.0F, std::nextafter(-3.0F, -4.0F), true},  // one step is 2 eps, within 3 eps
    };
    for (const auto& c : cases) {
        const float hi = std::fmax(c.a, c.b), lo = std::fmin(c.a, c.b);
        EXPECT_EQ(FloatUtil::isEqual(c.a, c.b), c.equal) << c.a << " vs " << c.b;
        EXPECT_EQ(FloatUtil::isEqual(c.b, c.a), c.equal) << c.a << " vs " << c.b;
        EXPECT_EQ(FloatUtil::isGreater(hi, lo), !c.equal) << c.a;
        EXPECT_EQ(FloatUtil::isLess(lo, hi), !c.equal) << c.a;
        EXPECT_FALSE(FloatUtil::isLess(hi, lo) || FloatUtil::isGreater(lo, hi)) << c.a;
    }
    EXPECT_TRUE(FloatUtil::isEqual(100.0, 101.0, 0.01));
    EXPECT_FALSE(FloatUtil::isEqual(100.0, 102.0, 0.01));
    // A failed check reports the texts of its condition joined.
    try {
        ZR_ASSERT_FLOAT_GREATER_AT(Rational(0, 5).getFloat(), 0.F, "f", 7);
        FAIL() << "did not throw";
    } catch (const ExAssertionFailed& e) {
        EXPECT_EQ(e.getMessage(), "Rational(0, 5).getFloat() is greater than 0.F");
    }
}

TEST(Rational, ValueAndEqualityByCrossProducts) {
    EXPECT_EQ(Rational(30000, 1001).getFloat(), 30000.0F / 1001.0F);
    EXPECT_EQ(Rational(-1, 4).getDouble() + Rational(7).getDouble(), 6.75);
    EXPECT_TRUE(Rational(1, 2) == Rational(2, 4) && Rational(1, 2) != Rational(2, 3));
    EXPECT_NE(Rational(2147483647, 2147483646), Rational(2147483646, 2147483645));  // beyond 32 bits
}

TEST(GeVector3, CrossAndDotSatisfyTheirIdentitiesAndPointsCombineAffinely) {
    Random rnd(12);
    for (int i = 0; i < 500; ++i) {
        const auto a = rnd.vector<double>(-5, 5), b = rnd.vector<double>(-5, 5), d = rnd.vector<double>(-5, 5);
        const auto c = a.cross(b);
        EXPECT_NEAR(c.dot(a), 0.0, 1e-9);
        EXPECT_NEAR(c.dot(b), 0.0, 1e-9);
        EXPECT_NEAR(c.lengthSquared(), a.lengthSquared() * b.lengthSquared() - a.dot(b) * a.dot(b), 1e-8);
        EXPECT_EQ(b.cross(a), -c);
        EXPECT_NEAR((a.cross(b + d * 3.0) - (c + a.cross(d) * 3.0)).length(), 0.0, 1e-9);
        const GePoint3<double> p(a), q(b);
        GePoint3<double> r = p;
        r += q - p;
        r -= d;
        EXPECT_NEAR((r - (q - d)).length() + ((p + d) - p - d).length(), 0.0, 1e-12);
    }
    EXPECT_EQ(GeVector3<float>(1, 0, 0).cross(GeVector3<float>(0, 1, 0)), GeVector3<float>(0, 0, 1));
    EXPECT_EQ(GeVector3<float>(0, -3, 4).getNormalized(), GeVector3<float>(0, -0.6F, 0.8F));
    EXPECT_EQ(GeVector2<double>(3, 4).length() + GeVector2<double>(1, 0).cross(GeVector2<double>(0, 1)), 6.0);
    EXPECT_EQ(GePoint2<double>(5, 7) - GePoint2<double>(1, 2), GeVector2<double>(4, 5));
    EXPECT_EQ(GePoint2<double>(1, 2) + GeVector2<double>(4, 5), GePoint2<double>(5, 7));
    GePoint2<double> q(1, 2);
    EXPECT_EQ((q += GeVector2<double>(4, 5)) -= GeVector2<double>(1, 3), GePoint2<double>(4, 4));
    const GePoint3<double> p(1, -2, 3);  // w 1, and projection undoes a scaling
    EXPECT_EQ((GeHomogeneousCoord3<double>(p) * 4.0).project(), p);
    // A vector of no length or of NaN cannot be normalised; a zero one is left as it was.
    GeVector3<float> zero, nan(std::nanf(""), 1, 0);
    EXPECT_THROW(zero.normalize(), ExAssertionFailed);
    EXPECT_THROW(nan.normalize(), ExAssertionFailed);
    EXPECT_EQ(zero, GeVector3<float>());
}

TEST(GeInterval, ClosedRangeWithEmptyGrowth) {
    const GeInterval<int> span(3, 7);
    EXPECT_TRUE(span.contains(3) && span.contains(7) && !span.isEmpty() && span.getLength() == 4);
    EXPECT_FALSE(span.contains(2) || span.contains(8) || !GeInterval<int>(4, 3).isEmpty());
    GeInterval<float> grown = GeInterval<float>::makeEmpty();
    EXPECT_TRUE(grown.isEmpty());
    for (float v : {2.0F, -1.0F, 5.0F, 0.0F}) grown.grow(v);
    EXPECT_EQ(grown, GeInterval<float>(-1, 5));
    EXPECT_EQ(span.intersect(GeInterval<int>(5, 12)), GeInterval<int>(5, 7));
    EXPECT_EQ(span.intersect(GeInterval<int>(-5, 4)), GeInterval<int>(3, 4));
}

// A rectangle x0, x1, y0, y1 covers x0 <= x < x1 and y0 <= y < y1.
TEST(GeRectangle, SizesContainsIntersectionAndUnionMatchPixelCounts) {
    Random rnd(41);
    const auto covers = [](const GeRectangle<int>& r, int x, int y) {
        return r.x0 <= x && x < r.x1 && r.y0 <= y && y < r.y1;
    };
    for (int trial = 0; trial < 300; ++trial) {
        int e[8];
        for (int& v : e) v = rnd.uniformInt(-10, 10);
        const GeRectangle<int> a(e[0], e[1], e[2], e[3]), b(e[4], e[5], e[6], e[7]);
        const auto both = a.intersect(b), any = a.unite(b);
        int inA = 0, inBoth = 0;
        for (int y = -12; y < 12; ++y)
            for (int x = -12; x < 12; ++x) {
                const bool inside = covers(a, x, y), common = inside && covers(b, x, y);
                inA += inside, inBoth += common;
                EXPECT_TRUE(a.contains(x, y) == inside && both.contains(x, y) == common) << a << b;
                if (inside || covers(b, x, y)) { EXPECT_TRUE(any.contains(x, y)) << a << b; }
            }
        EXPECT_EQ(a.getArea(), inA) << a;
        EXPECT_EQ(a.isEmpty(), inA == 0) << a;
        EXPECT_EQ(both.getArea(), inBoth);
        if (inA) { EXPECT_EQ(a.getWidth() * a.getHeight(), inA); }
    }
}

// A random affine map followed by a perspective divide in a random direction.
GeProjectiveMatrix3<double> randomProjective(Random& rnd) {
    GeProjectiveMatrix3<double> divide;
    for (int c = 0; c < 3; ++c) divide(3, c) = rnd.uniform(-0.3, 0.3);
    divide(3, 3) = rnd.uniform(1, 2);
    return divide * GeProjectiveMatrix3<double>(rnd.wellConditionedAffine<double>());
}

TEST(GeMatrix, ElementsStandColumnAfterColumnAndAPointCombinesTheColumns) {
    const GeAffineMatrix3<float> a(1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12);
    const float stored[16] = {1, 5, 9, 0, 2, 6, 10, 0, 3, 7, 11, 0, 4, 8, 12, 1};
    for (int i = 0; i < 16; ++i) EXPECT_EQ(a._m[i], stored[i]) << i;
    EXPECT_EQ(GeLinearMatrix3<float>(1, 2, 3, 4, 5, 6, 7, 8, 9)(0, 2) + GeLinearMatrix2<float>(1, 2, 3, 4)(0, 1), 5);
    const GePoint3<float> p(2, -3, 5);
    const auto expected = a.getColumn(0) * 2.0F - a.getColumn(1) * 3.0F + a.getColumn(2) * 5.0F + a.getTranslation();
    EXPECT_EQ(a.transformPoint(p).toVector(), expected);
    EXPECT_EQ(a.transformVector(p.toVector()), expected - a.getColumn(3));
    const auto h = GeProjectiveMatrix3<float>(a).transform(GeHomogeneousCoord3<float>(p));
    EXPECT_EQ(GeHomogeneousCoord3<float>(GePoint3<float>(expected)), h);
    for (int i = 0; i < 16; ++i) EXPECT_EQ(GeProjectiveMatrix3<double>()._m[i], i % 5 == 0 ? 1.0 : 0.0) << i;
    EXPECT_EQ(a * GeAffineMatrix3<float>(), a);
}

// Products apply the right operand first; inverses give the identity both ways; the row vector
// times the linear part, the transposed product and the affine form agree.
TEST(GeMatrix, ProductsComposeAndInversesUndo) {
    Random rnd(21);
    for (int i = 0; i < 300; ++i) {
        const auto a = rnd.wellConditionedAffine<float>(), b = rnd.wellConditionedAffine<float>();
        const auto p = rnd.point<float>(-5, 5);
        const auto v = rnd.vector<float>(-5, 5);
        const auto la = a.getLinear(), lb = b.getLinear();
        EXPECT_LT(((a * b).transformPoint(p) - a.transformPoint(b.transformPoint(p))).length(), 1e-4F);
        EXPECT_LT(((la * lb) * v - la * (lb * v)).length(), 1e-4F);
        EXPECT_LT((la.getTransposed() * v - la.mulOnRight(v)).length(), 1e-5F);
        EXPECT_LT((a.mulOnRight(v) - la.mulOnRight(v)).length(), 1e-5F);
        const auto pa = randomProjective(rnd), pb = randomProjective(rnd);
        const auto ad = rnd.wellConditionedAffine<double>();
        const GeProjectiveMatrix3<double> adp(ad);
        const auto pd = rnd.point<double>(-5, 5);
        const auto h1 = (pa * pb).transform(pd), h2 = pa.transform(pb.transform(pd));
        EXPECT_LT(std::fabs(h1.x - h2.x) + std::fabs(h1.y - h2.y) + std::fabs(h1.z - h2.z) + std::fabs(h1.w - h2.w),
                  1e-9);
        EXPECT_LT(maxDifference(pa * ad, pa * adp, 4, 4) + maxDifference(ad * pb, adp * pb, 4, 4), 1e-12);
        EXPECT_LT(maxDifference(a.computeInverse() * a, GeAffineMatrix3<float>(), 4, 4), 2e-5) << a;
        EXPECT_LT(maxDifference(a * a.computeInverse(), GeAffineMatrix3<float>(), 4, 4), 2e-5) << a;
        EXPECT_LT(maxDifference(adp * GeProjectiveMatrix3<double>(ad.computeInverse()), {}, 4, 4), 1e-12);
        EXPECT_LT(maxDifference(la.computeInverse() * la, GeLinearMatrix3<float>(), 3, 3), 2e-5);
        EXPECT_LT(maxDifference(pa.computeInverse() * pa, GeProjectiveMatrix3<double>(), 4, 4), 1e-11) << pa;
        EXPECT_LT(maxDifference(pa * pa.computeInverse(), GeProjectiveMatrix3<double>(), 4, 4), 1e-11) << pa;
        // Fully general matrices, kept away from singularity by a dominant diagonal.
        GeProjectiveMatrix3<double> g;
        GeLinearMatrix2<double> ma, mb;
        for (int e = 0; e < 16; ++e) g._m[e] = rnd.uniform(-1, 1) + (e % 5 == 0 ? 5.0 : 0.0);
        for (int e = 0; e < 4; ++e) ma._m[e] = rnd.uniform(-1, 1) + (e % 3 ? 0.0 : 3.0), mb._m[e] = rnd.uniform(-2, 2);
        EXPECT_LT(maxDifference(g.computeInverse() * g, GeProjectiveMatrix3<double>(), 4, 4), 1e-12) << g;
        const GeVector2<double> v2(rnd.uniform(-2, 2), rnd.uniform(-2, 2));
        EXPECT_LT(((ma * mb) * v2 - ma * (mb * v2)).length(), 1e-12);
        EXPECT_LT(maxDifference(ma.computeInverse() * ma, GeLinearMatrix2<double>(), 2, 2), 1e-14);
    }
}

TEST(GeMatrix, DeterminantsMatchClosedFormsAndMultiply) {
    Random rnd(23);
    for (int i = 0; i < 100; ++i) {
        const double sx = rnd.uniform(0.5, 2), sy = rnd.uniform(0.5, 2), sz = rnd.uniform(0.5, 2);
        const auto rot = GeAffineMatrix3<double>::makeRotation(rnd.direction<double>(), rnd.uniform(-3, 3));
        const auto m = rot * GeAffineMatrix3<double>::makeScale(sx, sy, sz);
        EXPECT_NEAR(rot.computeDeterminant(), 1.0, 1e-12);
        EXPECT_NEAR(GeProjectiveMatrix3<double>(m).computeDeterminant(), sx * sy * sz, 1e-12);
        const auto pa = randomProjective(rnd), pb = randomProjective(rnd);
        const double product = pa.computeDeterminant() * pb.computeDeterminant();
        EXPECT_NEAR((pa * pb).computeDeterminant(), product, 1e-9 * std::fabs(product) + 1e-12);
        EXPECT_NEAR(pa.getTransposed().computeDeterminant(), pa.computeDeterminant(), 1e-12);
    }
    EXPECT_EQ(GeLinearMatrix2<double>(1, 2, 3, 4).computeDeterminant(), -2.0);
    EXPECT_EQ(GeLinearMatrix3<float>(2, 0, 0, 0, 3, 0, 1, 1, 4).computeDeterminant(), 24.0F);
}

TEST(GeScale3, ScalesCombineIntoEitherMatrixTypeAndApplyFirstOnTheRight) {
    const GeScale3<float> a(2, 3, 4), b(0.5F, -1, 10);
    const GeAffineMatrix3<float> affine = a * b;
    const GeProjectiveMatrix3<float> projective = a * b;
    const float factors[4] = {1, -3, 40, 1};
    for (int e = 0; e < 16; ++e) EXPECT_EQ(affine._m[e] + projective._m[e], e % 5 ? 0.0F : 2 * factors[e / 5]) << e;
    const auto t = GeAffineMatrix3<float>::makeTranslation({1, 1, 1});
    EXPECT_EQ((t * a).transformPoint({1, 1, 1}), GePoint3<float>(3, 4, 5));
    EXPECT_EQ((a * t).transformPoint({1, 1, 1}), GePoint3<float>(4, 6, 8));
    EXPECT_EQ((GeProjectiveMatrix3<float>() * (a * b)).transformAndProject({1, 1, 1}), GePoint3<float>(1, -3, 40));
    EXPECT_EQ(a * a.computeInverse(), GeScale3<float>(1, 1, 1));
}

TEST(GeAlignedBox3, EmptyUntilGrownAndThenTheBoundsOfAllPoints) {
    EXPECT_TRUE(Box().isEmpty() && !Box().contains({0, 0, 0}) && GeAlignedBox3<double>({0, 2, 0}, {1, 1, 1}).isEmpty());
    Box unit({0, 0, 0}, {1, 1, 1});
    unit.grow(Box());  // an empty box adds nothing
    EXPECT_EQ(unit, Box({0, 0, 0}, {1, 1, 1}));
    Random rnd(31);
    for (int trial = 0; trial < 50; ++trial) {
        std::vector<GePoint3<float>> points(rnd.uniformInt(1, 40));
        Box box, expected;
        for (auto& p : points) box.grow(p = rnd.point<float>(-100, 100));
        for (const auto& p : points) {
            EXPECT_TRUE(box.contains(p));
            expected.xMin = std::min(expected.xMin, p.x), expected.xMax = std::max(expected.xMax, p.x);
            expected.yMin = std::min(expected.yMin, p.y), expected.yMax = std::max(expected.yMax, p.y);
            expected.zMin = std::min(expected.zMin, p.z), expected.zMax = std::max(expected.zMax, p.z);
        }
        EXPECT_EQ(box, expected);
        const Box other(rnd.point<float>(-9, 0), rnd.point<float>(0, 9));
        Box united = box;
        united.grow(other);
        for (int c = 0; c < 8; ++c)
            EXPECT_TRUE(united.contains(box.getCorner(c)) && united.contains(other.getCorner(c)));
    }
}

// p + farthest is the farthest corner; p + nearest lies in the box, and no point of a lattice
// over the box is nearer. The transformed box bounds the transformed corners. Boxes of integer
// corners, so that touching occurs often, intersect when a point of the half-unit lattice lies in both.
TEST(GeAlignedBox3, DistanceVectorsTransformAndIntersectionMatchBruteForce) {
    Random rnd(32);
    for (int trial = 0; trial < 2000; ++trial) {
        Box box;
        box.grow(rnd.point<float>(-5, 5));
        box.grow(rnd.point<float>(-5, 5));
        GePoint3<float> p = rnd.point<float>(-8, 8);
        if (trial % 5 == 0) p.x = box.xMin;  // on the box's planes too
        if (trial % 7 == 0) p.y = box.yMax;
        GeVector3<float> nearest, farthest;
        box.computeMinMaxDistanceVectors(p, nearest, farthest);
        float farthestCorner = 0.0F, toFarthest = 1e30F;
        for (int c = 0; c < 8; ++c) {
            farthestCorner = std::max(farthestCorner, (box.getCorner(c) - p).length());
            toFarthest = std::min(toFarthest, (p + farthest - box.getCorner(c)).length());
        }
        EXPECT_LT(toFarthest, 1e-5F);
        EXPECT_FLOAT_EQ(farthest.length(), farthestCorner);
        const GeVector3<float> slack(1e-5F, 1e-5F, 1e-5F);
        EXPECT_TRUE(Box(box.getMin() - slack, box.getMax() + slack).contains(p + nearest));
        double bruteNearest = 1e30;
        for (int i = 0; i < 729; ++i) {
            const GePoint3<double> q(box.xMin + (box.xMax - box.xMin) * (i % 9) / 8.0,
                                     box.yMin + (box.yMax - box.yMin) * (i / 9 % 9) / 8.0,
                                     box.zMin + (box.zMax - box.zMin) * (i / 81) / 8.0);
            bruteNearest = std::min(bruteNearest, (q - GePoint3<double>(p)).length());
        }
        EXPECT_LE(nearest.length(), bruteNearest + 1e-5);
        if (box.contains(p)) { EXPECT_EQ(nearest, GeVector3<float>(0, 0, 0)); }
        if (trial % 4) continue;
        const auto m = rnd.wellConditionedAffine<float>();
        Box expected;
        for (int c = 0; c < 8; ++c) expected.grow(m.transformPoint(box.getCorner(c)));
        for (int c : {0, 7}) {  // the minima and the maxima
            const auto d = box.computeTransformed(m).getCorner(c) - expected.getCorner(c);
            EXPECT_LE(std::max({std::fabs(d.x), std::fabs(d.y), std::fabs(d.z)}), 1e-4F);
        }
        GeAlignedBox3<double> a, b;
        for (int k = 0; k < 4; ++k) {
            const double x = rnd.uniformInt(0, 4), y = rnd.uniformInt(0, 4), z = rnd.uniformInt(0, 4);
            (k < 2 ? a : b).grow({x, y, z});
        }
        bool shared = false;
        for (int i = 0; i < 729; ++i) {
            const GePoint3<double> q(i % 9 * 0.5, i / 9 % 9 * 0.5, i / 81 * 0.5);
            shared = shared || (a.contains(q) && b.contains(q));
        }
        EXPECT_TRUE(a.intersects(b) == shared && b.intersects(a) == shared) << a << b;
    }
    EXPECT_TRUE(Box().computeTransformed(GeAffineMatrix3<float>()).isEmpty());
}

// Every projection maps the corners of its window [l, r] x [b, t] on the near plane, and of the far
// plane's window, onto the corners of the NDC cube: near at depth -1, far at 1.
TEST(GeCameraBuilder, ProjectionsMapTheirViewingVolumeOntoTheNdcCube) {
    Random rnd(51);
    for (int trial = 0; trial < 600; ++trial) {
        const int kind = trial % 3;  // symmetric perspective, off-centre perspective, orthographic
        const double n = kind == 2 ? rnd.uniform(-5, 5) : rnd.uniform(0.01, 10);
        const double f = kind == 2 ? n + rnd.uniform(0.1, 100) : n * rnd.uniform(1.5, 1000);
        double l = rnd.uniform(-3, 1), r = l + rnd.uniform(0.1, 4), b = rnd.uniform(-3, 1), t = b + rnd.uniform(0.1, 4);
        GeProjectiveMatrix3<double> p;
        if (kind == 0) {
            const double fov = rnd.uniform(0.1, 3.0), aspect = rnd.uniform(0.3, 3);
            t = n * std::tan(fov / 2), b = -t, r = aspect * t, l = -r;
            p = GeCameraBuilder<double>::makePerspective(fov, n, f, aspect);
        } else {
            p = kind == 1 ? GeCameraBuilder<double>::makeFrustum(l, r, b, t, n, f)
                          : GeCameraBuilder<double>::makeOrthographic(l, r, b, t, n, f);
        }
        EXPECT_EQ(p.isOrthographic(), kind == 2);
        for (int c = 0; c < 8; ++c) {
            const double widen = (c & 4) && kind != 2 ? f / n : 1.0;  // along the rays through the near corners
            const double x = ((c & 1) ? r : l) * widen, y = ((c & 2) ? t : b) * widen;
            const auto ndc = p.transformAndProject({x, y, (c & 4) ? -f : -n});
            EXPECT_NEAR(ndc.x, (c & 1) ? 1.0 : -1.0, 1e-9) << kind;
            EXPECT_NEAR(ndc.y, (c & 2) ? 1.0 : -1.0, 1e-9) << kind;
            EXPECT_NEAR(ndc.z, (c & 4) ? 1.0 : -1.0, 1e-9) << kind;
        }
    }
}

}  // namespace
}  // namespace Zr
