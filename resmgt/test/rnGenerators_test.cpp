// The uniform generator, pairs from it, equal-width histograms and sampling from a histogram,
// by exact values, scripted sources and chi-square tests of fixed sequences.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <set>
#include <tuple>
#include <vector>

#include "exBase.h"
#include "rnHistogramRng.h"
#include "rnNumRecUniformRng.h"
#include "rnSeparableBiRng.h"
#include "rnTestSupport.h"
#include "rnUniformHistogram.h"

namespace Zr {
namespace {

using RnTest::chiSquare;
using RnTest::chiSquareCritical999;

template <class T>
class RnTyped : public ::testing::Test {};
using Precisions = ::testing::Types<float, double>;
TYPED_TEST_SUITE(RnTyped, Precisions);

TYPED_TEST(RnTyped, UniformValuesAreEvenIndependentAndInTheHalfOpenUnitInterval) {
    using T = TypeParam;
    using R = RnNumRecUniformRng<T>;
    const int digits = std::numeric_limits<T>::digits;
    EXPECT_EQ(R::toUnitInterval(0), T(0));
    EXPECT_EQ(R::toUnitInterval(~std::uint64_t(0)), T(1) - std::ldexp(T(1), -digits));
    EXPECT_EQ(R::toUnitInterval(std::uint64_t(1) << 63), T(0.5));
    EXPECT_EQ(R::toUnitInterval((std::uint64_t(1) << (64 - digits)) - 1), T(0));  // no rounding up
    R rng;
    T lowest = 1, highest = 0, previous = 0;
    std::set<T> distinct;
    double sum = 0.0;
    std::vector<double> cells(200, 0.0), pairs(256, 0.0);
    for (int i = 0; i < 1000000; ++i) {
        const T v = rng.eval();
        ASSERT_TRUE(v >= T(0) && v < T(1)) << v;
        lowest = std::min(lowest, v);
        highest = std::max(highest, v);
        if (i < 100000) distinct.insert(v);
        if (i < 200000) sum += v, cells[static_cast<int>(v * 200)] += 1.0;
        // A value that leans on the one before crowds some cells of the square.
        if (i > 200000 && i <= 328000) pairs[static_cast<int>(previous * 16) * 16 + static_cast<int>(v * 16)] += 1.0;
        previous = v;
    }
    EXPECT_LT(lowest, T(1e-4));  // a million draws come close to both ends
    EXPECT_GT(highest, T(1 - 1e-4));
    EXPECT_GT(static_cast<int>(distinct.size()), 100000 - 1000);  // float collides in ~300 pairs by chance
    EXPECT_NEAR(sum / 200000, 0.5, 0.004);
    EXPECT_LT(chiSquare(cells, std::vector<double>(200, 1000.0)), chiSquareCritical999(199));
    EXPECT_LT(chiSquare(pairs, std::vector<double>(256, 500.0)), chiSquareCritical999(255));
    // Every generator starts from the same seed; a copy continues the sequence.
    R a, b;
    for (int i = 0; i < 1000; ++i) ASSERT_EQ(a.eval(), static_cast<RnRng<T>&>(b)());
    R c = a;
    for (int i = 0; i < 100; ++i) ASSERT_EQ(c.eval(), a.eval());
}

TEST(RnSeparableBiRng, TakesTwoConsecutiveValuesXFirst) {
    RnTest::ScriptedRng<float> script({0.125f, 0.75f, 0.5f, 0.0f});
    RnSeparableBiRng<float> pairs(&script);
    float x = -1, y = -1;
    for (const auto& [wantX, wantY] : {std::pair{0.125f, 0.75f}, std::pair{0.5f, 0.0f}}) {
        pairs.getSample(x, y);
        EXPECT_EQ(x, wantX);
        EXPECT_EQ(y, wantY);
    }
    EXPECT_EQ(script.getNbDrawn(), 4u);
    EXPECT_THROW(RnSeparableBiRng<float>(nullptr), ExAssertionFailed);
}

// Lookups agree with the stated edges at the edges, just below them, between and outside them;
// the edges lie where equal widths put them.
TYPED_TEST(RnTyped, HistogramLookupAgreesWithEquallySpacedEdges) {
    using T = TypeParam;
    // Edges mostly not representable: their rounding is what the lookup must agree with.
    const std::vector<std::tuple<int, T, T>> layouts = {{48, T(0), T(1)},       {1, T(-2), T(3)},
                                                        {7, T(0.1), T(0.7)},    {13, T(-7.3), T(-2.9)},
                                                        {1000, T(0), T(3)},     {3, T(1e6), T(1e6 + 1)}};
    const T inf = std::numeric_limits<T>::infinity();
    for (const auto& [n, min, max] : layouts) {
        const RnUniformHistogram<T> h(n, min, max);
        ASSERT_EQ(h.getNbBins(), n);
        EXPECT_EQ(h.getBinStart(0), min);
        EXPECT_EQ(h.getBinEnd(n - 1), max);
        const double width = (double(max) - double(min)) / n;
        const double slack = 4.0 * std::numeric_limits<T>::epsilon() * std::max(std::fabs(min), std::fabs(max));
        for (int i = 0; i < n; ++i) {
            const T start = h.getBinStart(i);
            if (i + 1 < n) { ASSERT_EQ(h.getBinEnd(i), h.getBinStart(i + 1)); }
            EXPECT_EQ(h.findBin(start), i) << n << " bin " << i;
            EXPECT_EQ(h.findBin(std::nextafter(start, -inf)), i - 1) << n << " bin " << i;
            EXPECT_EQ(h.findBin(std::nextafter(h.getBinEnd(i), -inf)), i) << n << " bin " << i;
            EXPECT_NEAR(h.getBinWidth(i), width, width * 1e-5);
            EXPECT_NEAR(double(start), double(min) + width * i, slack) << i;
            EXPECT_NEAR(double(h.getBinEnd(i)) - double(start), width, 2 * slack) << i;
        }
        for (int k = 0; k < 20011; ++k) {  // a prime count of probes falls at all phases within the bins
            const T x = min + (max - min) * T(k) / T(20011);
            if (!(x < max)) continue;
            const int bin = h.findBin(x);
            ASSERT_TRUE(bin >= 0 && bin < n && h.getBinStart(bin) <= x && x < h.getBinEnd(bin)) << n << " " << x;
        }
        const T span = max - min;
        for (T below : {min - span * T(0.01), min - span * T(1000), -inf})
            if (below < min) { EXPECT_LT(h.findBin(below), 0) << below; }
        for (T above : {max, max + span * T(0.01), max + span * T(1000), inf}) EXPECT_GE(h.findBin(above), n) << above;
        const int nanBin = h.findBin(std::numeric_limits<T>::quiet_NaN());
        EXPECT_TRUE(nanBin < 0 || nanBin >= n);
    }
}

TYPED_TEST(RnTyped, AddSampleFillsTheBinAndTotalOnlyInsideTheRange) {
    using T = TypeParam;
    // 480 points at the centres of 480 strata of [0, 1), by repeated addition, 10 to a bin.
    RnUniformHistogram<T> h(48, T(0), T(1));
    T x = T(1) / T(960);
    for (int i = 0; i < 480; ++i, x += T(1) / T(480)) EXPECT_TRUE(h.addSample(x));
    EXPECT_EQ(h.getTotal(), T(480));
    for (int i = 0; i < 48; ++i) EXPECT_EQ(h.getBin(i), T(10)) << i;
    EXPECT_FALSE(h.addSample(T(1)) || h.addSample(T(-0.25), T(3)));
    EXPECT_TRUE(h.addSample(T(0.5), T(2.5)));
    EXPECT_EQ(h.getTotal(), T(482.5));
    EXPECT_EQ(h[24], T(12.5));
}

TEST(RnUniformHistogram, BadLayoutsAndBadBinIndicesAreAssertionFailures) {
    const float inf = std::numeric_limits<float>::infinity();
    for (const auto& [n, min, max] :
         {std::tuple{0, 0.0f, 1.0f}, {-3, 0.0f, 1.0f}, {4, 1.0f, 1.0f}, {4, 2.0f, 1.0f}, {4, 0.0f, inf}})
        EXPECT_THROW(RnUniformHistogram<float>(n, min, max), ExAssertionFailed) << n << " " << min << " " << max;
    EXPECT_THROW(RnUniformHistogram<double>(4, -1e308, 1e308), ExAssertionFailed);
    RnUniformHistogram<float> h(4, 0.0f, 1.0f);
    EXPECT_THROW(h.getBin(4), ExAssertionFailed);
    EXPECT_THROW(h.setBin(-1, 1.0f), ExAssertionFailed);
    EXPECT_THROW(h[4], ExAssertionFailed);
    EXPECT_THROW(static_cast<const RnHistogram<float>&>(h)[-1], ExAssertionFailed);
    EXPECT_THROW(h.getBinStart(4), ExAssertionFailed);
    EXPECT_THROW(h.getBinEnd(-1), ExAssertionFailed);
    EXPECT_THROW(h.getBinWidth(4), ExAssertionFailed);
}

// Over [-1, 2), with empty bins at the start, in the middle and at the end.
const std::vector<float> lumpyWeights = {0, 1, 0, 3, 6, 2, 0, 8, 0.5f, 0};
const double lumpySum = 20.5;

RnUniformHistogram<float> makeLumpy() {
    RnUniformHistogram<float> h(static_cast<int>(lumpyWeights.size()), -1.0f, 2.0f);
    for (std::size_t i = 0; i < lumpyWeights.size(); ++i) h.setBin(static_cast<int>(i), lumpyWeights[i]);
    h.setTotal(static_cast<float>(lumpySum));
    return h;
}

// Each bin split into quarters, each expecting a quarter of the bin's share: this sees both a
// wrong choice of bin and a wrong placement within it.
TEST(RnHistogramRng, SamplesFollowTheHistogramBinByBinAndUniformlyWithinBins) {
    const RnUniformHistogram<float> h = makeLumpy();
    RnNumRecUniformRng<float> uniform;
    RnHistogramRng<float> rng(h, &uniform);
    const int nbDraws = 205000;
    std::vector<double> observed(40, 0.0), expected(40, 0.0);
    for (int c = 0; c < 40; ++c) expected[c] = nbDraws * lumpyWeights[c / 4] / lumpySum / 4;
    for (int i = 0; i < nbDraws; ++i) {
        const float x = rng();
        ASSERT_TRUE(x >= -1.0f && x < 2.0f) << x;
        const int bin = h.findBin(x);
        const double within = (x - h.getBinStart(bin)) / (h.getBinEnd(bin) - h.getBinStart(bin));
        observed[bin * 4 + std::min(3, static_cast<int>(within * 4))] += 1;
    }
    // Cells expected empty but drawn give an infinite statistic; the counts add up to nbDraws.
    const auto degrees = std::count_if(expected.begin(), expected.end(), [](double e) { return e > 0; }) - 1;
    EXPECT_LT(chiSquare(observed, expected), chiSquareCritical999(static_cast<int>(degrees)));
}

// Ascending uniform values give ascending samples, one value each; the extremes give the ends of
// the first and last bins with weight, and a source straying out of [0, 1) is held to them. The
// generator keeps a snapshot of the histogram, and its density is the bin's share over the bin's
// width, 0 outside [min, max).
TEST(RnHistogramRng, ValuesMapMonotonicallyToTheDrawableBinsWithTheBinShareAsDensity) {
    RnUniformHistogram<float> h = makeLumpy();
    std::vector<float> script;
    for (int i = 0; i < 4096; ++i) script.push_back(static_cast<float>(i) / 4096.0f);
    RnTest::ScriptedRng<float> ascending(script), extremes({0.0f, std::nextafter(1.0f, 0.0f), 1.0f, -0.5f});
    RnHistogramRng<float> monotonic(h, &ascending), rng(h, &extremes);
    float previous = -INFINITY;
    for (int i = 0; i < 4096; ++i) {
        const float x = monotonic();
        ASSERT_GE(x, previous) << i;
        previous = x;
    }
    EXPECT_EQ(ascending.getNbDrawn(), script.size());
    for (int i = 0; i < h.getNbBins(); ++i) {
        const float expected = float(lumpyWeights[i] / lumpySum / (3.0 / lumpyWeights.size()));
        const float start = h.getBinStart(i), end = h.getBinEnd(i);
        for (float x : {start, 0.5f * (start + end), std::nextafter(end, -2.0f)})
            EXPECT_NEAR(rng.getPdf(x), expected, 1e-5) << x;
        h.setBin(i, 1.0f);  // changes nothing in the generator
    }
    const float inf = std::numeric_limits<float>::infinity();
    for (float x : {-inf, -1e30f, std::nextafter(-1.0f, -2.0f), 2.0f, 1e30f, inf, std::nanf("")})
        EXPECT_EQ(rng.getPdf(x), 0.0f) << x;
    EXPECT_EQ(rng(), h.getBinStart(1));
    const float high = rng();  // inside the last bin with weight, just below its end
    EXPECT_TRUE(h.findBin(high) == 8 && high < h.getBinEnd(8) && high > h.getBinEnd(8) - 1e-5f) << high;
    EXPECT_EQ(h.findBin(rng()), 8);
    EXPECT_EQ(rng(), h.getBinStart(1));
}

TEST(RnHistogramRng, UnusableHistogramsAndMissingSourcesAreAssertionFailures) {
    RnNumRecUniformRng<float> uniform;
    for (const auto& [first, second] : {std::pair{0.0f, 0.0f}, {2.0f, -1.0f}, {0.0f, INFINITY}}) {
        RnUniformHistogram<float> h(4, 0.0f, 1.0f);
        h.setBin(0, first);
        h.setBin(1, second);
        EXPECT_THROW(RnHistogramRng<float>(h, &uniform), ExAssertionFailed) << first << " " << second;
    }
    RnUniformHistogram<float> fine(4, 0.0f, 1.0f);
    fine.setBin(2, 1.0f);
    EXPECT_THROW(RnHistogramRng<float>(fine, nullptr), ExAssertionFailed);
    EXPECT_NO_THROW(RnHistogramRng<float>(fine, &uniform));
}

}  // namespace
}  // namespace Zr
