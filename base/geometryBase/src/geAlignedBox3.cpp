// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geAlignedBox3.h"

namespace Zr {

template struct GeAlignedBox3<float>;
template struct GeAlignedBox3<double>;

}  // namespace Zr
