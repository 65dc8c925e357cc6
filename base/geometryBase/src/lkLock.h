#pragma once
// The named lock of the system, and a scoped holder of it.
#include "lkLockWindows.h"

namespace Zr {

class LkLock : public LkLockWindows {
public:
    explicit LkLock(const char* name) : LkLockWindows(name) {}
};

// Holds a lock for its scope when lock() granted it.
class LkLockGuard {
public:
    explicit LkLockGuard(LkLockWindows& lock) : _lock(lock), _held(lock.lock()) {}
    ~LkLockGuard() {
        if (_held) _lock.unlock();
    }
    LkLockGuard(const LkLockGuard&) = delete;
    LkLockGuard& operator=(const LkLockGuard&) = delete;

    bool isHeld() const { return _held; }

private:
    LkLockWindows& _lock;
    bool _held;
};

}  // namespace Zr
