// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geHomogeneousCoord3.h"

namespace Zr {

template struct GeHomogeneousCoord3<float>;
template struct GeHomogeneousCoord3<double>;

}  // namespace Zr
