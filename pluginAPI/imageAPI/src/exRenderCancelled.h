#pragma once
// Raised through PxRequestMgr::checkInterrupt when the host cancels the work under way. It leaves
// the renderer like any other failure; what finished regions wrote stays in the tile.
#include <string>
#include <utility>

#include "exBase.h"

namespace Zr {

namespace ExRenderCancelledSource {
// The request manager, whose cancel flag raises the failure.
constexpr const char* kSourceFile = ".\\pluginAPI/imageAPI/src/pxRequestMgr.cpp";
}  // namespace ExRenderCancelledSource

class ExRenderCancelled : public ExBase {
public:
    using ExBase::ExBase;
    // The failure reported by the request manager's own cancel flag.
    ExRenderCancelled() : ExBase(ExRenderCancelledSource::kSourceFile, 0, "render cancelled") {}
    explicit ExRenderCancelled(std::string message)
        : ExBase(ExRenderCancelledSource::kSourceFile, 0, std::move(message)) {}
};

}  // namespace Zr
