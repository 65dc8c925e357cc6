// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "gePoint2.h"

namespace Zr {

template struct GePoint2<float>;
template struct GePoint2<double>;

}  // namespace Zr
