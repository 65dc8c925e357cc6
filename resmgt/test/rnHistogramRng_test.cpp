// Sampling from a histogram: samples follow a lumpy histogram bin by bin and uniformly within
// bins, never from empty bins; the density integrates to 1 and vanishes outside the range; the
// mapping from uniform values is monotonic and sends the extremes to the ends of the drawable bins.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <vector>

#include "exBase.h"
#include "rnHistogramRng.h"
#include "rnNumRecUniformRng.h"
#include "rnTestSupport.h"
#include "rnUniformHistogram.h"

namespace Zr {
namespace {

// Over [-1, 2), with empty bins at the start, in the middle and at the end.
const std::vector<float> lumpyWeights = {0, 1, 0, 3, 6, 2, 0, 8, 0.5f, 0};
const double lumpySum = 20.5;

RnUniformHistogram<float> makeLumpy() {
    RnUniformHistogram<float> h(static_cast<int>(lumpyWeights.size()), -1.0f, 2.0f);
    for (std::size_t i = 0; i < lumpyWeights.size(); ++i) h.setBin(static_cast<int>(i), lumpyWeights[i]);
    h.setTotal(static_cast<float>(lumpySum));
    return h;
}

TEST(RnHistogramRng, SamplesFollowTheHistogramBinByBinAndUniformlyWithinBins) {
    const RnUniformHistogram<float> h = makeLumpy();
    RnNumRecUniformRng<float> uniform;
    RnHistogramRng<float> rng(h, &uniform);
    // Each bin split into quarters, each expecting a quarter of the bin's share: this sees both a
    // wrong choice of bin and a wrong placement within it.
    const int quarters = 4, nbCells = h.getNbBins() * quarters, nbDraws = 205000;
    std::vector<double> observed(nbCells, 0.0), expected(nbCells, 0.0);
    for (int c = 0; c < nbCells; ++c) expected[c] = nbDraws * lumpyWeights[c / quarters] / lumpySum / quarters;
    for (int i = 0; i < nbDraws; ++i) {
        const float x = rng();
        ASSERT_GE(x, -1.0f);
        ASSERT_LT(x, 2.0f);
        const int bin = h.findBin(x);
        ASSERT_GT(lumpyWeights[bin], 0.0f) << "drew from an empty bin at " << x;
        const double within = (x - h.getBinStart(bin)) / (h.getBinEnd(bin) - h.getBinStart(bin));
        observed[bin * quarters + std::min(quarters - 1, static_cast<int>(within * quarters))] += 1;
    }
    int degrees = -1;  // the counts add up to nbDraws
    for (double e : expected) degrees += e > 0 ? 1 : 0;
    EXPECT_LT(RnTest::chiSquare(observed, expected), RnTest::chiSquareCritical999(degrees));
}

TEST(RnHistogramRng, DensityIsTheBinShareOverTheBinWidthAndZeroOutside) {
    const RnUniformHistogram<float> h = makeLumpy();
    RnNumRecUniformRng<float> uniform;
    const RnHistogramRng<float> rng(h, &uniform);
    const double width = 3.0 / lumpyWeights.size();
    // A midpoint Riemann sum on a grid not aligned with the bins; each of the eleven edges can put
    // at most one step's worth of error into it.
    const int steps = 300007;
    const double dx = 3.0 / steps;
    double integral = 0.0;
    for (int k = 0; k < steps; ++k) {
        const float x = static_cast<float>(-1.0 + (k + 0.5) * dx);
        const float p = rng.getPdf(x);
        integral += p * dx;
        ASSERT_NEAR(p, lumpyWeights[h.findBin(x)] / lumpySum / width, 1e-5) << x;
    }
    EXPECT_NEAR(integral, 1.0, 11 * dx * (8 / lumpySum / width));
    const float inf = std::numeric_limits<float>::infinity();
    for (float x : {-inf, -1e30f, std::nextafter(-1.0f, -2.0f), 2.0f, 1e30f, inf, std::numeric_limits<float>::quiet_NaN()}) {
        EXPECT_EQ(rng.getPdf(x), 0.0f) << x;
    }
}

TEST(RnHistogramRng, UniformValuesMapMonotonicallyAndExtremesToTheDrawableEnds) {
    const RnUniformHistogram<float> h = makeLumpy();
    std::vector<float> script;
    for (int i = 0; i < 4096; ++i) script.push_back(static_cast<float>(i) / 4096.0f);
    RnTest::ScriptedRng<float> ascending(script);
    RnHistogramRng<float> monotonic(h, &ascending);
    float previous = -INFINITY;
    for (std::size_t i = 0; i < script.size(); ++i) {
        const float x = monotonic();
        ASSERT_GE(x, previous) << i;
        previous = x;
    }
    EXPECT_EQ(ascending.getNbDrawn(), script.size());  // one uniform value per sample

    RnTest::ScriptedRng<float> extremes({0.0f, std::nextafter(1.0f, 0.0f), 1.0f, -0.5f});
    RnHistogramRng<float> rng(h, &extremes);
    EXPECT_EQ(rng(), h.getBinStart(1));  // the first bin with weight
    const float high = rng();            // inside the last bin with weight, just below its end
    EXPECT_EQ(h.findBin(high), 8);
    EXPECT_LT(high, h.getBinEnd(8));
    EXPECT_GT(high, h.getBinEnd(8) - 1e-5f);
    EXPECT_EQ(h.findBin(rng()), 8);  // a source straying out of [0, 1) is held to the ends
    EXPECT_EQ(rng(), h.getBinStart(1));
}

TEST(RnHistogramRng, KeepsASnapshotOfTheHistogram) {
    RnUniformHistogram<float> h = makeLumpy();
    RnNumRecUniformRng<float> u1, u2;
    RnHistogramRng<float> a(h, &u1);
    const float pdfBefore = a.getPdf(-0.5f);
    for (int i = 0; i < h.getNbBins(); ++i) h.setBin(i, 1.0f);
    RnHistogramRng<float> b(makeLumpy(), &u2);
    for (int i = 0; i < 1000; ++i) ASSERT_EQ(a(), b());
    EXPECT_EQ(a.getPdf(-0.5f), pdfBefore);
}

TEST(RnHistogramRng, UnusableHistogramsAndMissingSourcesAreAssertionFailures) {
    RnNumRecUniformRng<float> uniform;
    const float bad[][2] = {{0.0f, 0.0f}, {2.0f, -1.0f}, {0.0f, std::numeric_limits<float>::infinity()}};
    for (const auto& [first, second] : bad) {
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
