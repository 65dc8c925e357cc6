// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geScale3.h"

namespace Zr {

template struct GeScale3<float>;
template struct GeScale3<double>;

}  // namespace Zr
