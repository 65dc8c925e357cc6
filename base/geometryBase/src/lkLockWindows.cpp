#include "lkLockWindows.h"

#include <atomic>

namespace Zr {

namespace {
std::atomic<int> liveLocks{0};
}

LkLockWindows::LkLockWindows(const char* name) : _name(name ? name : "") {
    liveLocks.fetch_add(1, std::memory_order_relaxed);
}

LkLockWindows::~LkLockWindows() { liveLocks.fetch_sub(1, std::memory_order_relaxed); }

int LkLockWindows::getLiveCount() { return liveLocks.load(std::memory_order_relaxed); }

}  // namespace Zr
