#include <gtest/gtest.h>

#include <cmath>

#include "exBase.h"
#include "floatUtil.h"
#include "rational.h"

namespace Zr {
namespace {

TEST(FloatUtilTest, ToleranceIsEpsilonScaledByTheLargerMagnitude) {
    const float eps = 1.1920929e-07F;
    struct Case {
        float a, b;
        bool equal;
    };
    const Case cases[] = {
        {1.0F, 1.0F, true},
        {1.0F, std::nextafter(1.0F, 2.0F), true},            // one step above 1 is exactly eps
        {1.0F, 1.0F + 3 * eps, false},
        {1e6F, 1e6F + 0.0625F, true},                        // 0.0625 < 1e6 * eps = 0.119
        {1e6F, 1e6F + 0.25F, false},
        {1e-20F, 1e-20F * (1 + eps / 2), true},              // relative: tiny values are fine
        {0.0F, 1e-30F, false},                               // nothing but 0 equals 0
        {0.0F, 0.0F, true},
        {-0.0F, 0.0F, true},
        {-2.0F, 2.0F, false},
        {-3.0F, std::nextafter(-3.0F, -4.0F), true},         // one step is 2 eps, within 3 eps
    };
    for (const Case& c : cases) {
        EXPECT_EQ(FloatUtil::isEqual(c.a, c.b), c.equal) << c.a << " vs " << c.b;
        EXPECT_EQ(FloatUtil::isEqual(c.b, c.a), c.equal) << "symmetry " << c.a << " vs " << c.b;
        EXPECT_EQ(FloatUtil::isGreater(std::fmax(c.a, c.b), std::fmin(c.a, c.b)), !c.equal) << c.a;
        EXPECT_FALSE(FloatUtil::isLess(std::fmax(c.a, c.b), std::fmin(c.a, c.b)));
    }
    EXPECT_TRUE(FloatUtil::isEqual(100.0, 101.0, 0.01));
    EXPECT_FALSE(FloatUtil::isEqual(100.0, 102.0, 0.01));
}

TEST(FloatUtilTest, FailedFloatAssertionJoinsItsTexts) {
    // The checking macro passes a clear margin and fails within the tolerance, with the texts
    // of the condition joined into one message.
    const Rational good(4, 3);
    const Rational zero(0, 5);
    const auto assertGreater = [](float value, float other) { ZR_ASSERT_FLOAT_GREATER_AT(value, other, "f", 1); };
    EXPECT_NO_THROW(assertGreater(good.getFloat(), 0.F));
    try {
        ZR_ASSERT_FLOAT_GREATER_AT(zero.getFloat(), 0.F, "f", 7);
        FAIL() << "did not throw";
    } catch (const ExAssertionFailed& e) {
        EXPECT_EQ(e.getMessage(), "zero.getFloat() is greater than 0.F");
        EXPECT_EQ(e.getLine(), 7);
    }
    EXPECT_THROW(assertGreater(1.0F, std::nextafter(1.0F, 0.0F)), ExAssertionFailed);
    EXPECT_THROW(assertGreater(-1.0F, 0.0F), ExAssertionFailed);
}

TEST(RationalTest, ValueAndEquality) {
    EXPECT_EQ(Rational(30000, 1001).getFloat(), 30000.0F / 1001.0F);
    EXPECT_EQ(Rational(-1, 4).getDouble(), -0.25);
    EXPECT_EQ(Rational(7).denominator, 1);
    EXPECT_EQ(Rational(1, 2), Rational(2, 4));
    EXPECT_NE(Rational(1, 2), Rational(2, 3));
    // Cross products beyond 32 bits do not overflow.
    EXPECT_EQ(Rational(2147483647, 2), Rational(2147483647, 2));
    EXPECT_NE(Rational(2147483647, 2147483646), Rational(2147483646, 2147483645));
}

}  // namespace
}  // namespace Zr
