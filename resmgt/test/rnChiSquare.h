#pragma once
// Pearson's chi-square statistic and a fixed critical value, for the generators' distribution
// tests. The generators are deterministic, so each test computes one fixed statistic; the
// threshold is the 99.9th percentile, which a sound generator passes with room to spare and a
// biased one fails by far.
#include <cmath>
#include <cstddef>
#include <vector>

namespace Zr::RnTest {

// Sum over cells of (observed - expected)^2 / expected. Cells with an expectation of 0 must
// stay empty; each one that does not adds infinity.
inline double chiSquare(const std::vector<double>& observed, const std::vector<double>& expected) {
    double sum = 0.0;
    for (std::size_t i = 0; i < observed.size(); ++i) {
        if (expected[i] == 0.0) {
            if (observed[i] != 0.0) sum = INFINITY;
            continue;
        }
        const double d = observed[i] - expected[i];
        sum += d * d / expected[i];
    }
    return sum;
}

// The 99.9th percentile of the chi-square distribution with the given degrees of freedom, by
// the Wilson-Hilferty cube-root normal approximation (good to a fraction of a percent here).
inline double chiSquareCritical999(int degreesOfFreedom) {
    const double k = degreesOfFreedom;
    const double z = 3.090232306167813;  // standard normal 99.9th percentile
    const double c = 2.0 / (9.0 * k);
    return k * std::pow(1.0 - c + z * std::sqrt(c), 3.0);
}

}  // namespace Zr::RnTest
