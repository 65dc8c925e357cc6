#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

#include "geAffineMatrix3.h"
#include "geLinearMatrix2.h"
#include "geLinearMatrix3.h"
#include "geProjectiveMatrix3.h"
#include "geScale3.h"
#include "geTestRandom.h"

namespace Zr {
namespace {

// Largest elementwise difference of two matrices of the same shape, over their element access.
template <class M>
double maxDifference(const M& a, const M& b, int rows, int cols) {
    double worst = 0.0;
    for (int r = 0; r < rows; ++r)
        for (int c = 0; c < cols; ++c) worst = std::max(worst, std::fabs(double(a(r, c)) - double(b(r, c))));
    return worst;
}

// A projective matrix with a genuine bottom row: a random affine map followed by a perspective
// divide in a random direction. Its singular values stay moderate.
GeProjectiveMatrix3<double> randomProjective(GeTest::Random& rnd) {
    GeProjectiveMatrix3<double> p(rnd.wellConditionedAffine<double>());
    GeProjectiveMatrix3<double> divide;
    divide(3, 0) = rnd.uniform(-0.3, 0.3);
    divide(3, 1) = rnd.uniform(-0.3, 0.3);
    divide(3, 2) = rnd.uniform(-0.3, 0.3);
    divide(3, 3) = rnd.uniform(1, 2);
    return divide * p;
}

TEST(GeMatrixTest, ElementsAreStoredColumnAfterColumn) {
    // Row-wise constructor arguments land at _m[col * rows + row].
    const GeAffineMatrix3<float> a(1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12);
    const float expectedAffine[16] = {1, 5, 9, 0, 2, 6, 10, 0, 3, 7, 11, 0, 4, 8, 12, 1};
    for (int i = 0; i < 16; ++i) EXPECT_EQ(a._m[i], expectedAffine[i]) << i;
    EXPECT_EQ(a(1, 3), 8.0F);
    EXPECT_EQ(a.getTranslation(), GeVector3<float>(4, 8, 12));
    EXPECT_EQ(a.getColumn(1), GeVector3<float>(2, 6, 10));

    const GeLinearMatrix3<float> l(1, 2, 3, 4, 5, 6, 7, 8, 9);
    EXPECT_EQ(l._m[1], 4.0F);
    EXPECT_EQ(l(0, 2), 3.0F);
    const GeLinearMatrix2<double> m2(1, 2, 3, 4);
    EXPECT_EQ(m2._m[1], 3.0);
    EXPECT_EQ(m2(0, 1), 2.0);

    // A point becomes x * column0 + y * column1 + z * column2 + column3.
    const GePoint3<float> p(2, -1, 3);
    const GeVector3<float> expected = a.getColumn(0) * 2.0F - a.getColumn(1) + a.getColumn(2) * 3.0F + a.getColumn(3);
    EXPECT_EQ(a.transformPoint(p).toVector(), expected);
    EXPECT_EQ(a.transformVector(p.toVector()), expected - a.getColumn(3));

    // The default matrices are the identities the inverse tests below compare with.
    GeAffineMatrix3<float> reset = a;
    reset.setIdentity();
    EXPECT_EQ(reset, GeAffineMatrix3<float>());
    for (int i = 0; i < 16; ++i) EXPECT_EQ(GeProjectiveMatrix3<double>()._m[i], i % 5 == 0 ? 1.0 : 0.0) << i;
}

TEST(GeMatrixTest, ProductAppliesTheRightOperandFirst) {
    GeTest::Random rnd(21);
    for (int i = 0; i < 200; ++i) {
        const auto a = rnd.wellConditionedAffine<float>();
        const auto b = rnd.wellConditionedAffine<float>();
        const auto p = rnd.point<float>(-5, 5);
        const auto viaProduct = (a * b).transformPoint(p);
        const auto stepwise = a.transformPoint(b.transformPoint(p));
        EXPECT_LT((viaProduct - stepwise).length(), 1e-4F);

        // Projective with projective and with affine, in the same order; the homogeneous
        // results agree before the division.
        const auto pa = randomProjective(rnd);
        const auto pb = randomProjective(rnd);
        const auto ad = rnd.wellConditionedAffine<double>();
        const auto pd = rnd.point<double>(-5, 5);
        const auto h1 = (pa * pb).transform(pd);
        const auto h2 = pa.transform(pb.transform(pd));
        EXPECT_LT(std::fabs(h1.x - h2.x) + std::fabs(h1.y - h2.y) + std::fabs(h1.z - h2.z) + std::fabs(h1.w - h2.w),
                  1e-9);
        const auto h3 = (pa * ad).transform(pd);
        const auto h4 = pa.transform(ad.transformPoint(pd));
        EXPECT_LT(std::fabs(h3.x - h4.x) + std::fabs(h3.y - h4.y) + std::fabs(h3.z - h4.z) + std::fabs(h3.w - h4.w),
                  1e-9);
        const auto h5 = (ad * pb).transform(pd);
        const auto h6 = GeProjectiveMatrix3<double>(ad).transform(pb.transform(pd));
        EXPECT_LT(std::fabs(h5.x - h6.x) + std::fabs(h5.w - h6.w), 1e-9);

        // Linear matrices.
        const auto la = a.getLinear();
        const auto lb = b.getLinear();
        const auto v = rnd.vector<float>(-5, 5);
        EXPECT_LT(((la * lb) * v - la * (lb * v)).length(), 1e-4F);
        const GeLinearMatrix2<double> ma(rnd.uniform(-2, 2), rnd.uniform(-2, 2), rnd.uniform(-2, 2), rnd.uniform(-2, 2));
        const GeLinearMatrix2<double> mb(rnd.uniform(-2, 2), rnd.uniform(-2, 2), rnd.uniform(-2, 2), rnd.uniform(-2, 2));
        const GeVector2<double> v2(rnd.uniform(-2, 2), rnd.uniform(-2, 2));
        EXPECT_LT(((ma * mb) * v2 - ma * (mb * v2)).length(), 1e-12);
    }
}

TEST(GeMatrixTest, InverseTimesMatrixIsIdentity) {
    GeTest::Random rnd(22);
    const GeAffineMatrix3<double> identity;
    for (int i = 0; i < 300; ++i) {
        const auto a = rnd.wellConditionedAffine<float>();
        const auto inv = a.computeInverse();
        EXPECT_LT(maxDifference(inv * a, GeAffineMatrix3<float>(), 3, 4), 2e-5) << a;
        EXPECT_LT(maxDifference(a * inv, GeAffineMatrix3<float>(), 3, 4), 2e-5) << a;
        EXPECT_EQ(inv(3, 0), 0.0F);
        EXPECT_EQ(inv(3, 3), 1.0F);

        const auto ad = rnd.wellConditionedAffine<double>();
        EXPECT_LT(maxDifference(ad.computeInverse() * ad, identity, 4, 4), 1e-12);

        const auto l = a.getLinear();
        EXPECT_LT(maxDifference(l.computeInverse() * l, GeLinearMatrix3<float>(), 3, 3), 2e-5);

        const auto p = randomProjective(rnd);
        const auto pinv = p.computeInverse();
        EXPECT_LT(maxDifference(pinv * p, GeProjectiveMatrix3<double>(), 4, 4), 1e-11) << p;
        EXPECT_LT(maxDifference(p * pinv, GeProjectiveMatrix3<double>(), 4, 4), 1e-11) << p;
        // A fully general matrix, kept away from singularity by a dominant diagonal.
        GeProjectiveMatrix3<double> g;
        for (int r = 0; r < 4; ++r)
            for (int c = 0; c < 4; ++c) g(r, c) = rnd.uniform(-1, 1) + (r == c ? 5.0 : 0.0);
        EXPECT_LT(maxDifference(g.computeInverse() * g, GeProjectiveMatrix3<double>(), 4, 4), 1e-12) << g;

        GeLinearMatrix2<double> m2;
        for (int r = 0; r < 2; ++r)
            for (int c = 0; c < 2; ++c) m2(r, c) = rnd.uniform(-1, 1) + (r == c ? 3.0 : 0.0);
        EXPECT_LT(maxDifference(m2.computeInverse() * m2, GeLinearMatrix2<double>(), 2, 2), 1e-14);
    }
}

TEST(GeMatrixTest, DeterminantsMatchClosedForms) {
    GeTest::Random rnd(23);
    for (int i = 0; i < 100; ++i) {
        const double sx = rnd.uniform(0.5, 2), sy = rnd.uniform(0.5, 2), sz = rnd.uniform(0.5, 2);
        const auto rot = GeAffineMatrix3<double>::makeRotation(rnd.direction<double>(), rnd.uniform(-3, 3));
        // Rotations have determinant 1 and keep lengths; scales multiply.
        EXPECT_NEAR(rot.computeDeterminant(), 1.0, 1e-12);
        const auto v = rnd.vector<double>(-3, 3);
        EXPECT_NEAR(rot.transformVector(v).length(), v.length(), 1e-12);
        const auto m = rot * GeAffineMatrix3<double>::makeScale(sx, sy, sz);
        EXPECT_NEAR(m.computeDeterminant(), sx * sy * sz, 1e-12);
        // det(a * b) = det(a) * det(b) for general 4 by 4 matrices.
        const auto pa = randomProjective(rnd);
        const auto pb = randomProjective(rnd);
        EXPECT_NEAR((pa * pb).computeDeterminant(), pa.computeDeterminant() * pb.computeDeterminant(),
                    1e-9 * std::fabs(pa.computeDeterminant() * pb.computeDeterminant()) + 1e-12);
        // Projective determinant of an embedded affine matrix equals the affine one; transposing
        // keeps it.
        EXPECT_NEAR(GeProjectiveMatrix3<double>(m).computeDeterminant(), sx * sy * sz, 1e-12);
        EXPECT_NEAR(pa.getTransposed().computeDeterminant(), pa.computeDeterminant(), 1e-12);
    }
    EXPECT_EQ(GeLinearMatrix2<double>(1, 2, 3, 4).computeDeterminant(), -2.0);
    EXPECT_EQ(GeLinearMatrix3<float>(2, 0, 0, 0, 3, 0, 1, 1, 4).computeDeterminant(), 24.0F);
    // A known rotation: a quarter turn about z takes x to y.
    const auto quarter = GeAffineMatrix3<double>::makeRotation({0, 0, 2}, std::acos(0.0));
    const auto y = quarter.transformVector({1, 0, 0});
    EXPECT_NEAR(y.x, 0.0, 1e-15);
    EXPECT_NEAR(y.y, 1.0, 1e-15);
}

TEST(GeMatrixTest, MulOnRightOfTheInverseKeepsNormalsPerpendicularToTangents) {
    GeTest::Random rnd(24);
    for (int i = 0; i < 500; ++i) {
        const auto m = rnd.wellConditionedAffine<float>();
        const auto normalMatrix = m.computeInverse();
        const auto n = rnd.direction<float>();
        // Two tangents spanning the plane perpendicular to n.
        const auto t1 = n.cross(rnd.direction<float>());
        if (t1.length() < 0.1F) continue;
        const auto t2 = n.cross(t1);
        const auto nT = normalMatrix.mulOnRight(n);
        const auto t1T = m.transformVector(t1);
        const auto t2T = m.transformVector(t2);
        EXPECT_NEAR(nT.dot(t1T) / (nT.length() * t1T.length()), 0.0F, 2e-5F);
        EXPECT_NEAR(nT.dot(t2T) / (nT.length() * t2T.length()), 0.0F, 2e-5F);
        // mulOnRight is the row vector times the linear part: the transpose applied normally.
        const auto viaTranspose = normalMatrix.getLinear().getTransposed() * n;
        EXPECT_LT((nT - viaTranspose).length(), 1e-5F);
        EXPECT_LT((normalMatrix.getLinear().mulOnRight(n) - nT).length(), 1e-6F);
    }
    // The translation plays no part.
    const auto t = GeAffineMatrix3<float>::makeTranslation({5, 6, 7});
    EXPECT_EQ(t.mulOnRight({1, 2, 3}), GeVector3<float>(1, 2, 3));
}

TEST(GeMatrixTest, ScalesCombineIntoEitherMatrixType) {
    const GeScale3<float> a(2, 3, 4);
    const GeScale3<float> b(0.5F, -1, 10);
    const GeAffineMatrix3<float> affine = a * b;
    const GeProjectiveMatrix3<float> projective = a * b;
    const float factors[3] = {1, -3, 40};
    for (int r = 0; r < 4; ++r) {
        for (int c = 0; c < 4; ++c) {
            const float expected = r != c ? 0.0F : (r == 3 ? 1.0F : factors[r]);
            EXPECT_EQ(affine(r, c), expected) << r << ' ' << c;
            EXPECT_EQ(projective(r, c), expected) << r << ' ' << c;
        }
    }
    // Mixed with other matrices: the scale applies first when on the right.
    const auto t = GeAffineMatrix3<float>::makeTranslation({1, 1, 1});
    EXPECT_EQ((t * a).transformPoint({1, 1, 1}), GePoint3<float>(3, 4, 5));
    EXPECT_EQ((a * t).transformPoint({1, 1, 1}), GePoint3<float>(4, 6, 8));
    const auto h = (GeProjectiveMatrix3<float>() * (a * b)).transform(GePoint3<float>(1, 1, 1));
    EXPECT_EQ(GePoint3<float>(h.x, h.y, h.z), GePoint3<float>(1, -3, 40));
    EXPECT_EQ(a * a.computeInverse(), GeScale3<float>(1, 1, 1));
}

}  // namespace
}  // namespace Zr
