// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "coRgbColorTyped.h"

namespace Zr {

template struct CoRgbColorTyped<float>;
template struct CoRgbColorTyped<double>;

}  // namespace Zr
