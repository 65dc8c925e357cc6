// The uniform generator: its range, its fixed seed, and the evenness and independence of its
// values, tested by chi-square on single values and on consecutive pairs.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <set>
#include <vector>

#include "rnChiSquare.h"
#include "rnNumRecUniformRng.h"

namespace Zr {
namespace {

template <class T>
class RnNumRecUniformRngTest : public ::testing::Test {};
using Precisions = ::testing::Types<float, double>;
TYPED_TEST_SUITE(RnNumRecUniformRngTest, Precisions);

TYPED_TEST(RnNumRecUniformRngTest, ValuesLieInTheHalfOpenUnitInterval) {
    RnNumRecUniformRng<TypeParam> rng;
    TypeParam lowest = 1, highest = 0;
    for (int i = 0; i < 1000000; ++i) {
        const TypeParam v = rng.eval();
        ASSERT_GE(v, TypeParam(0));
        ASSERT_LT(v, TypeParam(1));
        lowest = std::min(lowest, v);
        highest = std::max(highest, v);
    }
    // A million draws come close to both ends.
    EXPECT_LT(lowest, TypeParam(1e-4));
    EXPECT_GT(highest, TypeParam(1 - 1e-4));
}

TYPED_TEST(RnNumRecUniformRngTest, ConversionOfExtremeBitsStaysBelowOne) {
    using R = RnNumRecUniformRng<TypeParam>;
    const int digits = std::numeric_limits<TypeParam>::digits;
    EXPECT_EQ(R::toUnitInterval(0), TypeParam(0));
    EXPECT_EQ(R::toUnitInterval(~std::uint64_t(0)), TypeParam(1) - std::ldexp(TypeParam(1), -digits));
    EXPECT_EQ(R::toUnitInterval(std::uint64_t(1) << 63), TypeParam(0.5));
    // Bits below the mantissa's reach do not round the value up.
    EXPECT_EQ(R::toUnitInterval((std::uint64_t(1) << (64 - digits)) - 1), TypeParam(0));
}

TYPED_TEST(RnNumRecUniformRngTest, EveryGeneratorRepeatsTheSameSequence) {
    RnNumRecUniformRng<TypeParam> a, b;
    std::vector<TypeParam> first;
    for (int i = 0; i < 1000; ++i) first.push_back(a.eval());
    for (int i = 0; i < 1000; ++i) ASSERT_EQ(b(), first[i]) << i;  // operator() is eval()
    // A copy continues from where the original stands.
    RnNumRecUniformRng<TypeParam> c = a;
    for (int i = 0; i < 100; ++i) ASSERT_EQ(c.eval(), a.eval());
    // Through the abstract face, as consumers use it.
    RnNumRecUniformRng<TypeParam> d;
    RnRng<TypeParam>& asBase = d;
    EXPECT_EQ(asBase(), first[0]);
    EXPECT_EQ(asBase.eval(), first[1]);
}

TYPED_TEST(RnNumRecUniformRngTest, SequenceDoesNotRepeatQuickly) {
    RnNumRecUniformRng<TypeParam> rng;
    std::set<TypeParam> seen;
    const int n = 100000;
    for (int i = 0; i < n; ++i) seen.insert(rng.eval());
    // Float has 2^24 possible values; 10^5 draws collide in roughly 300 pairs by chance.
    EXPECT_GT(static_cast<int>(seen.size()), n - 1000);
}

TYPED_TEST(RnNumRecUniformRngTest, ValuesAreEvenlySpreadOverTheInterval) {
    RnNumRecUniformRng<TypeParam> rng;
    const int nbCells = 200;
    const int nbDraws = 200000;
    std::vector<double> observed(nbCells, 0.0);
    double sum = 0.0;
    for (int i = 0; i < nbDraws; ++i) {
        const TypeParam v = rng.eval();
        sum += v;
        observed[static_cast<int>(v * nbCells)] += 1.0;
    }
    const std::vector<double> expected(nbCells, double(nbDraws) / nbCells);
    EXPECT_LT(RnTest::chiSquare(observed, expected), RnTest::chiSquareCritical999(nbCells - 1));
    // The mean of uniform values has standard deviation sqrt(1/12/n), about 0.00065 here.
    EXPECT_NEAR(sum / nbDraws, 0.5, 0.004);
}

TYPED_TEST(RnNumRecUniformRngTest, ConsecutiveValuesAreIndependent) {
    // Pairs of successive values must fill the unit square evenly; a generator whose next value
    // leans on the previous one crowds some cells.
    RnNumRecUniformRng<TypeParam> rng;
    const int side = 16;
    const int nbPairs = 128000;
    std::vector<double> observed(side * side, 0.0);
    TypeParam previous = rng.eval();
    for (int i = 0; i < nbPairs; ++i) {
        const TypeParam next = rng.eval();
        observed[static_cast<int>(previous * side) * side + static_cast<int>(next * side)] += 1.0;
        previous = next;
    }
    const std::vector<double> expected(side * side, double(nbPairs) / (side * side));
    EXPECT_LT(RnTest::chiSquare(observed, expected), RnTest::chiSquareCritical999(side * side - 1));
}

TEST(RnChiSquareCritical, ApproximationMatchesTabulatedPercentiles) {
    // Published 99.9th percentiles; the tests above rely on the approximation being close.
    // The approximation errs high, by 3% at one degree and under 1% from ten degrees on.
    const double table[][3] = {{1, 10.828, 0.04}, {10, 29.588, 0.01}, {50, 86.661, 0.01},
                               {100, 149.449, 0.01}};
    for (const auto& [k, value, relative] : table) {
        const double critical = RnTest::chiSquareCritical999(static_cast<int>(k));
        EXPECT_GE(critical, value) << k;
        EXPECT_LE(critical, value * (1 + relative)) << k;
    }
}

}  // namespace
}  // namespace Zr
