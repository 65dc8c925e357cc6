// Filter kernels: every kernel against a double-precision formula table, the behaviour at the
// branch boundaries, the support and radial tables, and the exact bits of the constants.
#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <functional>
#include <limits>
#include <sstream>
#include <vector>

#include "rsFilterKernel.h"

namespace Zr {
namespace {

using K = RsFilterKernel;

// The constants as their bit patterns define them, independent of the literals in the class.
double constantFromBits(std::uint32_t bits) { return std::bit_cast<float>(bits); }
const double bellRadius = constantFromBits(0x3fb04189u);
const double bellKnee = constantFromBits(0x3ef837b5u);
const double bellDivisor = constantFromBits(0x3f9d416fu);
const double bellSlope = constantFromBits(0x3fbfbd85u);
const double gaussScale = constantFromBits(0x3f4c422au);

// The reference table of the ten kernels in double precision, as functions of the pixel
// coordinates (box) or the distance from the centre (the others).
double referenceWeight(int type, double x, double y) {
    const double r = std::hypot(x - 0.5, y - 0.5);
    const double r2 = r * r;
    switch (type) {
    case 0: return (x >= 1.0 || y >= 1.0) ? 0.0 : 1.0;
    case 1: return r < 1.0 ? 1.0 - r : 0.0;
    case 2:
        if (r >= bellRadius) return 0.0;
        if (r > bellKnee) return std::pow(bellRadius - r, 2) / bellDivisor;
        return 1.0 - bellSlope * r2;
    case 3:
        if (r < 0.5) return 0.75 - r2;
        if (r < 1.5) return 0.5 * std::pow(r - 1.5, 2);
        return 0.0;
    case 4: return gaussScale * std::exp(-2.0 * r2);
    case 5: return std::exp2(-2.0 * r2);
    case 6: return std::exp2(-4.0 * r2);
    case 7:
        if (r < 1.0) return (3.0 * r * r2 - 6.0 * r2 + 4.0) / 6.0;
        if (r < 2.0) return std::pow(2.0 - r, 3) / 6.0;
        return 0.0;
    case 8: return r > 1.5 ? 0.0 : std::exp(-r2) - std::exp(-2.25);
    case 9:
        if (r >= 2.0) return 0.0;
        if (r < 1.0) return 3.0 - 1.5 * r2;
        return 1.5 * r2 - 6.0 * r + 6.0;
    }
    return 0.0;
}

// Largest weight of each kernel: float rounding errors scale with the terms, not with the
// result, which may cancel to nearly 0.
const double kernelScale[K::nbKernelTypes] = {1, 1, 1, 1, 1, 1, 1, 1, 1, 3};

// Sample coordinates: a dyadic grid that hits centres, edges and branch radii exactly, and a
// non-dyadic one that falls between them. Both reach two pixels beyond the centre pixel.
std::vector<float> gridCoordinates() {
    std::vector<float> coords;
    for (int i = -40; i <= 56; ++i) coords.push_back(static_cast<float>(i) / 16.0f);
    for (int i = 0; i <= 161; ++i) coords.push_back(-2.49f + 0.037f * static_cast<float>(i));
    return coords;
}

TEST(RsFilterKernel, EveryKernelMatchesTheReferenceTableOverAGrid) {
    const std::vector<float> coords = gridCoordinates();
    for (int type = 0; type < K::nbKernelTypes; ++type) {
        const K kernel(static_cast<K::KernelType>(type));
        const double tolerance = 16.0 * std::numeric_limits<float>::epsilon() * kernelScale[type];
        int failures = 0;
        for (float x : coords) {
            for (float y : coords) {
                const double expected = referenceWeight(type, x, y);
                const double actual = kernel.evaluateKernel(x, y);
                if (std::fabs(actual - expected) > tolerance && ++failures <= 5) {
                    ADD_FAILURE() << "kernel " << type << " at (" << x << ", " << y
                                  << "): " << actual << " expected " << expected;
                }
            }
        }
        EXPECT_EQ(failures, 0) << "kernel " << type;
    }
}

TEST(RsFilterKernel, RadialKernelsDependOnlyOnTheDistanceFromTheCentre) {
    // Offsets that are exact in float, so that mirrored and swapped points have exactly the
    // same squared distance and must give exactly the same weight.
    for (int type = 1; type < K::nbKernelTypes; ++type) {
        const K kernel(static_cast<K::KernelType>(type));
        for (int i = 0; i <= 40; ++i) {
            for (int j = 0; j <= i; ++j) {
                const float a = static_cast<float>(i) * 0.0625f;
                const float b = static_cast<float>(j) * 0.0625f;
                const float w = kernel.evaluateKernel(0.5f + a, 0.5f + b);
                EXPECT_EQ(kernel.evaluateKernel(0.5f + b, 0.5f + a), w) << type;
                EXPECT_EQ(kernel.evaluateKernel(0.5f - a, 0.5f + b), w) << type;
                EXPECT_EQ(kernel.evaluateKernel(0.5f + a, 0.5f - b), w) << type;
                EXPECT_EQ(kernel.evaluateKernel(0.5f - b, 0.5f - a), w) << type;
            }
        }
    }
}

TEST(RsFilterKernel, TablesGiveSupportAndRadialFlagPerKernel) {
    const int support[K::nbKernelTypes] = {0, 1, 1, 1, 1, 1, 2, 2, 2, 2};
    for (int type = 0; type < K::nbKernelTypes; ++type) {
        const K kernel(static_cast<K::KernelType>(type));
        EXPECT_EQ(kernel.getKernelSupport(), support[type]) << type;
        EXPECT_EQ(K::kernelSupport[type], support[type]) << type;
        EXPECT_EQ(K::kernelIsRadial[type], type == 0 ? 0 : 1) << type;
    }
    // The enumerators' numbers are part of the interface.
    const K::KernelType types[] = {K::KernelBox, K::KernelCone, K::KernelBell,
                                   K::KernelQuadraticBSpline, K::KernelGaussian,
                                   K::KernelPow2Narrow, K::KernelPow2Wide,
                                   K::KernelCubicBSpline, K::KernelTruncatedGaussian,
                                   K::KernelParabolicPair};
    for (int i = 0; i < K::nbKernelTypes; ++i) EXPECT_EQ(static_cast<int>(types[i]), i);
}

TEST(RsFilterKernel, ConstantsHaveTheirExactBits) {
    EXPECT_EQ(std::bit_cast<std::uint32_t>(K::bellRadius), 0x3fb04189u);
    EXPECT_EQ(std::bit_cast<std::uint32_t>(K::bellKnee), 0x3ef837b5u);
    EXPECT_EQ(std::bit_cast<std::uint32_t>(K::bellOuterDivisor), 0x3f9d416fu);
    EXPECT_EQ(std::bit_cast<std::uint32_t>(K::bellInnerSlope), 0x3fbfbd85u);
    EXPECT_EQ(std::bit_cast<std::uint32_t>(K::gaussianScale), 0x3f4c422au);
    // The Gaussian's scale is sqrt(2 / pi) rounded to float.
    EXPECT_EQ(K::gaussianScale, static_cast<float>(std::sqrt(2.0 / 3.14159265358979323846)));
}

TEST(RsFilterKernel, DefaultIsTheBoxAndTheTypeIsWritable) {
    K kernel;
    EXPECT_EQ(kernel.getKernelType(), K::KernelBox);
    kernel.setKernelType(K::KernelCubicBSpline);
    EXPECT_EQ(kernel.getKernelType(), K::KernelCubicBSpline);
    K copy;
    copy = kernel;
    EXPECT_EQ(copy.getKernelType(), K::KernelCubicBSpline);
    std::ostringstream os;
    copy.dump(os);
    EXPECT_NE(os.str().find(" _kernelType: 7"), std::string::npos) << os.str();
}

TEST(RsFilterKernel, UnknownTypesWeighNothingAndReachNothing) {
    const std::vector<float> coords = gridCoordinates();
    for (int type : {10, 11, 1000, -1}) {
        const K kernel(static_cast<K::KernelType>(type));
        EXPECT_EQ(kernel.getKernelSupport(), 0) << type;
        for (float x : coords) {
            for (float y : coords) ASSERT_EQ(kernel.evaluateKernel(x, y), 0.0f) << type;
        }
    }
}

// The x coordinate at distance d from the pixel's centre, for a d that 0.5 + d holds exactly
// (for example a multiple of 2^-24 below 0.5): the kernel's distance then comes out as d itself.
float alongX(float d) { return 0.5f + d; }
// The x coordinate of the nearest point inside distance d, for such a d.
float justInsideX(float d) { return std::nextafter(0.5f + d, 0.0f); }
float justBelow(float v) { return std::nextafter(v, 0.0f); }

TEST(RsFilterKernel, BoxCutsOnlyAtTheUpperEdges) {
    const K box(K::KernelBox);
    EXPECT_EQ(box.evaluateKernel(0.999f, 0.999f), 1.0f);
    EXPECT_EQ(box.evaluateKernel(1.0f, 0.5f), 0.0f);
    EXPECT_EQ(box.evaluateKernel(0.5f, 1.0f), 0.0f);
    EXPECT_EQ(box.evaluateKernel(-3.0f, -3.0f), 1.0f);
    EXPECT_EQ(box.evaluateKernel(justBelow(1.0f), justBelow(1.0f)), 1.0f);
}

TEST(RsFilterKernel, ConeIsOneAtTheCentreAndZeroAtDistanceOne) {
    const K cone(K::KernelCone);
    EXPECT_EQ(cone.evaluateKernel(0.5f, 0.5f), 1.0f);
    EXPECT_EQ(cone.evaluateKernel(1.5f, 0.5f), 0.0f);
    EXPECT_EQ(cone.evaluateKernel(0.5f, -0.5f), 0.0f);
    EXPECT_GT(cone.evaluateKernel(justInsideX(1.0f), 0.5f), 0.0f);
}

TEST(RsFilterKernel, BellIsContinuousAtTheKneeAndZeroAtItsRadius) {
    const K bell(K::KernelBell);
    // The representable distances on either side of the knee, as multiples of 2^-24.
    const float step = std::ldexp(1.0f, -24);
    const float below = std::floor(K::bellKnee / step) * step;
    const float above = below + step;
    ASSERT_LE(below, K::bellKnee);
    ASSERT_GT(above, K::bellKnee);
    const float inner = bell.evaluateKernel(alongX(below), 0.5f);
    const float outer = bell.evaluateKernel(alongX(above), 0.5f);
    // The curve's slope is about -1.5 here, so one step moves it by far less than this.
    EXPECT_NEAR(inner, outer, 4.0f * std::numeric_limits<float>::epsilon());
    // Each side uses its own piece.
    EXPECT_NEAR(inner, 1.0 - bellSlope * double(below) * below, 1e-7);
    EXPECT_NEAR(outer, std::pow(bellRadius - above, 2) / bellDivisor, 1e-7);

    EXPECT_EQ(bell.evaluateKernel(alongX(K::bellRadius), 0.5f), 0.0f);
    EXPECT_EQ(bell.evaluateKernel(0.5f, alongX(K::bellRadius)), 0.0f);
    EXPECT_GT(bell.evaluateKernel(justInsideX(K::bellRadius), 0.5f), 0.0f);
    EXPECT_EQ(bell.evaluateKernel(0.5f, 0.5f), 1.0f);
}

TEST(RsFilterKernel, QuadraticBSplineBranchesMeetAtHalfAndEndAtOneAndAHalf) {
    const K spline(K::KernelQuadraticBSpline);
    EXPECT_EQ(spline.evaluateKernel(1.0f, 0.5f), 0.5f);
    EXPECT_EQ(spline.evaluateKernel(0.5f, 0.0f), 0.5f);
    EXPECT_EQ(spline.evaluateKernel(2.0f, 0.5f), 0.0f);
    EXPECT_EQ(spline.evaluateKernel(0.5f, -1.0f), 0.0f);
    EXPECT_EQ(spline.evaluateKernel(0.5f, 0.5f), 0.75f);
    EXPECT_GT(spline.evaluateKernel(justInsideX(1.5f), 0.5f), 0.0f);
}

TEST(RsFilterKernel, CubicBSplineHasItsKnownValuesAtZeroAndOne) {
    const K spline(K::KernelCubicBSpline);
    EXPECT_FLOAT_EQ(spline.evaluateKernel(0.5f, 0.5f), 4.0f / 6.0f);
    EXPECT_FLOAT_EQ(spline.evaluateKernel(1.5f, 0.5f), 1.0f / 6.0f);
    EXPECT_FLOAT_EQ(spline.evaluateKernel(justInsideX(1.0f), 0.5f), 1.0f / 6.0f);
    EXPECT_EQ(spline.evaluateKernel(2.5f, 0.5f), 0.0f);
}

TEST(RsFilterKernel, TruncatedGaussianReachesZeroAtOneAndAHalf) {
    const K gauss(K::KernelTruncatedGaussian);
    EXPECT_NEAR(gauss.evaluateKernel(2.0f, 0.5f), 0.0f, std::numeric_limits<float>::epsilon());
    EXPECT_EQ(gauss.evaluateKernel(std::nextafter(2.0f, 3.0f), 0.5f), 0.0f);
    EXPECT_EQ(gauss.evaluateKernel(2.0f, 2.0f), 0.0f);
    EXPECT_NEAR(gauss.evaluateKernel(0.5f, 0.5f), 1.0 - std::exp(-2.25), 1e-6);
}

TEST(RsFilterKernel, ParabolicPairIsThreeAtTheCentreContinuousAtOneAndZeroAtTwo) {
    const K pair(K::KernelParabolicPair);
    EXPECT_EQ(pair.evaluateKernel(0.5f, 0.5f), 3.0f);
    EXPECT_EQ(pair.evaluateKernel(1.5f, 0.5f), 1.5f);  // outer piece at exactly 1
    EXPECT_NEAR(pair.evaluateKernel(justInsideX(1.0f), 0.5f), 1.5f, 1e-6f);  // inner piece
    EXPECT_EQ(pair.evaluateKernel(2.5f, 0.5f), 0.0f);
    EXPECT_EQ(pair.evaluateKernel(0.5f, -1.5f), 0.0f);
    // Just inside 2 the outer piece cancels to nothing in float; a little further in it is
    // 1.5 (2 - r)^2.
    EXPECT_NEAR(pair.evaluateKernel(alongX(1.96875f), 0.5f), 1.5 * 0.03125 * 0.03125, 1e-6);
}

TEST(RsFilterKernel, GaussianAndPowerKernelsAreNeverCutOff) {
    // No branch cuts these three off: at distance 2.5, beyond every support, all are still
    // positive and follow their curves.
    for (K::KernelType type : {K::KernelGaussian, K::KernelPow2Narrow, K::KernelPow2Wide}) {
        const K kernel(type);
        const float w = kernel.evaluateKernel(3.0f, 0.5f);
        EXPECT_GT(w, 0.0f) << type;
        EXPECT_NEAR(w, referenceWeight(type, 3.0, 0.5), 1e-9) << type;
    }
    EXPECT_EQ(K(K::KernelPow2Narrow).evaluateKernel(0.5f, 0.5f), 1.0f);
    EXPECT_EQ(K(K::KernelPow2Wide).evaluateKernel(0.5f, 0.5f), 1.0f);
    EXPECT_EQ(K(K::KernelGaussian).evaluateKernel(0.5f, 0.5f), K::gaussianScale);
}

}  // namespace
}  // namespace Zr
