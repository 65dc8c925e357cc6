// The relative float tolerance that gates weights, opaque alphas and additions.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "rsTolerance.h"

namespace Zr {
namespace {

// The tolerance against a constant: within one epsilon scaled by the larger magnitude, decided as
// the float sum from the smaller side reaching the larger value; an infinite magnitude gives no
// tolerance; NaN equals nothing.
TEST(RsTolerance, ComparesWithinScaledEpsilon) {
    const float inf = std::numeric_limits<float>::infinity();
    const float nan = std::numeric_limits<float>::quiet_NaN();
    const float up1 = std::nextafter(1.0f, 2.0f), up2 = std::nextafter(up1, 2.0f);
    const float down1 = std::nextafter(1.0f, 0.0f), down2 = std::nextafter(down1, 0.0f);
    struct Case {
        float v, c;
        bool equal;
    };
    const Case cases[] = {
        {1.0f, 1.0f, true},        {1.0000001f, 1.0f, true}, {up1, 1.0f, true},
        {up2, 1.0f, false},        {down1, 1.0f, true},      {down2, 1.0f, true},
        {0.9999997f, 1.0f, false}, {1.5f, 1.0f, false},      {0.5f, 1.0f, false},
        {inf, 1.0f, false},        {-inf, 1.0f, false},      {nan, 1.0f, false},
        {0.0f, 0.0f, true},        {-0.0f, 0.0f, true},      {1e-38f, 0.0f, false},
        {-1e-38f, 0.0f, false},    {1e-45f, 0.0f, false},    {inf, 0.0f, false},
        {nan, 0.0f, false},        {1000.0f, 1000.0001f, true}, {1000.0f, 1000.001f, false},
    };
    for (const Case& k : cases) {
        EXPECT_EQ(RsTolerance::isEqual(k.v, k.c), k.equal) << k.v << " vs " << k.c;
        if (k.c == 1.0f) {
            EXPECT_EQ(RsTolerance::isOne(k.v), k.equal) << k.v;
        }
        if (k.c == 0.0f) {
            EXPECT_EQ(RsTolerance::isZero(k.v), k.equal) << k.v;
        }
    }
}

}  // namespace
}  // namespace Zr
