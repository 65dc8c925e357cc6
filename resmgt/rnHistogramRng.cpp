#include "rnHistogramRng.h"

#include <algorithm>
#include <cmath>

#include "assertions.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = ".\\resmgt/rnHistogramRng.cpp";
}

template <class T>
RnHistogramRng<T>::RnHistogramRng(const RnHistogram<T>& histogram, RnRng<T>* rng) : _rng(rng) {
    ZR_ASSERT_AT(rng != 0, kSourceFile, __LINE__);
    const int n = histogram.getNbBins();
    _edges.reserve(static_cast<std::size_t>(n) + 1);
    _weights.reserve(static_cast<std::size_t>(n));
    _cumulative.reserve(static_cast<std::size_t>(n) + 1);
    _cumulative.push_back(0.0);
    // Partial sums in double, so that thousands of float bins still sum without visible loss.
    for (int i = 0; i < n; ++i) {
        const double weight = static_cast<double>(histogram.getBin(i));
        ZR_ASSERT_AT(weight >= 0.0 && std::isfinite(weight), kSourceFile, __LINE__);
        _edges.push_back(histogram.getBinStart(i));
        _weights.push_back(weight);
        _cumulative.push_back(_cumulative.back() + weight);
    }
    _edges.push_back(histogram.getBinEnd(n - 1));
    const double sum = _cumulative.back();
    ZR_ASSERT_AT(sum > 0.0 && std::isfinite(sum), kSourceFile, __LINE__);

    _density.reserve(static_cast<std::size_t>(n));
    for (int i = 0; i < n; ++i) {
        const double width = static_cast<double>(histogram.getBinWidth(i));
        // A bin that can be drawn needs room for its values.
        ZR_ASSERT_AT(_weights[i] == 0.0 || width > 0.0, kSourceFile, __LINE__);
        _density.push_back(_weights[i] == 0.0 ? T(0) : static_cast<T>(_weights[i] / sum / width));
    }
}

template <class T>
T RnHistogramRng<T>::eval() {
    double u = static_cast<double>(_rng->eval());
    // A source that strays from [0, 1) is held to its ends (NaN to the low one).
    if (!(u > 0.0)) u = 0.0;
    if (u > 1.0) u = 1.0;
    const double target = u * _cumulative.back();
    // The bin whose slice of the cumulative weight holds target. Bins of weight 0 have empty
    // slices and are skipped by the search.
    const auto above = std::upper_bound(_cumulative.begin(), _cumulative.end(), target);
    int bin = static_cast<int>(above - _cumulative.begin()) - 1;
    const int last = static_cast<int>(_weights.size()) - 1;
    // target can round up to the full sum; then the last bin that has weight takes it.
    if (bin > last) bin = last;
    while (_weights[bin] == 0.0) --bin;

    const double within = std::clamp((target - _cumulative[bin]) / _weights[bin], 0.0, 1.0);
    const T start = _edges[bin];
    const T end = _edges[bin + 1];
    T value = static_cast<T>(static_cast<double>(start) +
                             within * (static_cast<double>(end) - static_cast<double>(start)));
    // Rounding must not carry the value onto the bin's upper edge, which belongs to the next
    // bin (or lies outside the range).
    if (value >= end) value = std::nextafter(end, start);
    if (value < start) value = start;
    return value;
}

template <class T>
int RnHistogramRng<T>::findBin(T value) const {
    if (!(value >= _edges.front()) || !(value < _edges.back())) return -1;
    const auto above = std::upper_bound(_edges.begin(), _edges.end(), value);
    return static_cast<int>(above - _edges.begin()) - 1;
}

template <class T>
T RnHistogramRng<T>::getPdf(T value) const {
    const int bin = findBin(value);
    return bin < 0 ? T(0) : _density[static_cast<std::size_t>(bin)];
}

template class RnHistogramRng<float>;
template class RnHistogramRng<double>;

}  // namespace Zr
