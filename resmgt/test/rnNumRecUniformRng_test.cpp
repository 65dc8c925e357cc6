// The uniform generator: its half-open range, the conversion of extreme bits, its fixed seed, and
// the evenness and independence of its values by chi-square on single values and on pairs.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <set>
#include <vector>

#include "rnNumRecUniformRng.h"
#include "rnTestSupport.h"

namespace Zr {
namespace {

template <class T>
class RnNumRecUniformRngTest : public ::testing::Test {};
using Precisions = ::testing::Types<float, double>;
TYPED_TEST_SUITE(RnNumRecUniformRngTest, Precisions);

TYPED_TEST(RnNumRecUniformRngTest, ValuesLieInTheHalfOpenUnitIntervalEvenFromExtremeBits) {
    using T = TypeParam;
    using R = RnNumRecUniformRng<T>;
    const int digits = std::numeric_limits<T>::digits;
    EXPECT_EQ(R::toUnitInterval(0), T(0));
    EXPECT_EQ(R::toUnitInterval(~std::uint64_t(0)), T(1) - std::ldexp(T(1), -digits));
    EXPECT_EQ(R::toUnitInterval(std::uint64_t(1) << 63), T(0.5));
    // Bits below the mantissa's reach do not round the value up.
    EXPECT_EQ(R::toUnitInterval((std::uint64_t(1) << (64 - digits)) - 1), T(0));

    R rng;
    T lowest = 1, highest = 0;
    std::set<T> distinct;
    for (int i = 0; i < 1000000; ++i) {
        const T v = rng.eval();
        ASSERT_GE(v, T(0));
        ASSERT_LT(v, T(1));
        lowest = std::min(lowest, v);
        highest = std::max(highest, v);
        if (i < 100000) distinct.insert(v);
    }
    EXPECT_LT(lowest, T(1e-4));  // a million draws come close to both ends
    EXPECT_GT(highest, T(1 - 1e-4));
    // A short period would repeat; float's 2^24 values collide in about 300 pairs by chance.
    EXPECT_GT(static_cast<int>(distinct.size()), 100000 - 1000);
}

TYPED_TEST(RnNumRecUniformRngTest, EveryGeneratorRepeatsTheSameSequenceAndCopiesContinueIt) {
    RnNumRecUniformRng<TypeParam> a, b;
    std::vector<TypeParam> first;
    for (int i = 0; i < 1000; ++i) first.push_back(a.eval());
    RnRng<TypeParam>& asBase = b;  // as consumers use it
    for (int i = 0; i < 1000; ++i) ASSERT_EQ(asBase(), first[i]) << i;
    RnNumRecUniformRng<TypeParam> c = a;
    for (int i = 0; i < 100; ++i) ASSERT_EQ(c.eval(), a.eval());
}

TYPED_TEST(RnNumRecUniformRngTest, ValuesAndConsecutivePairsAreEvenlySpread) {
    RnNumRecUniformRng<TypeParam> rng;
    const int nbCells = 200, nbDraws = 200000;
    std::vector<double> observed(nbCells, 0.0);
    double sum = 0.0;
    for (int i = 0; i < nbDraws; ++i) {
        const TypeParam v = rng.eval();
        sum += v;
        observed[static_cast<int>(v * nbCells)] += 1.0;
    }
    EXPECT_LT(RnTest::chiSquare(observed, std::vector<double>(nbCells, double(nbDraws) / nbCells)),
              RnTest::chiSquareCritical999(nbCells - 1));
    EXPECT_NEAR(sum / nbDraws, 0.5, 0.004);  // standard deviation sqrt(1/12/n), about 0.00065

    // A generator whose next value leans on the previous one crowds some cells of the square.
    const int side = 16, nbPairs = 128000;
    std::vector<double> pairs(side * side, 0.0);
    TypeParam previous = rng.eval();
    for (int i = 0; i < nbPairs; ++i) {
        const TypeParam next = rng.eval();
        pairs[static_cast<int>(previous * side) * side + static_cast<int>(next * side)] += 1.0;
        previous = next;
    }
    EXPECT_LT(RnTest::chiSquare(pairs, std::vector<double>(side * side, double(nbPairs) / (side * side))),
              RnTest::chiSquareCritical999(side * side - 1));
}

}  // namespace
}  // namespace Zr
