#pragma once
// Raised through PxRequestMgr::checkInterrupt when the host cancels the work under way. It leaves
// the renderer like any other failure; what finished regions wrote stays in the tile.
#include <string>
#include <utility>

#include "exBase.h"

namespace Zr {

class ExRenderCancelled : public ExBase {
public:
    using ExBase::ExBase;
    // The failure reported by the request manager's own cancel flag.
    ExRenderCancelled() : ExBase(".\\pluginAPI/imageAPI/src/pxRequestMgr.cpp", 0, "render cancelled") {}
    explicit ExRenderCancelled(std::string message)
        : ExBase(".\\pluginAPI/imageAPI/src/pxRequestMgr.cpp", 0, std::move(message)) {}
};

}  // namespace Zr
