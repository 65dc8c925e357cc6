#pragma once
// A histogram whose bins all have the same width: (max - min) / nbBins.
#include "rnHistogram.h"

namespace Zr {

template <class T>
class RnUniformHistogram : public RnHistogram<T> {
public:
    // nbBins at least 1 and min less than max, else an assertion failure.
    RnUniformHistogram(int nbBins, T min, T max);
    RnUniformHistogram(const RnUniformHistogram&) = default;
    RnUniformHistogram& operator=(const RnUniformHistogram&) = default;
    ~RnUniformHistogram() override;

    int findBin(T value) const override;
    T getBinStart(int bin) const override;
    T getBinEnd(int bin) const override;

    // (max - min) / nbBins for every bin. The edges are rounded to T one by one, so their
    // distances scatter by a rounding error around this; a density measured against the
    // common width stays the same in every bin of equal weight.
    T getBinWidth(int bin) const override;

private:
    // The edge below bin i for i from 0 to nbBins: min + (max - min) * i / nbBins, with the
    // last edge exactly max. Computed the same way everywhere so that lookups and edges agree.
    T edge(int i) const;
};

extern template class RnUniformHistogram<float>;
extern template class RnUniformHistogram<double>;

}  // namespace Zr
