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
// weak slot locks to the object while it lives and to nothing afterwards. The objects are
// CountedPlain held as PlainBase, which has no virtual destructor: deleting one as the base
// would skip the counting destructor and break the model.
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

// Conversions to a base or const type share the count; a weak pointer converted after its
// object died stays expired. (Self-assignment and locking are in the model test above.)
TEST(RCStrongPtrTest, ConversionsSwapAndResetKeepTheCounts) {
    LifeCounts counts;
    RCWeakPtr<CountedPlain> observer;
    {
        RCStrongPtr<CountedPlain> owner = makeStrong<CountedPlain>(counts, 9);
        RCStrongPtr<const PlainBase> constBase = owner;
        observer = owner;
        EXPECT_EQ(owner.getStrongCount(), 2);
        EXPECT_EQ(constBase->getId(), 9);
    }
    EXPECT_EQ(counts.deleted, 1);
    RCWeakPtr<PlainBase> copy = observer;  // the block is still there to be shared
    EXPECT_TRUE(copy.isExpired());
    EXPECT_TRUE(RCWeakPtr<PlainBase>().isExpired());

    RCStrongPtr<CountedPlain> a = makeStrong<CountedPlain>(counts, 1);
    RCStrongPtr<CountedPlain> b = makeStrong<CountedPlain>(counts, 2);
    a.swap(b);
    EXPECT_EQ(a->getId(), 2);
    EXPECT_EQ(b->getId(), 1);
    a.reset(new CountedPlain(counts, 3));
    EXPECT_EQ(counts.deleted, 2);
    EXPECT_EQ(a->getId(), 3);
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
