#include "rnSeparableBiRng.h"

#include "assertions.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = ".\\resmgt/rnSeparableBiRng.cpp";
}

template <class T>
RnSeparableBiRng<T>::RnSeparableBiRng(RnRng<T>* rng) : _rng(rng) {
    ZR_ASSERT_AT(rng != 0, kSourceFile, __LINE__);
}

template <class T>
void RnSeparableBiRng<T>::getSample(T& x, T& y) {
    x = _rng->eval();
    y = _rng->eval();
}

template class RnSeparableBiRng<float>;
template class RnSeparableBiRng<double>;

}  // namespace Zr
