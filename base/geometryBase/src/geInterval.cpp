// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geInterval.h"

namespace Zr {

template struct GeInterval<int>;
template struct GeInterval<float>;
template struct GeInterval<double>;

}  // namespace Zr
