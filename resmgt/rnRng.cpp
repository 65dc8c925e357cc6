#include "rnRng.h"

namespace Zr {

template <class T>
RnRng<T>::~RnRng() = default;

template class RnRng<float>;
template class RnRng<double>;

}  // namespace Zr
