// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geVector2.h"

namespace Zr {

template struct GeVector2<float>;
template struct GeVector2<double>;

}  // namespace Zr
