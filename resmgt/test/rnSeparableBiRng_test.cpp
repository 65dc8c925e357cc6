// Pairs of uniform values: they come from the source in order, x first, and cover the unit
// square evenly, so that lens offsets fill their square.
#include <gtest/gtest.h>

#include <vector>

#include "exBase.h"
#include "rnNumRecUniformRng.h"
#include "rnSeparableBiRng.h"
#include "rnTestSupport.h"

namespace Zr {
namespace {

TEST(RnSeparableBiRng, TakesTwoConsecutiveValuesXFirst) {
    RnTest::ScriptedRng<float> script({0.125f, 0.75f, 0.5f, 0.0f});
    RnSeparableBiRng<float> pairs(&script);
    float x = -1, y = -1;
    for (const auto& [wantX, wantY] : {std::pair{0.125f, 0.75f}, std::pair{0.5f, 0.0f}}) {
        pairs.getSample(x, y);
        EXPECT_EQ(x, wantX);
        EXPECT_EQ(y, wantY);
    }
    EXPECT_EQ(script.getNbDrawn(), 4u);
    EXPECT_THROW(RnSeparableBiRng<float>(nullptr), ExAssertionFailed);
}

TEST(RnSeparableBiRng, PairsFillTheUnitSquareEvenly) {
    RnNumRecUniformRng<float> uniform;
    RnSeparableBiRng<float> pairs(&uniform);
    const int side = 12, nbPairs = 72000;
    std::vector<double> observed(side * side, 0.0);
    for (int i = 0; i < nbPairs; ++i) {
        float x, y;
        pairs.getSample(x, y);
        ASSERT_TRUE(x >= 0.0f && x < 1.0f && y >= 0.0f && y < 1.0f) << x << " " << y;
        observed[static_cast<int>(x * side) * side + static_cast<int>(y * side)] += 1;
    }
    const std::vector<double> expected(side * side, double(nbPairs) / (side * side));
    EXPECT_LT(RnTest::chiSquare(observed, expected), RnTest::chiSquareCritical999(side * side - 1));
}

}  // namespace
}  // namespace Zr
