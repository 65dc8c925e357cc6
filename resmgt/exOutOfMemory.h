#pragma once
// Raised when memory for pixels or other large blocks cannot be had, in place of the standard
// library's allocation failure, so that a host catching ExBase sees every failure of the system.
#include "exBase.h"

namespace Zr {

class ExOutOfMemory : public ExBase {
public:
    using ExBase::ExBase;
};

}  // namespace Zr
