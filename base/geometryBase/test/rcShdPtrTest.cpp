#include "rcShdPtr.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <thread>
#include <vector>

#include "countingObjects.h"
#include "exBase.h"
#include "oPtr.h"
#include "rcStrongPtr.h"

namespace Zr::Testing {
namespace {

// Random copies, moves, resets, self-assignments and swaps over a few pointer slots, checked
// against a model of which object each slot holds: every object's count must equal the number of
// slots holding it, and an object must be deleted exactly when no slot holds it any more.
// Self-assignment, self-move and resetting to the object held are among the operations.
TEST(RCShdPtrTest, CountsFollowAModelOfOwnershipOverRandomOperations) {
    for (unsigned seed = 1; seed <= 20; ++seed) {
        LifeCounts counts;
        {
            constexpr int slotCount = 6;
            std::vector<RCShdPtr<CountedShared>> slots(slotCount);
            std::vector<int> model(slotCount, -1);  // object id per slot, -1 for empty
            std::vector<CountedShared*> objects;   // by id; valid while the model holds it
            std::mt19937 rng(seed);
            for (int step = 0; step < 400; ++step) {
                const int a = static_cast<int>(rng() % slotCount);
                const int b = static_cast<int>(rng() % slotCount);
                switch (rng() % 7) {
                case 0:
                    slots[a] = makeShared<CountedShared>(counts, static_cast<int>(objects.size()));
                    objects.push_back(slots[a].get());
                    model[a] = static_cast<int>(objects.size()) - 1;
                    break;
                case 1:
                    slots[a] = slots[b];
                    model[a] = model[b];
                    break;
                case 2:
                    slots[a] = std::move(slots[b]);
                    if (a != b) {
                        model[a] = model[b];
                        model[b] = -1;
                    }
                    break;
                case 3:
                    slots[a] = nullptr;
                    model[a] = -1;
                    break;
                case 4: {
                    RCShdPtr<CountedShared> copy(slots[b]);
                    slots[a] = copy;
                    model[a] = model[b];
                    break;
                }
                case 5:
                    slots[a] = slots[a];
                    break;
                case 6:
                    slots[a].reset(slots[b].get());
                    model[a] = model[b];
                    break;
                }
                int modelAlive = 0;
                for (std::size_t id = 0; id < objects.size(); ++id) {
                    const int holders = static_cast<int>(std::count(model.begin(), model.end(), id));
                    if (holders > 0) {
                        ++modelAlive;
                        ASSERT_EQ(objects[id]->getReferenceCount(), holders) << "seed " << seed;
                    }
                }
                ASSERT_EQ(counts.alive(), modelAlive) << "seed " << seed << " step " << step;
                for (int s = 0; s < slotCount; ++s) {
                    ASSERT_EQ(slots[s].isNull(), model[s] < 0);
                    if (model[s] >= 0) {
                        ASSERT_EQ(slots[s]->getId(), model[s]);
                    }
                }
            }
        }
        EXPECT_EQ(counts.deleted, counts.made) << "seed " << seed;
    }
}

// A chain where each link owns the next: assigning p = p->next drops the only owner of the old
// head while the new value is reachable only through it. The new reference must be taken first.
class Link : public RCObject {
public:
    Link(LifeCounts& counts, int id) : _counts(counts), id(id) { ++_counts.made; }
    ~Link() override { ++_counts.deleted; }
    LifeCounts& _counts;
    int id;
    RCShdPtr<Link> next;
};

TEST(RCShdPtrTest, AssigningAnObjectOwnedOnlyThroughTheOldValueIsSafe) {
    LifeCounts counts;
    RCShdPtr<Link> head = makeShared<Link>(counts, 0);
    head->next = makeShared<Link>(counts, 1);
    head->next->next = makeShared<Link>(counts, 2);
    for (int expected = 1; expected <= 2; ++expected) {
        head = head->next;
        EXPECT_EQ(head->id, expected);
        EXPECT_EQ(counts.deleted, expected);
        EXPECT_EQ(head->getReferenceCount(), 1);
    }
}

TEST(RCShdPtrTest, ConstAndBaseConversionsShareTheCount) {
    LifeCounts counts;
    RCShdPtr<DerivedShared> derived = makeShared<DerivedShared>(counts, 3);
    {
        RCShdPtr<const DerivedShared> constView = derived;
        RCShdPtr<CountedShared> base = derived;
        RCShdPtr<const CountedShared> constBase = base;
        EXPECT_EQ(derived->getReferenceCount(), 4);
        EXPECT_EQ(constBase->getId(), 3);
        RCShdPtr<const CountedShared> moved = std::move(constView);
        EXPECT_TRUE(constView.isNull());
        EXPECT_EQ(derived->getReferenceCount(), 4);
    }
    EXPECT_EQ(derived->getReferenceCount(), 1);
    derived = nullptr;
    EXPECT_EQ(counts.deleted, 1);
}

TEST(RCShdPtrTest, DynamicCastGivesTheObjectOrEmpty) {
    LifeCounts counts;
    RCShdPtr<CountedShared> asBase = makeShared<DerivedShared>(counts);
    RCShdPtr<CountedShared> plain = makeShared<CountedShared>(counts);
    RCShdPtr<DerivedShared> hit = dynamicPointerCast<DerivedShared>(asBase);
    RCShdPtr<DerivedShared> miss = dynamicPointerCast<DerivedShared>(plain);
    EXPECT_EQ(hit.get(), asBase.get());
    EXPECT_EQ(asBase->getReferenceCount(), 2);
    EXPECT_TRUE(miss.isNull());
    EXPECT_EQ(plain->getReferenceCount(), 1);
}

// For the shared, strong and owning pointers alike.
TEST(PointerTest, DereferencingAnEmptyPointerThrowsExNullPtr) {
    RCShdPtr<CountedShared> empty;
    EXPECT_FALSE(static_cast<bool>(empty));
    try {
        (void)empty->getId();
        FAIL() << "no exception";
    } catch (const ExNullPtr& e) {
        EXPECT_NE(e.getMessage().find(typeid(CountedShared).name()), std::string::npos);  // names the type
    }
    EXPECT_THROW((void)*empty, ExNullPtr);
    EXPECT_THROW((void)*RCShdPtr<const CountedShared>(), ExBase);

    RCStrongPtr<PlainBase> emptyStrong(static_cast<PlainBase*>(nullptr));
    EXPECT_EQ(emptyStrong.getStrongCount(), 0);
    EXPECT_THROW((void)emptyStrong->getId(), ExNullPtr);
    EXPECT_THROW((void)*emptyStrong, ExNullPtr);
    OPtr<CountedShared> emptyOwned;
    EXPECT_TRUE(emptyOwned == nullptr);
    EXPECT_THROW((void)emptyOwned->getId(), ExNullPtr);
    EXPECT_THROW((void)*emptyOwned, ExNullPtr);
}

// Threads copy and drop references to one object; atomic counts leave it with exactly the
// references still held, and it is deleted only by the last.
TEST(RCShdPtrTest, CountsStayExactUnderConcurrentCopies) {
    LifeCounts counts;
    RCShdPtr<CountedShared> shared = makeShared<CountedShared>(counts);
    constexpr int threadCount = 4;
    std::vector<std::thread> threads;
    for (int t = 0; t < threadCount; ++t) {
        threads.emplace_back([&shared] {
            for (int i = 0; i < 20000; ++i) {
                RCShdPtr<CountedShared> copy(shared);
                RCShdPtr<CountedShared> other;
                other = copy;
            }
        });
    }
    for (std::thread& t : threads) t.join();
    EXPECT_EQ(shared->getReferenceCount(), 1);
    EXPECT_EQ(counts.deleted, 0);
    shared.reset();
    EXPECT_EQ(counts.deleted, 1);
}

}  // namespace
}  // namespace Zr::Testing
