// Filter kernels: every kernel against a double-precision formula table over a grid, their
// supports, unknown types, and the values on both sides of every branch boundary.
#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>
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
    case 2: return r >= bellRadius ? 0.0 : r > bellKnee ? std::pow(bellRadius - r, 2) / bellDivisor : 1.0 - bellSlope * r2;
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
                    ADD_FAILURE() << "kernel " << type << " at (" << x << ", " << y << "): " << actual << " expected " << expected;
            }
        EXPECT_EQ(failures, 0) << "kernel " << type;
    }
}

// Each value at a branch boundary, or one float step inside it, lies in its range [lo, hi].
// Distances d that 0.5 + d holds exactly give the kernel the distance d itself.
TEST(RsFilterKernel, BranchBoundariesTakeTheirSide) {
    const float eps = std::numeric_limits<float>::epsilon(), tiny = std::numeric_limits<float>::denorm_min();
    auto below = [](float v) { return std::nextafter(v, 0.0f); };
    auto justInside = [&](float d) { return below(0.5f + d); };
    const float knee = std::floor(K::bellKnee * 0x1p24f) * 0x1p-24f;  // the last distance of the inner piece
    const double parabolic = 1.5 * 0.03125 * 0.03125;
    struct Point {
        K::KernelType type;
        float x, y;
        double lo, hi;
    };
    const Point points[] = {
        {K::KernelBox, 0.999f, 0.999f, 1, 1}, {K::KernelBox, 1.0f, 0.5f, 0, 0}, {K::KernelBox, 0.5f, 1.0f, 0, 0},
        {K::KernelBox, -3.0f, -3.0f, 1, 1}, {K::KernelBox, below(1.0f), below(1.0f), 1, 1},
        {K::KernelCone, 0.5f, 0.5f, 1, 1}, {K::KernelCone, 1.5f, 0.5f, 0, 0}, {K::KernelCone, 0.5f, -0.5f, 0, 0},
        {K::KernelCone, justInside(1.0f), 0.5f, tiny, 1},
        {K::KernelBell, 0.5f, 0.5f, 1, 1}, {K::KernelBell, 0.5f + K::bellRadius, 0.5f, 0, 0},
        {K::KernelBell, 0.5f, 0.5f + K::bellRadius, 0, 0}, {K::KernelBell, justInside(K::bellRadius), 0.5f, tiny, 1},
        {K::KernelBell, 0.5f + knee, 0.5f, 1.0 - bellSlope * knee * knee - 1e-7, 1.0 - bellSlope * knee * knee + 1e-7},
        {K::KernelBell, 0.5f + knee + 0x1p-24f, 0.5f, std::pow(bellRadius - knee - 0x1p-24, 2) / bellDivisor - 1e-7,
         std::pow(bellRadius - knee - 0x1p-24, 2) / bellDivisor + 1e-7},
        {K::KernelQuadraticBSpline, 1.0f, 0.5f, 0.5, 0.5}, {K::KernelQuadraticBSpline, 0.5f, 0.0f, 0.5, 0.5},
        {K::KernelQuadraticBSpline, 2.0f, 0.5f, 0, 0}, {K::KernelQuadraticBSpline, 0.5f, -1.0f, 0, 0},
        {K::KernelQuadraticBSpline, 0.5f, 0.5f, 0.75, 0.75}, {K::KernelQuadraticBSpline, justInside(1.5f), 0.5f, tiny, 1},
        {K::KernelCubicBSpline, 0.5f, 0.5f, 4.0 / 6 - 4 * eps, 4.0 / 6 + 4 * eps},
        {K::KernelCubicBSpline, 1.5f, 0.5f, 1.0 / 6 - eps, 1.0 / 6 + eps},
        {K::KernelCubicBSpline, justInside(1.0f), 0.5f, 1.0 / 6 - eps, 1.0 / 6 + eps}, {K::KernelCubicBSpline, 2.5f, 0.5f, 0, 0},
        {K::KernelTruncatedGaussian, 2.0f, 0.5f, -eps, eps}, {K::KernelTruncatedGaussian, std::nextafter(2.0f, 3.0f), 0.5f, 0, 0},
        {K::KernelTruncatedGaussian, 2.0f, 2.0f, 0, 0},
        {K::KernelTruncatedGaussian, 0.5f, 0.5f, 1.0 - std::exp(-2.25) - 1e-6, 1.0 - std::exp(-2.25) + 1e-6},
        {K::KernelParabolicPair, 0.5f, 0.5f, 3, 3}, {K::KernelParabolicPair, 1.5f, 0.5f, 1.5, 1.5},
        {K::KernelParabolicPair, justInside(1.0f), 0.5f, 1.5 - 1e-6, 1.5 + 1e-6}, {K::KernelParabolicPair, 2.5f, 0.5f, 0, 0},
        {K::KernelParabolicPair, 0.5f, -1.5f, 0, 0}, {K::KernelParabolicPair, 0.5f + 1.96875f, 0.5f, parabolic - 1e-6, parabolic + 1e-6},
        // No branch cuts these off: beyond every support they still follow their curves.
        {K::KernelGaussian, 3.0f, 0.5f, referenceWeight(4, 3, 0.5) - 1e-9, referenceWeight(4, 3, 0.5) + 1e-9},
        {K::KernelPow2Narrow, 3.0f, 0.5f, referenceWeight(5, 3, 0.5) - 1e-9, referenceWeight(5, 3, 0.5) + 1e-9},
        {K::KernelPow2Wide, 3.0f, 0.5f, referenceWeight(6, 3, 0.5) - 1e-9, referenceWeight(6, 3, 0.5) + 1e-9},
        {K::KernelPow2Narrow, 0.5f, 0.5f, 1, 1}, {K::KernelPow2Wide, 0.5f, 0.5f, 1, 1},
        {K::KernelGaussian, 0.5f, 0.5f, K::gaussianScale, K::gaussianScale},
    };
    for (const Point& p : points) {
        const double w = K(p.type).evaluateKernel(p.x, p.y);
        EXPECT_TRUE(w >= p.lo && w <= p.hi) << "kernel " << p.type << " at (" << p.x << ", " << p.y << "): " << w;
    }
    for (K::KernelType type : {K::KernelGaussian, K::KernelPow2Narrow, K::KernelPow2Wide})
        EXPECT_GT(K(type).evaluateKernel(3.0f, 0.5f), 0.0f);
}

}  // namespace
}  // namespace Zr
