// Shared, strong, weak and owning pointers against a model of who holds what; locks and counters.
#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "baseTestSupport.h"
#include "exBase.h"
#include "lkLock.h"
#include "oPtr.h"
#include "rcShdPtr.h"
#include "rcWeakPtr.h"

namespace Zr::BaseTest {
namespace {

// Random copies, moves, resets and self-assignments over slots of shared pointers and, in step, of
// strong pointers with weak observers: an object's count is the number of slots holding it, it is
// deleted exactly when none does (as the type it was made with: PlainBase has no virtual
// destructor), and a weak slot locks to the object while it lives and to nothing afterwards.
TEST(RCShdPtr, SharedStrongAndWeakPointersFollowAModelOfOwnership) {
    for (unsigned seed = 1; seed <= 20; ++seed) {
        LifeCounts sharedCounts, strongCounts;
        {
            constexpr int slotCount = 6;
            std::vector<RCShdPtr<CountedShared>> shared(slotCount);
            std::vector<RCStrongPtr<PlainBase>> strong(slotCount);
            std::vector<RCWeakPtr<PlainBase>> weak(slotCount);
            std::vector<int> model(slotCount, -1), weakModel(slotCount, -1);  // object ids, -1 for empty
            std::vector<CountedShared*> objects;  // by id; valid while the model holds it
            std::mt19937 rng(seed);
            const auto holders = [&](int id) { return id < 0 ? 0 : int(std::count(model.begin(), model.end(), id)); };
            for (int step = 0; step < 400; ++step) {
                const int a = static_cast<int>(rng() % slotCount), b = static_cast<int>(rng() % slotCount);
                switch (rng() % 9) {
                case 0: {
                    const int id = static_cast<int>(objects.size());
                    shared[a] = makeShared<CountedShared>(sharedCounts, id);
                    strong[a] = RCStrongPtr<PlainBase>(new CountedPlain(strongCounts, id));
                    objects.push_back(shared[a].get());
                    model[a] = id;
                    break;
                }
                case 1: shared[a] = shared[b], strong[a] = strong[b], model[a] = model[b]; break;
                case 2:
                    shared[a] = std::move(shared[b]), strong[a] = std::move(strong[b]);
                    if (a != b) model[a] = model[b], model[b] = -1;
                    break;
                case 3: shared[a] = nullptr, strong[a].reset(), model[a] = -1; break;
                case 4:
                    shared[a] = RCShdPtr<CountedShared>(shared[b]), strong[a] = RCStrongPtr<PlainBase>(strong[b]);
                    model[a] = model[b];
                    break;
                case 5: shared[a] = shared[a], strong[a] = strong[a]; break;
                case 6: shared[a].reset(shared[b].get()), strong[a] = strong[b], model[a] = model[b]; break;
                case 7: weak[a] = strong[b], weak[b] = weak[a], weakModel[a] = weakModel[b] = model[b]; break;
                case 8: {
                    const int id = holders(weakModel[b]) > 0 ? weakModel[b] : -1;
                    strong[a] = weak[b].lock();
                    shared[a] = id < 0 ? RCShdPtr<CountedShared>() : RCShdPtr<CountedShared>(objects[id]);
                    model[a] = id;
                    break;
                }
                }
                int alive = 0;
                for (int id = 0; id < static_cast<int>(objects.size()); ++id) {
                    if (holders(id) == 0) continue;
                    ++alive;
                    ASSERT_EQ(objects[id]->getReferenceCount(), holders(id)) << "seed " << seed;
                }
                ASSERT_EQ(sharedCounts.alive(), alive) << "seed " << seed << " step " << step;
                ASSERT_EQ(strongCounts.alive(), alive) << "seed " << seed << " step " << step;
                for (int s = 0; s < slotCount; ++s) {
                    ASSERT_EQ(shared[s].isNull(), model[s] < 0);
                    ASSERT_EQ(strong[s].isNull(), model[s] < 0);
                    ASSERT_EQ(strong[s].getStrongCount(), holders(model[s]));
                    if (model[s] >= 0) { ASSERT_EQ(shared[s]->getId() + strong[s]->getId(), 2 * model[s]); }
                    ASSERT_EQ(weak[s].isExpired(), holders(weakModel[s]) == 0);
                }
            }
        }
        EXPECT_EQ(sharedCounts.deleted, sharedCounts.made) << "seed " << seed;
        EXPECT_EQ(strongCounts.deleted, strongCounts.made) << "seed " << seed;
    }
}

TEST(RCShdPtr, ConversionsShareTheCountAndDynamicCastGivesTheObjectOrEmpty) {
    LifeCounts counts;
    RCShdPtr<DerivedShared> derived = makeShared<DerivedShared>(counts, 3);
    {
        RCShdPtr<const DerivedShared> constView = derived;
        RCShdPtr<CountedShared> base;
        base = derived;
        const RCShdPtr<const CountedShared> moved = std::move(constView);
        EXPECT_TRUE(constView.isNull());
        EXPECT_EQ(derived->getReferenceCount(), 3);
        RCShdPtr<CountedShared> plain = makeShared<CountedShared>(counts);
        EXPECT_EQ(dynamicPointerCast<DerivedShared>(base).get(), derived.get());
        EXPECT_TRUE(dynamicPointerCast<DerivedShared>(plain).isNull());
        EXPECT_EQ(plain->getReferenceCount(), 1);
    }
    EXPECT_EQ(derived->getReferenceCount(), 1);
    derived = nullptr;
    EXPECT_EQ(counts.deleted, 2);
}

TEST(RCStrongPtr, ConversionsSwapAndResetKeepTheCounts) {
    LifeCounts counts;
    RCWeakPtr<CountedPlain> observer;
    {
        RCStrongPtr<CountedPlain> owner = makeStrong<CountedPlain>(counts, 9);
        const RCStrongPtr<const PlainBase> constBase = owner;
        observer = owner;
        EXPECT_EQ(owner.getStrongCount() * constBase->getId(), 18);
    }
    EXPECT_EQ(counts.deleted, 1);
    EXPECT_TRUE(RCWeakPtr<PlainBase>(observer).isExpired());  // converted after the object died
    RCStrongPtr<CountedPlain> a = makeStrong<CountedPlain>(counts, 1), b = makeStrong<CountedPlain>(counts, 2);
    a.swap(b);
    EXPECT_EQ(a->getId() * 10 + b->getId(), 21);
    EXPECT_TRUE(a == a && !(a == b));
    a.reset(new CountedPlain(counts, 3));
    EXPECT_EQ(counts.deleted * 10 + a->getId(), 23);
}

TEST(OPtr, OwnershipMovesWithTheValueAndTheLastOwnerDeletesOnce) {
    LifeCounts counts;
    {
        OPtr<DerivedShared> derived = makeOwned<DerivedShared>(counts, 1);
        OPtr<const CountedShared> owner = std::move(derived);  // deletes through the base
        OPtr<const CountedShared> other = makeOwned<CountedShared>(counts, 2);
        owner = std::move(other);
        EXPECT_TRUE(derived.isNull() && other.isNull() && owner->getId() == 2);
        EXPECT_EQ(counts.deleted, 1);
        OPtr<const CountedShared>& alias = owner;
        owner = std::move(alias);  // self-move keeps the object
        owner.reset(owner.get());  // as does resetting to the object held
        const CountedShared* raw = owner.release();
        EXPECT_TRUE(owner.isNull());
        EXPECT_EQ(counts.deleted, 1);
        owner = OPtr<const CountedShared>(raw);
    }
    EXPECT_EQ(counts.deleted, 2);
}

TEST(PointerTest, DereferencingAnEmptyPointerThrowsExNullPtrNamingTheType) {
    EXPECT_FALSE(static_cast<bool>(RCShdPtr<CountedShared>()));
    try {
        (void)RCShdPtr<CountedShared>()->getId();
        FAIL() << "no exception";
    } catch (const ExNullPtr& e) {
        EXPECT_NE(e.getMessage().find(typeid(CountedShared).name()), std::string::npos);
    }
    EXPECT_THROW((void)*RCShdPtr<const CountedShared>(), ExNullPtr);
    EXPECT_THROW((void)*RCStrongPtr<PlainBase>(static_cast<PlainBase*>(nullptr)), ExNullPtr);
    EXPECT_THROW((void)OPtr<CountedShared>()->getId(), ExNullPtr);
}

// Threads add to a plain integer under the lock: without mutual exclusion increments would be
// lost. The atomic counter, changed without a lock, must come out the same.
TEST(LkLock, GuardedWorkAndAtomicCountsLoseNoIncrement) {
    const int locksBefore = LkLockWindows::getLiveCount();
    LkLock lock("test lock");
    EXPECT_EQ(LkLockWindows::getLiveCount(), locksBefore + 1);
    LkCounter<int> atomicCount;
    long plainCount = 0;
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([&] {
            for (int i = 0; i < 20000; ++i) {
                atomicCount.increment();
                LkLockGuard guard(lock);
                ASSERT_TRUE(guard.isHeld());
                ++plainCount;
            }
        });
    }
    for (std::thread& t : threads) t.join();
    EXPECT_EQ(plainCount, 4 * 20000);
    EXPECT_EQ(atomicCount.get(), 4 * 20000);
    EXPECT_TRUE(lock.tryLock());  // every guard let go
    lock.unlock();
    { LkLock other("other"); }
    EXPECT_EQ(LkLockWindows::getLiveCount(), locksBefore + 1);
}

}  // namespace
}  // namespace Zr::BaseTest
