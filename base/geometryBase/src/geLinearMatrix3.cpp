// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geLinearMatrix3.h"

namespace Zr {

template struct GeLinearMatrix3<float>;
template struct GeLinearMatrix3<double>;

}  // namespace Zr
