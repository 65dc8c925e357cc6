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

// Lets the tests put a singleton back to its first state, and into states only a fault produces.
template <class T>
struct LkSingletonTestPeer {
    static void setState(int state) { LkSingleton<T>::_state.store(state); }
    static void setPointee(T* p) { LkSingleton<T>::_pointee = p; }
    static LkLock* getInitLock() { return LkSingleton<T>::_initLock.load(); }
    static void restart() {
        delete LkSingleton<T>::_initLock.exchange(nullptr);
        LkSingleton<T>::_pointee = nullptr;
        LkSingleton<T>::_state.store(LkSingletonBase::UNINITIALIZED);
    }
};

namespace Testing {
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

TEST(LkSingletonTest, ThreadsRacingTheFirstDemandMakeOneObjectAndKeepOneLock) {
    using Peer = LkSingletonTestPeer<RaceObject>;
    LkSingletonDestroyer<RaceObject>::destroy();  // makes the destroyer's own lock before counting
    constexpr int threadCount = 8;
    for (int round = 0; round < 30; ++round) {
        Peer::restart();
        RaceObject::made = 0;
        RaceObject::deleted = 0;
        const int locksBefore = LkLockWindows::getLiveCount();
        std::latch start(threadCount);
        std::vector<RaceObject*> seen(threadCount, nullptr);
        std::vector<std::thread> threads;
        for (int t = 0; t < threadCount; ++t) {
            threads.emplace_back([&, t] {
                start.arrive_and_wait();
                seen[t] = LkSingleton<RaceObject>::getInstance();
            });
        }
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

// The whole life of one singleton: each state, its name, its invariants, and what each
// operation does there. Destroyed stays destroyed: no new object, no failure.
TEST(LkSingletonTest, LifeRunsThroughTheThreeStatesAndEndsWithNull) {
    using S = LkSingleton<LifeProbe>;
    const auto expectState = [](int state, const char* name) {
        EXPECT_EQ(S::getState(), state);
        EXPECT_STREQ(S::getStateName(), name);
        EXPECT_NO_THROW(S::checkClassInvariants());
    };
    expectState(LkSingletonBase::UNINITIALIZED, "UNINITIALIZED");
    LifeProbe* first = S::getInstance();
    ASSERT_NE(first, nullptr);
    EXPECT_EQ(S::getInstance(), first);
    S::initSingleton();
    EXPECT_EQ(LifeProbe::made, 1);
    expectState(LkSingletonBase::INITIALIZED, "INITIALIZED");
    LkSingletonDestroyer<LifeProbe>::destroy();
    EXPECT_EQ(LifeProbe::deleted, 1);
    expectState(LkSingletonBase::DESTROYED, "DESTROYED");
    LifeProbe* late = reinterpret_cast<LifeProbe*>(1);
    EXPECT_NO_THROW(late = S::getInstance());
    EXPECT_EQ(late, nullptr);
    EXPECT_NO_THROW(S::initSingleton());
    LkSingletonDestroyer<LifeProbe>::destroy();
    EXPECT_EQ(LifeProbe::made, 1);
    EXPECT_EQ(LifeProbe::deleted, 1);
}

template <class Ex>
void expectFailure(void (*operation)(), int line, const char* text) {
    try {
        operation();
        ADD_FAILURE() << "no exception for line " << line;
    } catch (const Ex& e) {
        EXPECT_EQ(e.getFile(), ".\\resmgt/lkSingleton.imp");
        EXPECT_EQ(e.getLine(), line);
        if (text) {
            EXPECT_EQ(e.getMessage(), text);
        }
    }
}

struct InvariantProbe {};

// States that only a fault could produce are reported with the source place and condition.
TEST(LkSingletonTest, ClassInvariantsReportEachBrokenState) {
    using Peer = LkSingletonTestPeer<InvariantProbe>;
    using S = LkSingleton<InvariantProbe>;
    InvariantProbe object;
    struct Case {
        int state;
        InvariantProbe* pointee;
        int line;
        const char* text;
    };
    const Case cases[] = {
        {LkSingletonBase::UNINITIALIZED, &object, 214, "_pointee == 0"},
        {LkSingletonBase::INITIALIZED, nullptr, 218, "_pointee != 0"},
        {LkSingletonBase::DESTROYED, &object, 222, "_pointee == 0"},
        {3, nullptr, 226, nullptr},  // no state at all: the program is aborted
        {-1, &object, 226, nullptr},
    };
    for (const Case& c : cases) {
        Peer::setState(c.state);
        Peer::setPointee(c.pointee);
        if (c.text) {
            expectFailure<ExAssertionFailed>(&S::checkClassInvariants, c.line, c.text);
        } else {
            expectFailure<ExProgramAborted>(&S::checkClassInvariants, c.line, nullptr);
            expectFailure<ExProgramAborted>([] { (void)S::getStateName(); }, 199, nullptr);
        }
    }
    Peer::restart();
    EXPECT_NO_THROW(S::checkClassInvariants());
}

// Allocation that gives nothing is reported, and leaves the singleton uninitialized with its lock
// released, free to try again.
struct NoMemoryObject {
    static void* operator new(std::size_t, const std::nothrow_t&) noexcept { return nullptr; }
    static void operator delete(void* p) noexcept { ::operator delete(p); }
};

TEST(LkSingletonTest, AllocationGivingNothingIsAnAssertionAndReleasesTheLock) {
    for (int attempt = 0; attempt < 2; ++attempt) {
        expectFailure<ExAssertionFailed>([] { (void)LkSingleton<NoMemoryObject>::getInstance(); }, 128,
                                         "pointee");
        EXPECT_EQ(LkSingleton<NoMemoryObject>::getState(), LkSingletonBase::UNINITIALIZED);
    }
    EXPECT_NO_THROW(LkSingleton<NoMemoryObject>::checkClassInvariants());
}

// At exit the later-made singleton ends first, so one that used another while being built can
// still use it while being destroyed.
struct InnerAtExit {
    ~InnerAtExit() { std::fputs("inner destroyed\n", stderr); }
};
struct OuterAtExit {
    OuterAtExit() { (void)LkSingleton<InnerAtExit>::getInstance(); }
    ~OuterAtExit() {
        const bool innerAlive = LkSingleton<InnerAtExit>::getInstance() != nullptr;
        std::fputs(innerAlive ? "outer destroyed, inner alive\n" : "outer destroyed, inner gone\n", stderr);
    }
};

TEST(LkSingletonDeathTest, ExitDestroysSingletonsInReverseOrderOfMaking) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT(
        {
            (void)LkSingleton<OuterAtExit>::getInstance();
            std::exit(0);
        },
        ::testing::ExitedWithCode(0), "outer destroyed, inner alive\ninner destroyed");
}

}  // namespace
}  // namespace Testing
}  // namespace Zr
