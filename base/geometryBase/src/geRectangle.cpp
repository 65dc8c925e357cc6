// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geRectangle.h"

namespace Zr {

template struct GeRectangle<int>;
template struct GeRectangle<float>;
template struct GeRectangle<double>;

}  // namespace Zr
