#include "lkSingleton.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cstdio>
#include <latch>
#include <new>
#include <string>
#include <thread>
#include <vector>

#include "exBase.h"

namespace Zr {

// Lets the tests put a singleton back to its first state, and into states that only a fault
// could produce.
template <class T>
struct LkSingletonTestPeer {
    static void setState(int state) { LkSingleton<T>::_state.store(state); }
    static void setPointee(T* p) { LkSingleton<T>::_pointee = p; }
    static LkLock* getInitLock() { return LkSingleton<T>::_initLock.load(); }
    // Back to UNINITIALIZED with no object and no init lock, as at load time.
    static void restart() {
        delete LkSingleton<T>::_initLock.exchange(nullptr);
        LkSingleton<T>::_pointee = nullptr;
        LkSingleton<T>::_state.store(LkSingletonBase::UNINITIALIZED);
    }
};

namespace Testing {
namespace {

const char* const impPath = ".\\resmgt/lkSingleton.imp";

// Counts constructions and destructions; the constructor yields so that racing threads overlap.
struct RaceObject {
    static inline std::atomic<int> made{0};
    static inline std::atomic<int> deleted{0};
    RaceObject() {
        ++made;
        for (int i = 0; i < 20; ++i) std::this_thread::yield();
    }
    ~RaceObject() { ++deleted; }
};

using RacePeer = LkSingletonTestPeer<RaceObject>;

TEST(LkSingletonTest, ThreadsRacingTheFirstDemandMakeOneObjectAndKeepOneLock) {
    // Make the destroyer's lock once, so that it does not count in the rounds below.
    LkSingletonDestroyer<RaceObject>::destroy();
    constexpr int threadCount = 8;
    for (int round = 0; round < 30; ++round) {
        RacePeer::restart();
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
        ASSERT_NE(RacePeer::getInitLock(), nullptr);
        EXPECT_STREQ(RacePeer::getInitLock()->getName(), "LkSingleton init lock");
        EXPECT_EQ(LkSingleton<RaceObject>::getState(), LkSingletonBase::INITIALIZED);

        LkSingletonDestroyer<RaceObject>::destroy();
        EXPECT_EQ(RaceObject::deleted.load(), 1) << "round " << round;
    }
}

struct LifeProbe {
    static inline int made = 0;
    static inline int deleted = 0;
    LifeProbe() { ++made; }
    ~LifeProbe() { ++deleted; }
};

// The whole life of one singleton: every state, what each operation does there, and the
// invariants holding in each.
TEST(LkSingletonTest, LifeRunsThroughTheThreeStatesAndEndsWithNull) {
    using S = LkSingleton<LifeProbe>;
    EXPECT_EQ(S::getState(), LkSingletonBase::UNINITIALIZED);
    EXPECT_STREQ(S::getStateName(), "UNINITIALIZED");
    EXPECT_NO_THROW(S::checkClassInvariants());

    LifeProbe* first = S::getInstance();
    ASSERT_NE(first, nullptr);
    EXPECT_EQ(S::getInstance(), first);
    S::initSingleton();
    EXPECT_EQ(LifeProbe::made, 1);
    EXPECT_EQ(S::getState(), LkSingletonBase::INITIALIZED);
    EXPECT_STREQ(S::getStateName(), "INITIALIZED");
    EXPECT_NO_THROW(S::checkClassInvariants());

    LkSingletonDestroyer<LifeProbe>::destroy();
    EXPECT_EQ(LifeProbe::deleted, 1);
    EXPECT_EQ(S::getState(), LkSingletonBase::DESTROYED);
    EXPECT_STREQ(S::getStateName(), "DESTROYED");
    EXPECT_NO_THROW(S::checkClassInvariants());

    // Destroyed stays destroyed: no new object, no failure.
    LifeProbe* late = reinterpret_cast<LifeProbe*>(1);
    EXPECT_NO_THROW(late = S::getInstance());
    EXPECT_EQ(late, nullptr);
    EXPECT_NO_THROW(S::initSingleton());
    LkSingletonDestroyer<LifeProbe>::destroy();
    EXPECT_EQ(LifeProbe::made, 1);
    EXPECT_EQ(LifeProbe::deleted, 1);
}

struct InvariantProbe {};
using InvariantPeer = LkSingletonTestPeer<InvariantProbe>;

template <class Ex>
void expectFailure(void (*operation)(), int line, const char* text) {
    try {
        operation();
        ADD_FAILURE() << "no exception for line " << line;
    } catch (const Ex& e) {
        EXPECT_EQ(e.getFile(), impPath);
        EXPECT_EQ(e.getLine(), line);
        if (text) {
            EXPECT_EQ(e.getMessage(), text);
        }
    }
}

// States that only a fault could produce are reported with the source place and condition.
TEST(LkSingletonTest, ClassInvariantsReportEachBrokenState) {
    InvariantProbe object;
    struct Case {
        int state;
        InvariantProbe* pointee;
        int line;
        const char* text;
        bool aborted;
    };
    const Case cases[] = {
        {LkSingletonBase::UNINITIALIZED, &object, 214, "_pointee == 0", false},
        {LkSingletonBase::INITIALIZED, nullptr, 218, "_pointee != 0", false},
        {LkSingletonBase::DESTROYED, &object, 222, "_pointee == 0", false},
        {3, nullptr, 226, nullptr, true},
        {-1, &object, 226, nullptr, true},
    };
    for (const Case& c : cases) {
        InvariantPeer::setState(c.state);
        InvariantPeer::setPointee(c.pointee);
        if (c.aborted) {
            expectFailure<ExProgramAborted>(&LkSingleton<InvariantProbe>::checkClassInvariants, c.line,
                                            c.text);
            expectFailure<ExProgramAborted>(
                [] { (void)LkSingleton<InvariantProbe>::getStateName(); }, 199, nullptr);
        } else {
            expectFailure<ExAssertionFailed>(&LkSingleton<InvariantProbe>::checkClassInvariants,
                                             c.line, c.text);
        }
    }
    InvariantPeer::restart();
    EXPECT_NO_THROW(LkSingleton<InvariantProbe>::checkClassInvariants());
}

// Allocation that gives nothing is reported, and leaves the singleton free to try again.
struct NoMemoryObject {
    static void* operator new(std::size_t, const std::nothrow_t&) noexcept { return nullptr; }
    static void operator delete(void* p) noexcept { ::operator delete(p); }
};

TEST(LkSingletonTest, AllocationGivingNothingIsAnAssertionAndReleasesTheLock) {
    for (int attempt = 0; attempt < 2; ++attempt) {
        expectFailure<ExAssertionFailed>([] { (void)LkSingleton<NoMemoryObject>::getInstance(); },
                                         128, "pointee");
        EXPECT_EQ(LkSingleton<NoMemoryObject>::getState(), LkSingletonBase::UNINITIALIZED);
    }
    EXPECT_NO_THROW(LkSingleton<NoMemoryObject>::checkClassInvariants());
}

struct FailsOnce {
    static inline int attempts = 0;
    FailsOnce() {
        if (++attempts == 1) throw std::runtime_error("first construction fails");
    }
};

TEST(LkSingletonTest, AConstructorFailurePassesThroughAndALaterDemandSucceeds) {
    EXPECT_THROW(LkSingleton<FailsOnce>::getInstance(), std::runtime_error);
    EXPECT_EQ(LkSingleton<FailsOnce>::getState(), LkSingletonBase::UNINITIALIZED);
    EXPECT_NE(LkSingleton<FailsOnce>::getInstance(), nullptr);
    EXPECT_EQ(FailsOnce::attempts, 2);
    LkSingletonDestroyer<FailsOnce>::destroy();
}

// At process exit the destroyer ends each singleton, the later-made first, so that a singleton
// that used another while being built can still use it while being destroyed.
struct InnerAtExit {
    ~InnerAtExit() { std::fputs("inner destroyed\n", stderr); }
};
struct OuterAtExit {
    OuterAtExit() { (void)LkSingleton<InnerAtExit>::getInstance(); }
    ~OuterAtExit() {
        const bool innerAlive = LkSingleton<InnerAtExit>::getInstance() != nullptr;
        std::fputs(innerAlive ? "outer destroyed, inner alive\n" : "outer destroyed, inner gone\n",
                   stderr);
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
