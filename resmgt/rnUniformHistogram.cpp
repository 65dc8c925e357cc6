#include "rnUniformHistogram.h"

#include <algorithm>
#include <cmath>

#include "assertions.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = ".\\resmgt/rnUniformHistogram.cpp";
}

template <class T>
RnUniformHistogram<T>::RnUniformHistogram(int nbBins, T min, T max)
    : RnHistogram<T>(nbBins, min, max) {
    // The width must be a number for the lookup's arithmetic to mean anything.
    ZR_ASSERT_AT(std::isfinite(max - min), kSourceFile, __LINE__);
}

template <class T>
RnUniformHistogram<T>::~RnUniformHistogram() = default;

template <class T>
T RnUniformHistogram<T>::edge(int i) const {
    const int n = this->getNbBins();
    if (i >= n) return this->getMax();
    const T min = this->getMin();
    // Each operation rounds monotonically, so the edges never descend.
    return min + (this->getMax() - min) * T(i) / T(n);
}

template <class T>
int RnUniformHistogram<T>::findBin(T value) const {
    const int n = this->getNbBins();
    // Written so that NaN fails the first test.
    if (!(value >= this->getMin())) return -1;
    if (!(value < this->getMax())) return n;

    const T min = this->getMin();
    const T fraction = (value - min) / (this->getMax() - min);
    int bin = std::clamp(static_cast<int>(std::floor(fraction * T(n))), 0, n - 1);
    // The scaled position can round across an edge; stepping puts the value in the bin whose
    // stated edges hold it. One step at most, unless the bins are a few ulps wide.
    while (bin > 0 && value < edge(bin)) --bin;
    while (bin < n - 1 && value >= edge(bin + 1)) ++bin;
    return bin;
}

template <class T>
T RnUniformHistogram<T>::getBinStart(int bin) const {
    ZR_ASSERT_AT(bin >= 0 && bin < this->getNbBins(), kSourceFile, __LINE__);
    return edge(bin);
}

template <class T>
T RnUniformHistogram<T>::getBinEnd(int bin) const {
    ZR_ASSERT_AT(bin >= 0 && bin < this->getNbBins(), kSourceFile, __LINE__);
    return edge(bin + 1);
}

template <class T>
T RnUniformHistogram<T>::getBinWidth(int bin) const {
    ZR_ASSERT_AT(bin >= 0 && bin < this->getNbBins(), kSourceFile, __LINE__);
    return (this->getMax() - this->getMin()) / T(this->getNbBins());
}

template class RnUniformHistogram<float>;
template class RnUniformHistogram<double>;

}  // namespace Zr
