// Channel conversions checked against closed-form references computed in double precision, which
// is exact for every value involved here.
#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>
#include <utility>
#include <vector>

#include "ixPixelConvert.h"

namespace Zr {
namespace {

// The value a half stands for: sign, 5-bit exponent biased by 15, 10-bit mantissa, subnormals
// at exponent 0. Exponent 31 counts as an ordinary exponent: no infinities or NaNs.
double halfValue(std::uint16_t h) {
    const int exponent = (h >> 10) & 31;
    const int mantissa = h & 1023;
    const double magnitude =
        exponent == 0 ? std::ldexp(mantissa, -24) : std::ldexp(1024 + mantissa, exponent - 25);
    return (h & 0x8000) ? -magnitude : magnitude;
}

// Float to half by arithmetic on the magnitude u:
// - u is first raised by 4096 units in the last place of the float (half a half-ulp for normal
//   halves);
// - in the normal half range the result is u rounded half-up to 11 significant bits, saturated
//   at 65504 (0x7bff), infinities and NaNs included;
// - below it, the raised magnitude y is written as M * 2^(be - 150) with M the 24-bit
//   significand including its leading one (also for float subnormals, be = 0), and the result is
//   M shifted right by ((17 - be) mod 32) + 13 bits. For be from 95 to 112 that is y in units of
//   2^-24 truncated; below that the shift wraps, so tiny floats do not become zero.
std::uint16_t referenceFloatToHalf(float f) {
    const std::uint16_t sign = std::signbit(f) ? 0x8000 : 0;
    if (std::isnan(f)) return sign | 0x7bff;
    const double u = std::fabs(static_cast<double>(f));
    int ex = 0;
    std::frexp(u, &ex);  // u = fraction * 2^ex with the fraction in [0.5, 1)
    const int floatExponent = u == 0.0 ? 0 : ex + 126;
    const double ulp = std::ldexp(1.0, (floatExponent < 1 ? 1 : floatExponent) - 150);
    const double y = u + 4096.0 * ulp;

    if (y >= std::ldexp(1.0, -14)) {
        if (std::isinf(u)) return sign | 0x7bff;
        const int e = std::max(ex - 1, -14);  // floor(log2 u), at least the smallest normal
        const double q = std::floor(std::ldexp(u, 10 - e) + 0.5);
        const double code = (e + 15) * 1024.0 + (q - 1024.0);
        return static_cast<std::uint16_t>(sign | (code > 0x7bff ? 0x7bff : static_cast<int>(code)));
    }
    int ey = 0;
    std::frexp(y, &ey);
    const int be = y < std::ldexp(1.0, -126) ? 0 : ey + 126;
    const double m = be == 0 ? std::ldexp(y, 149) + 8388608.0 : std::ldexp(y, 150 - be);
    const int shift = (((17 - be) % 32) + 32) % 32 + 13;
    return static_cast<std::uint16_t>(sign | static_cast<int>(std::floor(std::ldexp(m, -shift))));
}

float floatFromBits(std::uint32_t bits) { return std::bit_cast<float>(bits); }

TEST(IxPixelConvertHalf, EveryHalfReadsAsItsValueAndFiniteOnesComeBack) {
    for (std::uint32_t h = 0; h <= 0xffff; ++h) {
        const auto half = static_cast<std::uint16_t>(h);
        const float f = IxPixelConvert::halfToFloat(half);
        ASSERT_EQ(static_cast<double>(f), halfValue(half)) << std::hex << h;
        ASSERT_EQ(std::signbit(f), (h & 0x8000) != 0) << std::hex << h;
        // Exponent 31 read as a large float saturates on the way back.
        const bool exponent31 = ((h >> 10) & 31) == 31;
        ASSERT_EQ(IxPixelConvert::floatToHalf(f), exponent31 ? (h & 0x8000) | 0x7bff : h) << std::hex << h;
    }
}

TEST(IxPixelConvertHalf, FloatToHalfMatchesTheReferenceOverSampledFloats) {
    std::vector<std::uint32_t> bits;
    // A stride through every bit pattern, both signs, all exponents, NaNs and infinities.
    for (std::uint64_t b = 0; b <= 0xffffffffull; b += 4093) bits.push_back(static_cast<std::uint32_t>(b));
    // Each float exponent at the edges of its mantissa and around the rounding bit.
    for (std::uint32_t e = 0; e < 256; ++e) {
        for (std::uint32_t m : {0u, 1u, 2u, 0xfffu, 0x1000u, 0x1001u, 0x1fffu, 0x2000u, 0x3000u,
                                0x400000u, 0x7fefffu, 0x7ff000u, 0x7ffffeu, 0x7fffffu}) {
            bits.push_back(e << 23 | m);
            bits.push_back(0x80000000u | e << 23 | m);
        }
    }
    // The rounding boundary between each pair of neighbouring finite halves, and the halves
    // themselves, a few float ulps either side.
    for (std::uint32_t h = 0; h < 0x7c00; ++h) {
        const std::uint32_t low = std::bit_cast<std::uint32_t>(IxPixelConvert::halfToFloat(static_cast<std::uint16_t>(h)));
        const std::uint32_t high = std::bit_cast<std::uint32_t>(IxPixelConvert::halfToFloat(static_cast<std::uint16_t>(h + 1)));
        const std::uint32_t middle = low + (high - low) / 2;
        for (std::int32_t d = -2; d <= 2; ++d) {
            bits.push_back(static_cast<std::uint32_t>(static_cast<std::int32_t>(middle) + d));
            if (low >= 2) bits.push_back(static_cast<std::uint32_t>(static_cast<std::int32_t>(low) + d));
        }
    }
    // All float subnormals near the bottom and a dense run across the half subnormal range.
    for (std::uint32_t b = 0; b < 0x20000; ++b) bits.push_back(b);
    for (std::uint32_t b = 0x33000000; b < 0x38800000; b += 97) bits.push_back(b);
    // Around the largest half and the saturation threshold.
    for (std::uint32_t b = 0x477fd000; b < 0x47801000; ++b) bits.push_back(b);

    for (std::uint32_t b : bits) {
        const float f = floatFromBits(b);
        ASSERT_EQ(IxPixelConvert::floatToHalf(f), referenceFloatToHalf(f)) << std::hex << b;
    }
}

// The rules the reference encodes, pinned independently of it at a few points. (Floats that are
// exactly halves are pinned by the exhaustive round trip above.)
TEST(IxPixelConvertHalf, LandmarkValues) {
    struct Case {
        float value;
        std::uint16_t half;
    };
    const float inf = std::numeric_limits<float>::infinity();
    const Case cases[] = {
        {inf, 0x7bff}, {-inf, 0xfbff},  // saturation instead of infinity
        // 1 + 2^-11 lies half way between 1 and the next half: it rounds up, not to even.
        {1.0f + std::ldexp(1.0f, -11), 0x3c01},          {-(1.0f + std::ldexp(1.0f, -11)), 0xbc01},
        {1.0f + std::ldexp(1.0f, -11) - std::ldexp(1.0f, -23), 0x3c00},
        // No flush to zero: 2^-46 comes out as a small half rather than 0.
        {std::ldexp(1.0f, -46), 0x0400},
    };
    for (const Case& c : cases) {
        EXPECT_EQ(IxPixelConvert::floatToHalf(c.value), c.half) << c.value;
        EXPECT_EQ(IxPixelConvert::floatToHalf(c.value), referenceFloatToHalf(c.value)) << c.value;
    }
    EXPECT_EQ(IxPixelConvert::floatToHalf(std::numeric_limits<float>::quiet_NaN()), 0x7bff);
}

TEST(IxPixelConvertByte, ScaleConstantAndEveryByte) {
    EXPECT_EQ(std::bit_cast<std::uint32_t>(IxPixelConvert::BYTE_TO_FLOAT), 0x3b808081u);
    for (int b = 0; b <= 255; ++b) {
        const float f = IxPixelConvert::byteToFloat(static_cast<std::uint8_t>(b));
        EXPECT_NEAR(f, b / 255.0, 1e-7) << b;
        EXPECT_EQ(IxPixelConvert::floatToByte(f), b) << b;
    }
}

TEST(IxPixelConvertByte, FloatToByteRoundsToNearestAndClamps) {
    // Reference: round v * 255 to the nearest integer, halves up, and clamp. Only where v * 255
    // lies so close to a half-integer that float rounding may decide either way is either
    // neighbour accepted.
    int previous = 0;
    for (int i = -20000; i <= 300000; ++i) {
        const float v = static_cast<float>(i) / 262144.0f;  // exact steps of 2^-18
        const double t = static_cast<double>(v) * 255.0 + 0.5;
        const double clamped = std::min(255.0, std::max(0.0, std::floor(t)));
        const int got = IxPixelConvert::floatToByte(v);
        if (std::fabs(t - std::round(t)) < 1e-4) {
            EXPECT_LE(std::abs(got - static_cast<int>(clamped)), 1) << v;
        } else {
            EXPECT_EQ(got, static_cast<int>(clamped)) << v;
        }
        EXPECT_GE(got, previous) << v;  // monotonic
        previous = got;
    }
    const float inf = std::numeric_limits<float>::infinity();
    // 0.5 gives 128.0 exactly: halves round up. NaN gives 0.
    for (auto [v, b] : {std::pair{-inf, 0}, {inf, 255}, {1e30f, 255}, {-1e30f, 0}, {0.5f, 128},
                        {std::numeric_limits<float>::quiet_NaN(), 0}})
        EXPECT_EQ(IxPixelConvert::floatToByte(v), b) << v;
}

}  // namespace
}  // namespace Zr
