#pragma once
// The platform form of the named lock: a mutual-exclusion object whose lock() says whether it
// was taken. Callers unlock only after a true answer, and use the guard pattern on every way out.
#include <mutex>

namespace Zr {

class LkLockWindows {
public:
    explicit LkLockWindows(const char* name);
    ~LkLockWindows();
    LkLockWindows(const LkLockWindows&) = delete;
    LkLockWindows& operator=(const LkLockWindows&) = delete;

    // Blocks until the lock is held. Always true here: the mutex either locks or throws.
    bool lock() {
        _mutex.lock();
        return true;
    }
    bool tryLock() { return _mutex.try_lock(); }
    void unlock() { _mutex.unlock(); }
    const char* getName() const { return _name; }

    // How many locks exist in the process right now: a diagnostic, so that tests can see that
    // code making locks on demand keeps exactly the ones it means to.
    static int getLiveCount();

private:
    std::mutex _mutex;
    const char* _name;  // for diagnostics; the text must outlive the lock (a literal)
};

}  // namespace Zr
