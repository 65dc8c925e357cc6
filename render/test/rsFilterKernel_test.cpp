// Filter kernels: every kernel against a double-precision formula table over a grid, their
// supports, unknown types, and the first values inside their branch boundaries.
#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>
#include <tuple>
#include <vector>

#include "rsFilterKernel.h"

namespace Zr {
namespace {

using K = RsFilterKernel;

// The constants as their bit patterns define them, independent of the literals in the class.
const double bellRadius = std::bit_cast<float>(0x3fb04189u), bellKnee = std::bit_cast<float>(0x3ef837b5u);
const double bellDivisor = std::bit_cast<float>(0x3f9d416fu), bellSlope = std::bit_cast<float>(0x3fbfbd85u);
const double gaussScale = std::bit_cast<float>(0x3f4c422au);

// The ten kernels in double precision, of the pixel coordinates (box) or the distance from the
// pixel's centre (the others); unknown types weigh nothing.
double referenceWeight(int type, double x, double y) {
    const double r = std::hypot(x - 0.5, y - 0.5), r2 = r * r;
    switch (type) {
    case 0: return (x >= 1.0 || y >= 1.0) ? 0.0 : 1.0;
    case 1: return r < 1.0 ? 1.0 - r : 0.0;
    case 2:
        return r >= bellRadius ? 0.0 : r > bellKnee ? std::pow(bellRadius - r, 2) / bellDivisor : 1.0 - bellSlope * r2;
    case 3: return r < 0.5 ? 0.75 - r2 : r < 1.5 ? 0.5 * std::pow(r - 1.5, 2) : 0.0;
    case 4: return gaussScale * std::exp(-2.0 * r2);
    case 5: return std::exp2(-2.0 * r2);
    case 6: return std::exp2(-4.0 * r2);
    case 7: return r < 1.0 ? (3.0 * r * r2 - 6.0 * r2 + 4.0) / 6.0 : r < 2.0 ? std::pow(2.0 - r, 3) / 6.0 : 0.0;
    case 8: return r > 1.5 ? 0.0 : std::exp(-r2) - std::exp(-2.25);
    case 9: return r >= 2.0 ? 0.0 : r < 1.0 ? 3.0 - 1.5 * r2 : 1.5 * r2 - 6.0 * r + 6.0;
    }
    return 0.0;
}

// Samples on a dyadic grid that hits centres, edges and branch radii exactly, and on a non-dyadic
// one between them, both reaching two pixels beyond the centre pixel. Float rounding scales with
// the terms, not with a result that may cancel to nearly 0: the parabolic pair's terms reach 3.
TEST(RsFilterKernel, EveryKernelMatchesTheReferenceTableOverAGrid) {
    std::vector<float> coords;
    for (int i = -40; i <= 56; ++i) coords.push_back(static_cast<float>(i) / 16.0f);
    for (int i = 0; i <= 161; ++i) coords.push_back(-2.49f + 0.037f * static_cast<float>(i));
    const int support[K::nbKernelTypes] = {0, 1, 1, 1, 1, 1, 2, 2, 2, 2};
    for (int type : {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 1000, -1}) {
        const K kernel(static_cast<K::KernelType>(type));
        EXPECT_EQ(kernel.getKernelSupport(), type >= 0 && type < K::nbKernelTypes ? support[type] : 0) << type;
        const double tolerance = 16.0 * std::numeric_limits<float>::epsilon() * (type == 9 ? 3 : 1);
        int failures = 0;
        for (float x : coords)
            for (float y : coords) {
                const double expected = referenceWeight(type, x, y), actual = kernel.evaluateKernel(x, y);
                if (std::fabs(actual - expected) > tolerance && ++failures <= 5)
                    ADD_FAILURE() << "kernel " << type << " at (" << x << ", " << y << "): " << actual << " expected "
                                  << expected;
            }
        EXPECT_EQ(failures, 0) << "kernel " << type;
    }
}

// Values the grid's tolerance would let slip: the first float steps inside the radii where a kernel
// falls to 0, the two sides of the bell's knee and its radius, and the exact values at the centre.
TEST(RsFilterKernel, BranchBoundariesAndCentresAreExact) {
    auto in = [](float d) { return std::nextafter(0.5f + d, 0.0f); };  // 0.5 + d is exact for these d
    const float knee = std::floor(K::bellKnee * 0x1p24f) * 0x1p-24f;  // the last distance of the inner piece
    const double inner = 1.0 - bellSlope * knee * knee, outer = std::pow(bellRadius - knee - 0x1p-24, 2) / bellDivisor;
    const double eps = std::numeric_limits<float>::epsilon(), sixth = 1.0 / 6, tg = 1.0 - std::exp(-2.25);
    const std::tuple<K::KernelType, float, float, double, double> points[] = {
        {K::KernelBox, std::nextafter(1.0f, 0.0f), std::nextafter(1.0f, 0.0f), 1, 1},
        {K::KernelCone, in(1.0f), 0.5f, 1e-30, 1},
        {K::KernelBell, in(K::bellRadius), 0.5f, 1e-30, 1},
        {K::KernelBell, 0.5f + K::bellRadius, 0.5f, 0, 0},
        {K::KernelBell, 0.5f, 0.5f + K::bellRadius, 0, 0},
        {K::KernelBell, 0.5f + knee, 0.5f, inner - 1e-7, inner + 1e-7},
        {K::KernelBell, 0.5f + knee + 0x1p-24f, 0.5f, outer - 1e-7, outer + 1e-7},
        {K::KernelQuadraticBSpline, in(1.5f), 0.5f, 1e-30, 1},
        {K::KernelCubicBSpline, in(1.0f), 0.5f, sixth - 4 * eps * sixth, sixth + 4 * eps * sixth},
        {K::KernelTruncatedGaussian, 2.0f, 0.5f, -eps, eps},
        {K::KernelTruncatedGaussian, std::nextafter(2.0f, 3.0f), 0.5f, 0, 0},
        {K::KernelTruncatedGaussian, 0.5f, 0.5f, tg - 1e-6, tg + 1e-6},
        {K::KernelParabolicPair, in(1.0f), 0.5f, 1.5 - 1e-6, 1.5 + 1e-6},
        {K::KernelCone, 0.5f, 0.5f, 1, 1}, {K::KernelBell, 0.5f, 0.5f, 1, 1},
        {K::KernelQuadraticBSpline, 0.5f, 0.5f, 0.75, 0.75}, {K::KernelParabolicPair, 0.5f, 0.5f, 3, 3},
        {K::KernelPow2Narrow, 0.5f, 0.5f, 1, 1}, {K::KernelPow2Wide, 0.5f, 0.5f, 1, 1},
        {K::KernelGaussian, 0.5f, 0.5f, K::gaussianScale, K::gaussianScale},
        {K::KernelCubicBSpline, 0.5f, 0.5f, 4 * sixth - 4 * eps, 4 * sixth + 4 * eps},
    };
    for (const auto& [type, x, y, lo, hi] : points) {
        const double w = K(type).evaluateKernel(x, y);
        EXPECT_TRUE(w >= lo && w <= hi) << "kernel " << type << " at (" << x << ", " << y << "): " << w;
    }
}

}  // namespace
}  // namespace Zr
