#pragma once
// Decides whether work in progress goes on. Long loops (the rasteriser, once per scanline) call
// checkInterrupt(); it returns when the work may continue and throws when it is to stop.
//
// Two ways to stop work, both safe from any thread:
// - requestCancel(): every following check throws ExRenderCancelled until clearCancel();
// - an installed PxInterruptHandler, called on every check, which may throw whatever it likes
//   (ExRenderCancelled by convention) and may also count checks as a measure of progress.
// With neither in use a check is one relaxed atomic load.
#include <atomic>

#include "lkLock.h"
#include "pxInterruptHandler.h"
#include "rcShdPtr.h"

namespace Zr {

class PxRequestMgr {
public:
    PxRequestMgr();
    virtual ~PxRequestMgr();
    PxRequestMgr(const PxRequestMgr&) = delete;
    PxRequestMgr& operator=(const PxRequestMgr&) = delete;

    // The process-wide manager; null only after the end of the library's life.
    static PxRequestMgr* getInstance();

    // Returns if the work goes on; throws ExRenderCancelled after requestCancel(), or whatever the
    // installed handler throws.
    virtual void checkInterrupt();

    // Installs the handler called on each check; a null pointer removes it. A check already
    // running on another thread may still call the previous handler once.
    void setInterruptHandler(const RCShdPtr<PxInterruptHandler>& handler);
    RCShdPtr<PxInterruptHandler> getInterruptHandler() const;

    void requestCancel();
    void clearCancel();
    bool isCancelRequested() const;

private:
    enum Flags : unsigned { CANCEL_REQUESTED = 1u, HANDLER_INSTALLED = 2u };

    // Fast-path summary of the state below; zero means "nothing to do".
    std::atomic<unsigned> _flags{0};
    // Guards _handler, which an RCShdPtr cannot make atomic by itself.
    mutable LkLock _handlerLock{"PxRequestMgr handler lock"};
    RCShdPtr<PxInterruptHandler> _handler;
};

}  // namespace Zr
