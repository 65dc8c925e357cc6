#pragma once
// Draws values distributed as a histogram describes: a bin is chosen with probability
// proportional to its weight, and the value is uniform within the bin. The density is thus
// piecewise constant over the histogram's range and integrates to 1 over it.
#include <vector>

#include "rnHistogram.h"
#include "rnRng.h"

namespace Zr {

template <class T>
class RnHistogramRng {
public:
    // Takes a snapshot of the histogram's edges and weights: later changes to the histogram
    // do not reach the generator. The weights are normalised by their own sum (the histogram's
    // total is not consulted), so they must be non-negative with a positive sum. rng supplies
    // the uniform values, one per draw; it is not owned and must outlive this generator.
    RnHistogramRng(const RnHistogram<T>& histogram, RnRng<T>* rng);

    // The next value, in [min, max) of the histogram, never in a bin of weight 0.
    T eval();
    T operator()() { return eval(); }

    // The density at value: the bin's share of the weights divided by the bin's width (as the
    // histogram's getBinWidth gives it), and 0 outside [min, max).
    T getPdf(T value) const;

    T getMin() const { return _edges.front(); }
    T getMax() const { return _edges.back(); }

private:
    int findBin(T value) const;

    RnRng<T>* _rng;
    std::vector<T> _edges;         // nbBins + 1 ascending edges
    std::vector<double> _weights;  // per bin
    std::vector<double> _cumulative;  // nbBins + 1 partial sums of _weights, from 0
    std::vector<T> _density;       // per bin
};

extern template class RnHistogramRng<float>;
extern template class RnHistogramRng<double>;

}  // namespace Zr
