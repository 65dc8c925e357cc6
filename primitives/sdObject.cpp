#include "sdObject.h"

namespace Zr {

const RttiTypeBase& SdObject::getType() const { return RttiClassType::getInstance(); }

}  // namespace Zr
