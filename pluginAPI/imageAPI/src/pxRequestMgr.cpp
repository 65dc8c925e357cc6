#include "pxRequestMgr.h"

#include "exRenderCancelled.h"
#include "lkSingleton.h"

namespace Zr {

PxRequestMgr::PxRequestMgr() = default;

PxRequestMgr::~PxRequestMgr() = default;

PxRequestMgr* PxRequestMgr::getInstance() { return LkSingleton<PxRequestMgr>::getInstance(); }

void PxRequestMgr::checkInterrupt() {
    const unsigned flags = _flags.load(std::memory_order_relaxed);
    if (flags == 0) return;
    if (flags & CANCEL_REQUESTED) throw ExRenderCancelled();
    if (flags & HANDLER_INSTALLED) {
        // Called outside the lock with a reference of its own, so that the handler may throw,
        // take time or replace itself without blocking other threads.
        RCShdPtr<PxInterruptHandler> handler = getInterruptHandler();
        if (handler) handler->onInterruptCheck();
    }
}

void PxRequestMgr::setInterruptHandler(const RCShdPtr<PxInterruptHandler>& handler) {
    RCShdPtr<PxInterruptHandler> previous;
    {
        LkLockGuard guard(_handlerLock);
        previous = _handler;
        _handler = handler;
        if (handler) {
            _flags.fetch_or(HANDLER_INSTALLED, std::memory_order_release);
        } else {
            _flags.fetch_and(~static_cast<unsigned>(HANDLER_INSTALLED), std::memory_order_release);
        }
    }
    // The old handler, if this was its last reference, dies here, outside the lock.
}

RCShdPtr<PxInterruptHandler> PxRequestMgr::getInterruptHandler() const {
    LkLockGuard guard(_handlerLock);
    return _handler;
}

void PxRequestMgr::requestCancel() { _flags.fetch_or(CANCEL_REQUESTED, std::memory_order_release); }

void PxRequestMgr::clearCancel() {
    _flags.fetch_and(~static_cast<unsigned>(CANCEL_REQUESTED), std::memory_order_release);
}

bool PxRequestMgr::isCancelRequested() const {
    return (_flags.load(std::memory_order_acquire) & CANCEL_REQUESTED) != 0;
}

}  // namespace Zr
