// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geAffineMatrix3.h"

namespace Zr {

template struct GeAffineMatrix3<float>;
template struct GeAffineMatrix3<double>;

}  // namespace Zr
