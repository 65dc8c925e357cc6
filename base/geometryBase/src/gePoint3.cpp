// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "gePoint3.h"

namespace Zr {

template struct GePoint3<float>;
template struct GePoint3<double>;

}  // namespace Zr
