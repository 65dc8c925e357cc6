// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geLinearMatrix2.h"

namespace Zr {

template struct GeLinearMatrix2<float>;
template struct GeLinearMatrix2<double>;

}  // namespace Zr
