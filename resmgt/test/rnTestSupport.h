#pragma once
// Support for the generators' tests: Pearson's chi-square statistic with a fixed critical value,
// and a generator that replays a script. The generators are deterministic, so each test computes
// one fixed statistic; the 99.9th percentile is passed with room by a sound generator and failed
// by far by a biased one.
#include <cmath>
#include <cstddef>
#include <utility>
#include <vector>

#include "rnRng.h"

namespace Zr::RnTest {

// Sum over cells of (observed - expected)^2 / expected; a cell expected empty that is not adds
// infinity.
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

// The 99.9th percentile of chi-square by the Wilson-Hilferty cube-root normal approximation,
// which errs slightly high (3% at one degree, under 1% from ten on).
inline double chiSquareCritical999(int degreesOfFreedom) {
    const double k = degreesOfFreedom;
    const double c = 2.0 / (9.0 * k);
    return k * std::pow(1.0 - c + 3.090232306167813 * std::sqrt(c), 3.0);
}

// Replays a fixed list of values, cycling, to steer consumers onto exact values such as 0 and
// the largest value below 1.
template <class T>
class ScriptedRng : public RnRng<T> {
public:
    explicit ScriptedRng(std::vector<T> values) : _values(std::move(values)) {}
    T eval() override {
        const T v = _values[_next];
        _next = (_next + 1) % _values.size();
        ++_nbDrawn;
        return v;
    }
    std::size_t getNbDrawn() const { return _nbDrawn; }

private:
    std::vector<T> _values;
    std::size_t _next = 0;
    std::size_t _nbDrawn = 0;
};

}  // namespace Zr::RnTest
