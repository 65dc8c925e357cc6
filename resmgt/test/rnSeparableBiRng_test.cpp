// Pairs of uniform values: they come from the source in order, x first, and cover the unit
// square evenly (chi-square over a grid), so that lens offsets fill their square.
#include <gtest/gtest.h>

#include <vector>

#include "exBase.h"
#include "rnChiSquare.h"
#include "rnNumRecUniformRng.h"
#include "rnScriptedRng.h"
#include "rnSeparableBiRng.h"

namespace Zr {
namespace {

TEST(RnSeparableBiRng, TakesTwoConsecutiveValuesXFirst) {
    RnTest::ScriptedRng<float> script({0.125f, 0.75f, 0.5f, 0.0f});
    RnSeparableBiRng<float> pairs(&script);
    float x = -1, y = -1;
    pairs.getSample(x, y);
    EXPECT_EQ(x, 0.125f);
    EXPECT_EQ(y, 0.75f);
    pairs.getSample(x, y);
    EXPECT_EQ(x, 0.5f);
    EXPECT_EQ(y, 0.0f);
    EXPECT_EQ(script.getNbDrawn(), 4u);
}

TEST(RnSeparableBiRng, PairsFillTheUnitSquareEvenly) {
    RnNumRecUniformRng<float> uniform;
    RnSeparableBiRng<float> pairs(&uniform);
    const int side = 12;
    const int nbPairs = 72000;
    std::vector<double> observed(side * side, 0.0);
    for (int i = 0; i < nbPairs; ++i) {
        float x, y;
        pairs.getSample(x, y);
        ASSERT_GE(x, 0.0f);
        ASSERT_LT(x, 1.0f);
        ASSERT_GE(y, 0.0f);
        ASSERT_LT(y, 1.0f);
        observed[static_cast<int>(x * side) * side + static_cast<int>(y * side)] += 1;
    }
    const std::vector<double> expected(side * side, double(nbPairs) / (side * side));
    EXPECT_LT(RnTest::chiSquare(observed, expected), RnTest::chiSquareCritical999(side * side - 1));
}

TEST(RnSeparableBiRng, SameSourceSequenceGivesSamePairs) {
    RnNumRecUniformRng<double> u1, u2;
    RnSeparableBiRng<double> a(&u1), b(&u2);
    for (int i = 0; i < 500; ++i) {
        double ax, ay, bx, by;
        a.getSample(ax, ay);
        b.getSample(bx, by);
        ASSERT_EQ(ax, bx);
        ASSERT_EQ(ay, by);
        ASSERT_NE(ax, ay);
    }
}

TEST(RnSeparableBiRng, MissingSourceIsAnAssertionFailure) {
    EXPECT_THROW(RnSeparableBiRng<float>(nullptr), ExAssertionFailed);
}

}  // namespace
}  // namespace Zr
