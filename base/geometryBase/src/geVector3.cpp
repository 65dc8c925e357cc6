// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geVector3.h"

namespace Zr {

template struct GeVector3<float>;
template struct GeVector3<double>;

}  // namespace Zr
