#include <gtest/gtest.h>

#include "coRgbColorTyped.h"
#include "coRgbaColorTyped.h"

namespace Zr {
namespace {

TEST(CoRgbaColorTypedTest, ArithmeticIsComponentwiseOnEveryChannel) {
    // Distinct powers of two per channel catch channels swapped or left out.
    const CoRgbaColorTyped<float> a(1, 2, 4, 8);
    const CoRgbaColorTyped<float> b(16, 32, 64, 128);
    EXPECT_EQ(a + b, CoRgbaColorTyped<float>(17, 34, 68, 136));
    EXPECT_EQ(b - a, CoRgbaColorTyped<float>(15, 30, 60, 120));
    EXPECT_EQ(a * b, CoRgbaColorTyped<float>(16, 64, 256, 1024));
    EXPECT_EQ(a * 0.5F, CoRgbaColorTyped<float>(0.5F, 1, 2, 4));
    EXPECT_EQ(0.5F * a, a * 0.5F);
    EXPECT_EQ(b / 16.0F, CoRgbaColorTyped<float>(1, 2, 4, 8));
    CoRgbaColorTyped<float> c = a;
    c += b;
    c -= a;
    EXPECT_EQ(c, b);
    c *= a;
    EXPECT_EQ(c, a * b);
    c *= 2.0F;
    EXPECT_EQ(c, a * b * 2.0F);
    // No clamping: values beyond [0, 1] pass.
    EXPECT_EQ(CoRgbaColorTyped<float>(-1, 3, 0, 1) * 2.0F, CoRgbaColorTyped<float>(-2, 6, 0, 2));
}

TEST(CoRgbaColorTypedTest, RgbArithmeticAndExtremes) {
    const CoRgbColorTyped<float> a(1, 2, 4);
    const CoRgbColorTyped<float> b(16, 32, 64);
    EXPECT_EQ(a + b, CoRgbColorTyped<float>(17, 34, 68));
    EXPECT_EQ(b - a, CoRgbColorTyped<float>(15, 30, 60));
    EXPECT_EQ(a * b, CoRgbColorTyped<float>(16, 64, 256));
    EXPECT_EQ(a * 3.0F, CoRgbColorTyped<float>(3, 6, 12));
    // Largest and smallest channel for every order of three distinct values.
    const float v[3] = {0.25F, -1.0F, 7.0F};
    const int orders[6][3] = {{0, 1, 2}, {0, 2, 1}, {1, 0, 2}, {1, 2, 0}, {2, 0, 1}, {2, 1, 0}};
    for (const auto& o : orders) {
        const CoRgbColorTyped<float> c(v[o[0]], v[o[1]], v[o[2]]);
        EXPECT_EQ(c.getMax(), 7.0F) << c;
        EXPECT_EQ(c.getMin(), -1.0F) << c;
    }
}

}  // namespace
}  // namespace Zr
