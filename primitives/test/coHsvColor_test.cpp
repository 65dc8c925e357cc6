#include <gtest/gtest.h>

#include <cmath>

#include "coHsvColor.h"

namespace Zr {
namespace {

using Rgb = CoRgbColorTyped<float>;

TEST(CoHsvColorTest, KnownColoursHaveTheirHexconeCoordinates) {
    struct Case {
        Rgb rgb;
        CoHsvColor hsv;
    };
    const Case cases[] = {
        {{1, 0, 0}, {0, 1, 1}},        {{1, 1, 0}, {60, 1, 1}},         {{0, 1, 0}, {120, 1, 1}},
        {{0, 1, 1}, {180, 1, 1}},      {{0, 0, 1}, {240, 1, 1}},        {{1, 0, 1}, {300, 1, 1}},
        {{0.5F, 0.5F, 0.5F}, {0, 0, 0.5F}}, {{0, 0, 0}, {0, 0, 0}},    {{1, 0.5F, 0}, {30, 1, 1}},
        {{0.5F, 0.25F, 0.25F}, {0, 0.5F, 0.5F}}, {{0.2F, 0.4F, 0.8F}, {220, 0.75F, 0.8F}},
        {{2, 1, 1}, {0, 0.5F, 2}},     {{1, 0, 0.5F}, {330, 1, 1}},
    };
    for (const Case& c : cases) {
        const CoHsvColor hsv = CoHsvColor::convertFromRgb(c.rgb);
        EXPECT_NEAR(hsv.h, c.hsv.h, 1e-4F) << c.rgb;
        EXPECT_NEAR(hsv.s, c.hsv.s, 1e-6F) << c.rgb;
        EXPECT_NEAR(hsv.v, c.hsv.v, 1e-6F) << c.rgb;
        const Rgb back = c.hsv.convertToRgb();
        EXPECT_NEAR(back.r, c.rgb.r, 1e-6F) << c.hsv;
        EXPECT_NEAR(back.g, c.rgb.g, 1e-6F) << c.hsv;
        EXPECT_NEAR(back.b, c.rgb.b, 1e-6F) << c.hsv;
    }
}

TEST(CoHsvColorTest, RoundTripOverAGridOfColours) {
    // Channels from 0 to 2 in steps of 0.125, values above 1 included since colours are not
    // clamped.
    int count = 0;
    for (int r = 0; r <= 16; ++r) {
        for (int g = 0; g <= 16; ++g) {
            for (int b = 0; b <= 16; ++b) {
                const Rgb rgb(r * 0.125F, g * 0.125F, b * 0.125F);
                const CoHsvColor hsv = CoHsvColor::convertFromRgb(rgb);
                ASSERT_GE(hsv.h, 0.0F) << rgb;
                ASSERT_LT(hsv.h, 360.0F) << rgb;
                ASSERT_GE(hsv.s, 0.0F) << rgb;
                ASSERT_LE(hsv.s, 1.0F) << rgb;
                ASSERT_EQ(hsv.v, rgb.getMax()) << rgb;
                const Rgb back = hsv.convertToRgb();
                const float tol = 2e-6F * (1 + rgb.getMax());
                ASSERT_NEAR(back.r, rgb.r, tol) << rgb;
                ASSERT_NEAR(back.g, rgb.g, tol) << rgb;
                ASSERT_NEAR(back.b, rgb.b, tol) << rgb;
                // Hue is taken modulo a full turn.
                const Rgb wrapped = CoHsvColor(hsv.h - 720.0F, hsv.s, hsv.v).convertToRgb();
                ASSERT_NEAR(wrapped.r, rgb.r, 1e-4F) << rgb;
                ASSERT_NEAR(wrapped.g, rgb.g, 1e-4F) << rgb;
                ASSERT_NEAR(wrapped.b, rgb.b, 1e-4F) << rgb;
                ++count;
            }
        }
    }
    EXPECT_EQ(count, 17 * 17 * 17);
}

}  // namespace
}  // namespace Zr
