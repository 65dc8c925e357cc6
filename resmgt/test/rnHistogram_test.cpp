// Histograms with equal-width bins: lookups agree with the stated edges (at the edges, just below
// them, everywhere between and outside the range), the edges lie where equal widths put them,
// and addSample fills bins and total.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <tuple>
#include <vector>

#include "exBase.h"
#include "rnUniformHistogram.h"

namespace Zr {
namespace {

template <class T>
class RnUniformHistogramTest : public ::testing::Test {};
using Precisions = ::testing::Types<float, double>;
TYPED_TEST_SUITE(RnUniformHistogramTest, Precisions);

TYPED_TEST(RnUniformHistogramTest, LookupAgreesWithTheEdgesAndEdgesAreEquallySpaced) {
    using T = TypeParam;
    // Edges mostly not representable: their rounding is what the lookup must agree with.
    const std::vector<std::tuple<int, T, T>> layouts = {{48, T(0), T(1)},   {1, T(-2), T(3)},
                                                        {7, T(0.1), T(0.7)}, {13, T(-7.3), T(-2.9)},
                                                        {1000, T(0), T(3)},  {3, T(1e6), T(1e6 + 1)}};
    const T inf = std::numeric_limits<T>::infinity();
    for (const auto& [n, min, max] : layouts) {
        const RnUniformHistogram<T> h(n, min, max);
        ASSERT_EQ(h.getNbBins(), n);
        EXPECT_EQ(h.getBinStart(0), min);
        EXPECT_EQ(h.getBinEnd(n - 1), max);
        const double width = (double(max) - double(min)) / n;
        const double slack = 4.0 * std::numeric_limits<T>::epsilon() * std::max(std::fabs(double(min)), std::fabs(double(max)));
        for (int i = 0; i < n; ++i) {
            const T start = h.getBinStart(i);
            if (i + 1 < n) {
                ASSERT_EQ(h.getBinEnd(i), h.getBinStart(i + 1));
            }
            EXPECT_EQ(h.findBin(start), i) << n << " bin " << i;
            EXPECT_EQ(h.findBin(std::nextafter(start, -inf)), i - 1) << n << " bin " << i;
            EXPECT_EQ(h.findBin(std::nextafter(h.getBinEnd(i), -inf)), i) << n << " bin " << i;
            EXPECT_NEAR(h.getBinWidth(i), width, width * 1e-5);
            EXPECT_NEAR(double(start), double(min) + width * i, slack) << i;
            EXPECT_NEAR(double(h.getBinEnd(i)) - double(start), width, 2 * slack) << i;
        }
        const int nbProbes = 20011;  // prime, so probes fall at all phases within the bins
        for (int k = 0; k < nbProbes; ++k) {
            const T x = min + (max - min) * T(k) / T(nbProbes);
            if (!(x < max)) continue;
            const int bin = h.findBin(x);
            ASSERT_TRUE(bin >= 0 && bin < n) << x;
            ASSERT_LE(h.getBinStart(bin), x) << "n " << n << " x " << x;
            ASSERT_LT(x, h.getBinEnd(bin)) << "n " << n << " x " << x;
        }
        const T span = max - min;
        for (T below : {min - span * T(0.01), min - span * T(1000), -inf}) {
            if (below < min) {  // not rounded back to min
                EXPECT_LT(h.findBin(below), 0) << below;
            }
        }
        for (T above : {max, max + span * T(0.01), max + span * T(1000), inf}) EXPECT_GE(h.findBin(above), n) << above;
        const int nanBin = h.findBin(std::numeric_limits<T>::quiet_NaN());
        EXPECT_TRUE(nanBin < 0 || nanBin >= n);
    }
}

TYPED_TEST(RnUniformHistogramTest, AddSampleFillsTheBinAndTotalOnlyInsideTheRange) {
    using T = TypeParam;
    // 480 points at the centres of 480 strata of [0, 1), by repeated addition, 10 to a bin.
    RnUniformHistogram<T> h(48, T(0), T(1));
    T x = T(1) / T(960);
    for (int i = 0; i < 480; ++i) {
        EXPECT_TRUE(h.addSample(x));
        x += T(1) / T(480);
    }
    EXPECT_EQ(h.getTotal(), T(480));
    for (int i = 0; i < 48; ++i) EXPECT_EQ(h.getBin(i), T(10)) << i;
    EXPECT_FALSE(h.addSample(T(1)));
    EXPECT_FALSE(h.addSample(T(-0.25), T(3)));
    EXPECT_TRUE(h.addSample(T(0.5), T(2.5)));
    EXPECT_EQ(h.getTotal(), T(482.5));
    EXPECT_EQ(h.getBin(24), T(12.5));
}

TEST(RnUniformHistogram, BadLayoutsAndBadBinIndicesAreAssertionFailures) {
    for (const auto& [n, min, max] : std::vector<std::tuple<int, float, float>>{
             {0, 0, 1}, {-3, 0, 1}, {4, 1, 1}, {4, 2, 1}, {4, 0, std::numeric_limits<float>::infinity()}}) {
        EXPECT_THROW(RnUniformHistogram<float>(n, min, max), ExAssertionFailed) << n << " " << min << " " << max;
    }
    EXPECT_THROW(RnUniformHistogram<double>(4, -1e308, 1e308), ExAssertionFailed);
    RnUniformHistogram<float> h(4, 0.0f, 1.0f);
    EXPECT_THROW(h.getBin(4), ExAssertionFailed);
    EXPECT_THROW(h.setBin(-1, 1.0f), ExAssertionFailed);
    EXPECT_THROW(h[4], ExAssertionFailed);
    EXPECT_THROW(h.getBinStart(4), ExAssertionFailed);
    EXPECT_THROW(h.getBinEnd(-1), ExAssertionFailed);
}

}  // namespace
}  // namespace Zr
