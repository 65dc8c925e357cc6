#include "rnHistogram.h"

#include "assertions.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = ".\\resmgt/rnHistogram.cpp";
}

template <class T>
RnHistogram<T>::RnHistogram(int nbBins, T min, T max) : _min(min), _max(max) {
    ZR_ASSERT_AT(nbBins >= 1, kSourceFile, __LINE__);
    ZR_ASSERT_AT(min < max, kSourceFile, __LINE__);
    _bins.assign(static_cast<std::size_t>(nbBins), T(0));
}

template <class T>
RnHistogram<T>::~RnHistogram() = default;

template <class T>
void RnHistogram<T>::checkBin(int bin) const {
    ZR_ASSERT_AT(bin >= 0 && bin < getNbBins(), kSourceFile, __LINE__);
}

template <class T>
T RnHistogram<T>::getBin(int bin) const {
    checkBin(bin);
    return _bins[static_cast<std::size_t>(bin)];
}

template <class T>
void RnHistogram<T>::setBin(int bin, T weight) {
    checkBin(bin);
    _bins[static_cast<std::size_t>(bin)] = weight;
}

template <class T>
T& RnHistogram<T>::operator[](int bin) {
    checkBin(bin);
    return _bins[static_cast<std::size_t>(bin)];
}

template <class T>
const T& RnHistogram<T>::operator[](int bin) const {
    checkBin(bin);
    return _bins[static_cast<std::size_t>(bin)];
}

template <class T>
bool RnHistogram<T>::addSample(T value, T weight) {
    const int bin = findBin(value);
    if (bin < 0 || bin >= getNbBins()) return false;
    _bins[static_cast<std::size_t>(bin)] += weight;
    _total += weight;
    return true;
}

template class RnHistogram<float>;
template class RnHistogram<double>;

}  // namespace Zr
