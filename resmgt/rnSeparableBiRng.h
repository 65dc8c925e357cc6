#pragma once
// Pairs of independent uniform values, for two-dimensional samples such as lens offsets: each
// coordinate is drawn on its own from the same one-dimensional generator.
#include "rnRng.h"

namespace Zr {

template <class T>
class RnSeparableBiRng {
public:
    // rng is not owned and must outlive this object; null is an assertion failure.
    explicit RnSeparableBiRng(RnRng<T>* rng);

    // Two values in [0, 1): first the one for x, then the one for y, as two consecutive draws.
    void getSample(T& x, T& y);

private:
    RnRng<T>* _rng;
};

extern template class RnSeparableBiRng<float>;
extern template class RnSeparableBiRng<double>;

}  // namespace Zr
