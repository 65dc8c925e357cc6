// Sampling from a histogram: the samples follow a non-flat histogram bin by bin and are uniform
// within each bin, zero bins are never drawn, the density integrates to 1 and vanishes outside
// the range, and the extreme uniform values map to the ends of the drawable bins.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <vector>

#include "exBase.h"
#include "rnChiSquare.h"
#include "rnHistogramRng.h"
#include "rnNumRecUniformRng.h"
#include "rnScriptedRng.h"
#include "rnUniformHistogram.h"

namespace Zr {
namespace {

// A lumpy histogram over [-1, 2) with empty bins at the start, in the middle and at the end.
const std::vector<float> lumpyWeights = {0, 1, 0, 3, 6, 2, 0, 8, 0.5f, 0};

RnUniformHistogram<float> makeLumpy() {
    RnUniformHistogram<float> h(static_cast<int>(lumpyWeights.size()), -1.0f, 2.0f);
    float total = 0;
    for (std::size_t i = 0; i < lumpyWeights.size(); ++i) {
        h.setBin(static_cast<int>(i), lumpyWeights[i]);
        total += lumpyWeights[i];
    }
    h.setTotal(total);
    return h;
}

double sumOf(const std::vector<float>& v) {
    double s = 0;
    for (float x : v) s += x;
    return s;
}

TEST(RnHistogramRng, SamplesFollowTheHistogramBinByBinAndUniformlyWithinBins) {
    const RnUniformHistogram<float> h = makeLumpy();
    RnNumRecUniformRng<float> uniform;
    RnHistogramRng<float> rng(h, &uniform);

    // Each bin is split into quarters; the expected count of a quarter is a quarter of the
    // bin's share. This sees both a wrong choice of bin and a wrong placement within it.
    const int quarters = 4;
    const int nbCells = h.getNbBins() * quarters;
    const int nbDraws = 205000;
    const double sum = sumOf(lumpyWeights);
    std::vector<double> observed(nbCells, 0.0), expected(nbCells, 0.0);
    for (int c = 0; c < nbCells; ++c) {
        expected[c] = nbDraws * lumpyWeights[c / quarters] / sum / quarters;
    }
    for (int i = 0; i < nbDraws; ++i) {
        const float x = rng();
        ASSERT_GE(x, -1.0f);
        ASSERT_LT(x, 2.0f);
        const int bin = h.findBin(x);
        ASSERT_GT(lumpyWeights[bin], 0.0f) << "drew from an empty bin at " << x;
        const double within = (x - h.getBinStart(bin)) / (h.getBinEnd(bin) - h.getBinStart(bin));
        observed[bin * quarters + std::min(quarters - 1, static_cast<int>(within * quarters))] += 1;
    }
    int degrees = -1;  // one constraint: the counts add up to nbDraws
    for (double e : expected) degrees += e > 0 ? 1 : 0;
    EXPECT_LT(RnTest::chiSquare(observed, expected), RnTest::chiSquareCritical999(degrees));
}

TEST(RnHistogramRng, DensityIsTheBinShareOverTheBinWidthAndIntegratesToOne) {
    const RnUniformHistogram<float> h = makeLumpy();
    RnNumRecUniformRng<float> uniform;
    const RnHistogramRng<float> rng(h, &uniform);
    const double sum = sumOf(lumpyWeights);
    const double width = 3.0 / lumpyWeights.size();

    // A midpoint Riemann sum over a grid that is not aligned with the bins; each of the eleven
    // edges can put at most one step's worth of error into it.
    const int steps = 300007;
    const double dx = 3.0 / steps;
    double integral = 0.0;
    for (int k = 0; k < steps; ++k) {
        const float x = static_cast<float>(-1.0 + (k + 0.5) * dx);
        const float p = rng.getPdf(x);
        integral += p * dx;
        const int bin = h.findBin(x);
        ASSERT_NEAR(p, lumpyWeights[bin] / sum / width, 1e-5) << x;
    }
    EXPECT_NEAR(integral, 1.0, 11 * dx * (8 / sum / width));
}

TEST(RnHistogramRng, DensityIsZeroOutsideTheRange) {
    const RnUniformHistogram<float> h(4, 0.0f, 1.0f);
    RnUniformHistogram<float> flat = h;
    for (int i = 0; i < 4; ++i) flat.setBin(i, 1.0f);
    RnNumRecUniformRng<float> uniform;
    const RnHistogramRng<float> rng(flat, &uniform);
    for (float x : {-1e30f, -1.0f, std::nextafter(0.0f, -1.0f), 1.0f, 1.5f, 1e30f,
                    std::numeric_limits<float>::infinity(), -std::numeric_limits<float>::infinity(),
                    std::numeric_limits<float>::quiet_NaN()}) {
        EXPECT_EQ(rng.getPdf(x), 0.0f) << x;
    }
    // Inside, a flat histogram over [0, 1) has density 1, up to the lower edge itself.
    for (float x : {0.0f, 0.1f, 0.25f, 0.5f, std::nextafter(1.0f, 0.0f)}) {
        EXPECT_NEAR(rng.getPdf(x), 1.0f, 1e-6f) << x;
    }
}

TEST(RnHistogramRng, FlatShutterHistogramGivesUniformTimesWithUnitDensity) {
    // The 48-bin histogram of a flat shutter: samples are uniform on [0, 1) and every one has
    // density 1, so importance weights come out equal.
    RnUniformHistogram<float> h(48, 0.0f, 1.0f);
    for (int i = 0; i < 48; ++i) h.setBin(i, 10.0f);
    h.setTotal(480.0f);
    RnNumRecUniformRng<float> uniform;
    RnHistogramRng<float> rng(h, &uniform);
    const int nbCells = 96;
    const int nbDraws = 96000;
    std::vector<double> observed(nbCells, 0.0);
    for (int i = 0; i < nbDraws; ++i) {
        const float x = rng();
        ASSERT_NEAR(rng.getPdf(x), 1.0f, 1e-6f);
        observed[static_cast<int>(x * nbCells)] += 1;
    }
    const std::vector<double> expected(nbCells, double(nbDraws) / nbCells);
    EXPECT_LT(RnTest::chiSquare(observed, expected), RnTest::chiSquareCritical999(nbCells - 1));
}

TEST(RnHistogramRng, ExtremeUniformValuesMapToTheEndsOfTheDrawableBins) {
    const RnUniformHistogram<float> h = makeLumpy();
    const float belowOne = std::nextafter(1.0f, 0.0f);
    RnTest::ScriptedRng<float> script({0.0f, belowOne, 1.0f, -0.5f});
    RnHistogramRng<float> rng(h, &script);
    // 0 gives the lower edge of the first bin that has weight (bin 1).
    EXPECT_EQ(rng(), h.getBinStart(1));
    // The largest value below 1 stays inside the last bin that has weight (bin 8), below its end.
    const float high = rng();
    EXPECT_EQ(h.findBin(high), 8);
    EXPECT_LT(high, h.getBinEnd(8));
    EXPECT_GT(high, h.getBinEnd(8) - 1e-5f);
    // A source straying out of [0, 1) is held to the ends.
    EXPECT_EQ(h.findBin(rng()), 8);
    EXPECT_EQ(rng(), h.getBinStart(1));
    EXPECT_EQ(script.getNbDrawn(), 4u);  // one uniform value per sample
}

TEST(RnHistogramRng, UniformValuesMapMonotonicallyOntoTheRange) {
    // The inverse of the cumulative distribution never goes back, so an ascending script gives
    // ascending samples.
    const RnUniformHistogram<float> h = makeLumpy();
    std::vector<float> script;
    for (int i = 0; i < 4096; ++i) script.push_back(static_cast<float>(i) / 4096.0f);
    RnTest::ScriptedRng<float> source(script);
    RnHistogramRng<float> rng(h, &source);
    float previous = -INFINITY;
    for (std::size_t i = 0; i < script.size(); ++i) {
        const float x = rng();
        ASSERT_GE(x, previous) << i;
        previous = x;
    }
}

TEST(RnHistogramRng, IsDeterministicAndKeepsASnapshotOfTheHistogram) {
    RnUniformHistogram<float> h = makeLumpy();
    RnNumRecUniformRng<float> u1, u2;
    RnHistogramRng<float> a(h, &u1);
    const float pdfBefore = a.getPdf(-0.5f);
    for (int i = 0; i < h.getNbBins(); ++i) h.setBin(i, 1.0f);  // after a was made
    RnHistogramRng<float> b(makeLumpy(), &u2);
    for (int i = 0; i < 1000; ++i) ASSERT_EQ(a(), b());
    EXPECT_EQ(a.getPdf(-0.5f), pdfBefore);
    EXPECT_EQ(a.getMin(), -1.0f);
    EXPECT_EQ(a.getMax(), 2.0f);
}

TEST(RnHistogramRng, DoublePrecisionFollowsTheSameHistogram) {
    RnUniformHistogram<double> h(3, 10.0, 16.0);
    h.setBin(0, 1.0);
    h.setBin(2, 3.0);
    RnNumRecUniformRng<double> uniform;
    RnHistogramRng<double> rng(h, &uniform);
    const int nbDraws = 40000;
    std::vector<double> observed(3, 0.0);
    for (int i = 0; i < nbDraws; ++i) observed[h.findBin(rng())] += 1;
    const std::vector<double> expected = {nbDraws / 4.0, 0.0, nbDraws * 3.0 / 4.0};
    EXPECT_LT(RnTest::chiSquare(observed, expected), RnTest::chiSquareCritical999(1));
    EXPECT_DOUBLE_EQ(rng.getPdf(11.0), 0.25 / 2.0);
    EXPECT_DOUBLE_EQ(rng.getPdf(13.0), 0.0);
    EXPECT_DOUBLE_EQ(rng.getPdf(15.0), 0.75 / 2.0);
}

TEST(RnHistogramRng, UnusableHistogramsAndMissingSourcesAreAssertionFailures) {
    RnNumRecUniformRng<float> uniform;
    RnUniformHistogram<float> empty(4, 0.0f, 1.0f);
    EXPECT_THROW(RnHistogramRng<float>(empty, &uniform), ExAssertionFailed);
    RnUniformHistogram<float> negative(4, 0.0f, 1.0f);
    negative.setBin(0, 2.0f);
    negative.setBin(1, -1.0f);
    EXPECT_THROW(RnHistogramRng<float>(negative, &uniform), ExAssertionFailed);
    RnUniformHistogram<float> infinite(4, 0.0f, 1.0f);
    infinite.setBin(2, std::numeric_limits<float>::infinity());
    EXPECT_THROW(RnHistogramRng<float>(infinite, &uniform), ExAssertionFailed);
    RnUniformHistogram<float> fine(4, 0.0f, 1.0f);
    fine.setBin(2, 1.0f);
    EXPECT_THROW(RnHistogramRng<float>(fine, nullptr), ExAssertionFailed);
    EXPECT_NO_THROW(RnHistogramRng<float>(fine, &uniform));
}

}  // namespace
}  // namespace Zr
