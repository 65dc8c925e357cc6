// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "coRgbaColorTyped.h"

namespace Zr {

template struct CoRgbaColorTyped<float>;
template struct CoRgbaColorTyped<double>;

}  // namespace Zr
