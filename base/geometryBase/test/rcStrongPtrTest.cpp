#include "rcStrongPtr.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <random>
#include <thread>
#include <vector>

#include "countingObjects.h"
#include "exBase.h"
#include "rcWeakPtr.h"

namespace Zr::Testing {
namespace {

// Random operations over strong and weak slots, checked against a model: the strong count of an
// object is the number of strong slots holding it; it is deleted exactly when that reaches 0; a
// weak slot locks to the object while it lives and to nothing afterwards.
TEST(RCStrongPtrTest, StrongAndWeakFollowAModelOverRandomOperations) {
    for (unsigned seed = 1; seed <= 20; ++seed) {
        LifeCounts counts;
        {
            constexpr int slotCount = 5;
            std::vector<RCStrongPtr<PlainBase>> strong(slotCount);
            std::vector<RCWeakPtr<PlainBase>> weak(slotCount);
            std::vector<int> strongModel(slotCount, -1), weakModel(slotCount, -1);
            int nextId = 0;
            std::mt19937 rng(seed);
            auto holders = [&](int id) {
                return static_cast<int>(std::count(strongModel.begin(), strongModel.end(), id));
            };
            for (int step = 0; step < 400; ++step) {
                const int a = static_cast<int>(rng() % slotCount);
                const int b = static_cast<int>(rng() % slotCount);
                switch (rng() % 8) {
                case 0:
                    strong[a] = RCStrongPtr<PlainBase>(new CountedPlain(counts, nextId));
                    strongModel[a] = nextId++;
                    break;
                case 1:
                    strong[a] = strong[b];
                    strongModel[a] = strongModel[b];
                    break;
                case 2:
                    strong[a] = std::move(strong[b]);
                    if (a != b) {
                        strongModel[a] = strongModel[b];
                        strongModel[b] = -1;
                    }
                    break;
                case 3:
                    strong[a].reset();
                    strongModel[a] = -1;
                    break;
                case 4:
                    weak[a] = strong[b];
                    weakModel[a] = strongModel[b];
                    break;
                case 5:
                    weak[a] = weak[b];
                    weakModel[a] = weakModel[b];
                    break;
                case 6: {
                    // Lock a weak slot into a strong one.
                    strong[a] = weak[b].lock();
                    const int id = weakModel[b];
                    strongModel[a] = id >= 0 && holders(id) > 0 ? id : -1;
                    break;
                }
                case 7:
                    strong[a] = strong[a];
                    break;
                }
                int modelAlive = 0;
                for (int id = 0; id < nextId; ++id) modelAlive += holders(id) > 0 ? 1 : 0;
                ASSERT_EQ(counts.alive(), modelAlive) << "seed " << seed << " step " << step;
                for (int s = 0; s < slotCount; ++s) {
                    const int id = strongModel[s];
                    ASSERT_EQ(strong[s].isNull(), id < 0);
                    ASSERT_EQ(strong[s].getStrongCount(), id < 0 ? 0 : holders(id));
                    if (id >= 0) {
                        ASSERT_EQ(strong[s]->getId(), id);
                    }
                    const int weakId = weakModel[s];
                    const bool weakLives = weakId >= 0 && holders(weakId) > 0;
                    ASSERT_EQ(weak[s].isExpired(), !weakLives);
                }
            }
        }
        EXPECT_EQ(counts.deleted, counts.made) << "seed " << seed;
    }
}

// Made as a derived type without virtual destructor and held as the base, the object is still
// deleted as what it was made.
TEST(RCStrongPtrTest, DeletesWithTheTypeItWasMadeWith) {
    LifeCounts counts;
    {
        RCStrongPtr<PlainBase> base(new CountedPlain(counts, 4));
        RCStrongPtr<const PlainBase> constBase = base;
        EXPECT_EQ(base.getStrongCount(), 2);
        EXPECT_EQ(constBase->getId(), 4);
    }
    EXPECT_EQ(counts.made, 1);
    EXPECT_EQ(counts.deleted, 1);
}

TEST(RCStrongPtrTest, WeakPointerOutlivesTheObjectAndNeverRevivesIt) {
    LifeCounts counts;
    RCWeakPtr<CountedPlain> observer;
    {
        RCStrongPtr<CountedPlain> owner = makeStrong<CountedPlain>(counts, 9);
        observer = owner;
        RCStrongPtr<CountedPlain> locked = observer.lock();
        EXPECT_EQ(locked.get(), owner.get());
        EXPECT_EQ(owner.getStrongCount(), 2);
    }
    EXPECT_EQ(counts.deleted, 1);
    EXPECT_TRUE(observer.isExpired());
    EXPECT_TRUE(observer.lock().isNull());
    RCWeakPtr<PlainBase> copy = observer;  // the block is still there to be shared
    EXPECT_TRUE(copy.isExpired());
    EXPECT_TRUE(RCWeakPtr<PlainBase>().isExpired());
}

TEST(RCStrongPtrTest, SelfAssignmentAndSwapKeepTheObject) {
    LifeCounts counts;
    RCStrongPtr<CountedPlain> a = makeStrong<CountedPlain>(counts, 1);
    RCStrongPtr<CountedPlain> b = makeStrong<CountedPlain>(counts, 2);
    RCStrongPtr<CountedPlain>& alias = a;
    a = alias;
    a = std::move(alias);
    EXPECT_EQ(counts.deleted, 0);
    EXPECT_EQ(a.getStrongCount(), 1);
    a.swap(b);
    EXPECT_EQ(a->getId(), 2);
    EXPECT_EQ(b->getId(), 1);
    a.reset(new CountedPlain(counts, 3));
    EXPECT_EQ(counts.deleted, 1);
    EXPECT_EQ(a->getId(), 3);
}

TEST(RCStrongPtrTest, DereferencingAnEmptyPointerThrowsExNullPtr) {
    RCStrongPtr<PlainBase> empty;
    EXPECT_EQ(empty.getStrongCount(), 0);
    EXPECT_THROW((void)empty->getId(), ExNullPtr);
    EXPECT_THROW((void)*empty, ExNullPtr);
    RCStrongPtr<PlainBase> fromNull(static_cast<PlainBase*>(nullptr));
    EXPECT_TRUE(fromNull.isNull());
    EXPECT_EQ(fromNull.getStrongCount(), 0);
}

// One thread drops the last strong reference while others lock weak pointers: every lock either
// gets a live object or nothing, and the object is deleted exactly once.
TEST(RCStrongPtrTest, WeakLocksRacingTheLastReleaseNeverSeeADeadObject) {
    for (int round = 0; round < 50; ++round) {
        LifeCounts counts;
        std::atomic<int> deletedSeenAlive{0};
        RCStrongPtr<CountedPlain> owner = makeStrong<CountedPlain>(counts, round);
        RCWeakPtr<CountedPlain> observer = owner;
        std::atomic<bool> go{false};
        std::vector<std::thread> threads;
        for (int t = 0; t < 3; ++t) {
            threads.emplace_back([&] {
                while (!go.load()) std::this_thread::yield();
                for (int i = 0; i < 200; ++i) {
                    RCStrongPtr<CountedPlain> p = observer.lock();
                    if (p && p->getId() != round) ++deletedSeenAlive;
                }
            });
        }
        go = true;
        owner.reset();
        for (std::thread& t : threads) t.join();
        EXPECT_EQ(deletedSeenAlive.load(), 0);
        EXPECT_EQ(counts.deleted, 1);
        EXPECT_TRUE(observer.isExpired());
    }
}

}  // namespace
}  // namespace Zr::Testing
