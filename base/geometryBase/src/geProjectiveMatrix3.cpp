// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geProjectiveMatrix3.h"

namespace Zr {

template struct GeProjectiveMatrix3<float>;
template struct GeProjectiveMatrix3<double>;

}  // namespace Zr
