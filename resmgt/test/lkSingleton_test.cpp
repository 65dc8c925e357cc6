// The typed singleton through its whole life: racing first demands, its states, failed
// allocation and the order of destruction at exit.
#include "lkSingleton.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cstdio>
#include <latch>
#include <new>
#include <thread>
#include <vector>

#include "exBase.h"

namespace Zr {

// Puts a singleton back to its first state.
template <class T>
struct LkSingletonTestPeer {
    static LkLock* getInitLock() { return LkSingleton<T>::_initLock.load(); }
    static void restart() {
        delete LkSingleton<T>::_initLock.exchange(nullptr);
        LkSingleton<T>::_state.store(LkSingletonBase::UNINITIALIZED), LkSingleton<T>::_pointee = nullptr;
    }
};

namespace {

// Counts constructions and destructions; the constructor yields so that racing threads overlap.
struct RaceObject {
    static inline std::atomic<int> made{0}, deleted{0};
    RaceObject() {
        ++made;
        for (int i = 0; i < 20; ++i) std::this_thread::yield();
    }
    ~RaceObject() { ++deleted; }
};

TEST(LkSingleton, ThreadsRacingTheFirstDemandMakeOneObjectAndKeepOneLock) {
    using Peer = LkSingletonTestPeer<RaceObject>;
    LkSingletonDestroyer<RaceObject>::destroy();  // makes the destroyer's own lock before counting
    for (int round = 0; round < 30; ++round) {
        Peer::restart();
        RaceObject::made = 0;
        RaceObject::deleted = 0;
        const int locksBefore = LkLockWindows::getLiveCount();
        std::latch start(8);
        std::vector<RaceObject*> seen(8, nullptr);
        std::vector<std::thread> threads;
        for (int t = 0; t < 8; ++t)
            threads.emplace_back([&, t] { start.arrive_and_wait(), seen[t] = LkSingleton<RaceObject>::getInstance(); });
        for (std::thread& t : threads) t.join();
        EXPECT_EQ(RaceObject::made.load(), 1) << "round " << round;
        ASSERT_NE(seen[0], nullptr);
        for (RaceObject* p : seen) EXPECT_EQ(p, seen[0]) << "round " << round;
        EXPECT_EQ(LkLockWindows::getLiveCount(), locksBefore + 1) << "round " << round;
        ASSERT_NE(Peer::getInitLock(), nullptr);
        EXPECT_STREQ(Peer::getInitLock()->getName(), "LkSingleton init lock");
        LkSingletonDestroyer<RaceObject>::destroy();
        EXPECT_EQ(RaceObject::deleted.load(), 1) << "round " << round;
    }
}

struct LifeProbe {
    static inline int made = 0, deleted = 0;
    LifeProbe() { ++made; }
    ~LifeProbe() { ++deleted; }
};

// Each state with its name and invariants; destroyed stays destroyed, answering null.
TEST(LkSingleton, LifeRunsThroughTheThreeStatesAndEndsWithNull) {
    using S = LkSingleton<LifeProbe>;
    const auto expectState = [](int state, const char* name) {
        EXPECT_EQ(S::getState(), state);
        EXPECT_STREQ(S::getStateName(), name);
        EXPECT_NO_THROW(S::checkClassInvariants());
    };
    expectState(LkSingletonBase::UNINITIALIZED, "UNINITIALIZED");
    LifeProbe* first = S::getInstance();
    ASSERT_NE(first, nullptr);
    S::initSingleton();
    EXPECT_EQ(S::getInstance(), first);
    EXPECT_EQ(LifeProbe::made, 1);
    expectState(LkSingletonBase::INITIALIZED, "INITIALIZED");
    LkSingletonDestroyer<LifeProbe>::destroy();
    EXPECT_EQ(LifeProbe::deleted, 1);
    expectState(LkSingletonBase::DESTROYED, "DESTROYED");
    EXPECT_EQ(S::getInstance(), nullptr);
    LkSingletonDestroyer<LifeProbe>::destroy();
    EXPECT_EQ(LifeProbe::made * 10 + LifeProbe::deleted, 11);
}

// Allocation that gives nothing fails and leaves the singleton uninitialized, free to try again.
struct NoMemoryObject {
    static void* operator new(std::size_t, const std::nothrow_t&) noexcept { return nullptr; }
    static void operator delete(void* p) noexcept { ::operator delete(p); }
};

TEST(LkSingleton, FailedAllocationLeavesItUninitialized) {
    for (int attempt = 0; attempt < 2; ++attempt) {
        EXPECT_THROW(LkSingleton<NoMemoryObject>::getInstance(), ExAssertionFailed);
        EXPECT_EQ(LkSingleton<NoMemoryObject>::getState(), LkSingletonBase::UNINITIALIZED);
    }
}

// At exit the later-made singleton ends first, so one that used another while being built can
// still use it while being destroyed.
struct InnerAtExit {
    ~InnerAtExit() { std::fputs("inner destroyed\n", stderr); }
};
struct OuterAtExit {
    OuterAtExit() { (void)LkSingleton<InnerAtExit>::getInstance(); }
    ~OuterAtExit() {
        std::fputs(LkSingleton<InnerAtExit>::getInstance() ? "outer destroyed, inner alive\n" : "inner gone\n", stderr);
    }
};

TEST(LkSingletonDeathTest, ExitDestroysSingletonsInReverseOrderOfMaking) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT((void)LkSingleton<OuterAtExit>::getInstance(); std::exit(0), ::testing::ExitedWithCode(0),
                "outer destroyed, inner alive\ninner destroyed");
}

}  // namespace
}  // namespace Zr
