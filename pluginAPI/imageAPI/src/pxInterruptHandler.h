#pragma once
// The host's hook into long-running work. The request manager calls it on each interrupt check,
// that is once per scanline of each rasterised triangle, on the rendering thread. It may count
// progress, and it stops the work by throwing, normally ExRenderCancelled.
#include "rcBase.h"

namespace Zr {

class PxInterruptHandler : public RCObject {
public:
    // Called on each check; returns to let the work go on, throws to stop it. Keep it cheap.
    virtual void onInterruptCheck() = 0;

protected:
    PxInterruptHandler() = default;
};

}  // namespace Zr
