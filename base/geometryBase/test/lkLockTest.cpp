#include "lkLock.h"

#include <gtest/gtest.h>

#include <thread>
#include <vector>

#include "lkCounter.h"

namespace Zr::Testing {
namespace {

// Many threads add to a plain integer under the lock: without mutual exclusion increments would
// be lost. The atomic counter, changed without any lock, must come out the same.
TEST(LkLockTest, GuardedWorkAndAtomicCountsLoseNoIncrement) {
    LkLock lock("test lock");
    LkCounter<int> atomicCount;
    long plainCount = 0;
    constexpr int threadCount = 4;
    constexpr int perThread = 20000;
    std::vector<std::thread> threads;
    for (int t = 0; t < threadCount; ++t) {
        threads.emplace_back([&] {
            for (int i = 0; i < perThread; ++i) {
                atomicCount.increment();
                LkLockGuard guard(lock);
                ASSERT_TRUE(guard.isHeld());
                ++plainCount;
            }
        });
    }
    for (std::thread& t : threads) t.join();
    EXPECT_EQ(plainCount, threadCount * perThread);
    EXPECT_EQ(atomicCount.get(), threadCount * perThread);
}

TEST(LkLockTest, LiveCountFollowsConstructionAndDestruction) {
    const int before = LkLockWindows::getLiveCount();
    {
        LkLock a("a");
        {
            LkLock b("b");
            EXPECT_EQ(LkLockWindows::getLiveCount(), before + 2);
        }
        EXPECT_EQ(LkLockWindows::getLiveCount(), before + 1);
    }
    EXPECT_EQ(LkLockWindows::getLiveCount(), before);
}

TEST(LkCounterTest, IncrementIfNotZeroNeverLeavesZero) {
    LkCounter<int> zero;
    EXPECT_FALSE(zero.incrementIfNotZero());
    EXPECT_EQ(zero.get(), 0);
    LkCounter<int> counter(3);
    EXPECT_TRUE(counter.incrementIfNotZero());
    EXPECT_EQ(counter.get(), 4);
    for (int expected = 3; expected >= 0; --expected) EXPECT_EQ(counter.decrement(), expected);
    EXPECT_FALSE(counter.incrementIfNotZero());
}

}  // namespace
}  // namespace Zr::Testing
