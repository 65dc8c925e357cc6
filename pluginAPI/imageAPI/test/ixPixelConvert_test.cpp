// Channel conversions against closed forms computed in double precision, exact for every value
// involved here.
#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>

#include "ixPixelConvert.h"

namespace Zr {
namespace {

// Every half reads as the value its bits stand for (exponent 31 as an ordinary exponent, no
// infinities or NaNs); finite ones come back, exponent 31 saturates.
TEST(IxPixelConvertHalf, EveryHalfReadsAsItsValueAndFiniteOnesComeBack) {
    for (std::uint32_t h = 0; h <= 0xffff; ++h) {
        const int exponent = (h >> 10) & 31, mantissa = h & 1023;
        const double magnitude = exponent == 0 ? std::ldexp(mantissa, -24) : std::ldexp(1024 + mantissa, exponent - 25);
        const float f = IxPixelConvert::halfToFloat(static_cast<std::uint16_t>(h));
        ASSERT_EQ(static_cast<double>(f), (h & 0x8000) ? -magnitude : magnitude) << std::hex << h;
        ASSERT_EQ(std::signbit(f), (h & 0x8000) != 0) << std::hex << h;
        ASSERT_EQ(IxPixelConvert::floatToHalf(f), exponent == 31 ? (h & 0x8000) | 0x7bff : h) << std::hex << h;
    }
}

// Float to half away from exact halves: rounding half-up in magnitude (not to even), saturation at
// the largest half instead of infinity, truncation below the smallest normal half, and no flush of
// tiny magnitudes to zero.
TEST(IxPixelConvertHalf, LandmarkValues) {
    const float inf = std::numeric_limits<float>::infinity(), tie = 1.0f + std::ldexp(1.0f, -11);
    const struct {
        float value;
        std::uint16_t half;
    } cases[] = {
        {inf, 0x7bff}, {-inf, 0xfbff}, {std::nanf(""), 0x7bff}, {65520.0f, 0x7bff}, {1e30f, 0x7bff},
        {tie, 0x3c01}, {-tie, 0xbc01}, {tie - std::ldexp(1.0f, -23), 0x3c00},
        {std::ldexp(1.75f, -24), 0x0001}, {std::ldexp(1.75f, -15), 0x0380},
        {std::ldexp(1.0f, -46), 0x0400},
    };
    for (const auto& c : cases) EXPECT_EQ(IxPixelConvert::floatToHalf(c.value), c.half) << c.value;
}

// Every byte reads as b / 255 and comes back; floats round v * 255 to the nearest byte, halves up,
// monotonically, clamped, NaN to 0. Where v * 255 lies so close to a half-integer that float
// rounding may decide either way, either neighbour is accepted.
TEST(IxPixelConvertByte, BytesReadAsTheirFractionAndFloatsRoundToTheNearestClampedByte) {
    for (int b = 0; b <= 255; ++b) {
        const float f = IxPixelConvert::byteToFloat(static_cast<std::uint8_t>(b));
        EXPECT_NEAR(f, b / 255.0, 1e-7) << b;
        EXPECT_EQ(IxPixelConvert::floatToByte(f), b) << b;
    }
    int previous = 0;
    for (int i = -20000; i <= 300000; ++i) {
        const float v = static_cast<float>(i) / 262144.0f;  // exact steps of 2^-18
        const double t = static_cast<double>(v) * 255.0 + 0.5;
        const int want = static_cast<int>(std::clamp(std::floor(t), 0.0, 255.0)), got = IxPixelConvert::floatToByte(v);
        EXPECT_LE(std::abs(got - want), std::fabs(t - std::round(t)) < 1e-4 ? 1 : 0) << v;
        EXPECT_GE(got, previous) << v;
        previous = got;
    }
    const float inf = std::numeric_limits<float>::infinity();
    for (auto [v, b] : {std::pair{-inf, 0}, {inf, 255}, {1e30f, 255}, {-1e30f, 0}, {0.5f, 128}, {std::nanf(""), 0}})
        EXPECT_EQ(IxPixelConvert::floatToByte(v), b) << v;
}

}  // namespace
}  // namespace Zr
