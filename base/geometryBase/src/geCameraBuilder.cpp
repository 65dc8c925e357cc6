// Explicit instantiations for the precisions in use, so that every member is compiled once here.
#include "geCameraBuilder.h"

namespace Zr {

template class GeCameraBuilder<float>;
template class GeCameraBuilder<double>;

}  // namespace Zr
