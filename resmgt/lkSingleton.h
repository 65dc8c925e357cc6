#pragma once
// A typed singleton: one T per process, made on first demand by whichever thread asks first and
// destroyed when the process (or the library holding the last reference to the code) ends.
//
//   PxRequestMgr* mgr = LkSingleton<PxRequestMgr>::getInstance();
//
// T needs a default constructor. The fast path of getInstance reads the state without the lock;
// creation is serialised by "LkSingleton init lock", destruction by
// "LkSingletonDestroyer final lock". Once destroyed the singleton stays destroyed: getInstance then
// answers null, without failure, so that code running late in process shutdown can test for it.
#include <atomic>

#include "lkLock.h"

namespace Zr {

// What every LkSingleton shares regardless of T: the states and their names.
class LkSingletonBase {
public:
    enum State { UNINITIALIZED = 0, INITIALIZED = 1, DESTROYED = 2 };

    // "UNINITIALIZED", "INITIALIZED" or "DESTROYED"; any other value is a program fault.
    static const char* getStateName(int state);

protected:
    LkSingletonBase() = default;
};

template <class T>
class LkSingletonDestroyer;

// Grants a test suite access to the statics of one singleton type. Not defined by the library;
// a test may define it to drive a singleton into states it cannot otherwise reach.
template <class T>
struct LkSingletonTestPeer;

template <class T>
class LkSingleton : public LkSingletonBase {
public:
    LkSingleton() = delete;

    // The one T, made now if this is the first demand; null once the singleton was destroyed.
    static T* getInstance();
    // Makes the one T if it does not exist yet.
    static void initSingleton();

    static State getState() { return static_cast<State>(_state.load(std::memory_order_acquire)); }
    static const char* getStateName() { return LkSingletonBase::getStateName(_state.load()); }
    // Checks that the object exists exactly in state INITIALIZED; throws ExAssertionFailed if not.
    static void checkClassInvariants();

private:
    friend class LkSingletonDestroyer<T>;
    friend struct LkSingletonTestPeer<T>;

    // Makes the lock behind slot on first use. Of threads racing here one lock is installed and
    // the losers delete theirs.
    static LkLock& lockOnDemand(std::atomic<LkLock*>& slot, const char* name);

    // The state is read without the lock on the fast path, hence atomic: a reader that sees
    // INITIALIZED also sees the _pointee stored before it.
    static inline std::atomic<int> _state{UNINITIALIZED};
    static inline T* _pointee = nullptr;
    static inline std::atomic<LkLock*> _initLock{nullptr};
};

// Ends the singleton of T. An instance is kept as a function-local static made right after the
// first T, so that it is destroyed at the end of the library's life, before any static object
// constructed before that T (including singletons T itself used while being built).
template <class T>
class LkSingletonDestroyer {
public:
    LkSingletonDestroyer() = default;
    ~LkSingletonDestroyer() { destroy(); }
    LkSingletonDestroyer(const LkSingletonDestroyer&) = delete;
    LkSingletonDestroyer& operator=(const LkSingletonDestroyer&) = delete;

    // Deletes the T if there is one and moves to DESTROYED. Runs at exit by itself; tests may call
    // it earlier. Running it again does no harm.
    static void destroy();

private:
    static inline std::atomic<LkLock*> _finalLock{nullptr};
};

}  // namespace Zr

#include "lkSingleton.imp"
