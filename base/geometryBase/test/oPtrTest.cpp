#include "oPtr.h"

#include <gtest/gtest.h>

#include <utility>

#include "countingObjects.h"

namespace Zr::Testing {
namespace {

// Takes ownership by value, as the receivers of an OPtr do.
int consume(OPtr<CountedShared> owned) { return owned->getId(); }

TEST(OPtrTest, PassingByValueHandsTheObjectOverAndTheReceiverDeletesIt) {
    LifeCounts counts;
    OPtr<CountedShared> owner(new CountedShared(counts, 5));
    EXPECT_EQ(consume(std::move(owner)), 5);
    EXPECT_TRUE(owner.isNull());
    EXPECT_EQ(counts.made, 1);
    EXPECT_EQ(counts.deleted, 1);
}

TEST(OPtrTest, AssignmentDeletesTheOldObjectOnceAndSelfMoveKeepsIt) {
    LifeCounts counts;
    OPtr<CountedShared> a = makeOwned<CountedShared>(counts, 1);
    OPtr<CountedShared> b = makeOwned<CountedShared>(counts, 2);
    a = std::move(b);
    EXPECT_EQ(counts.deleted, 1);
    EXPECT_EQ(a->getId(), 2);
    EXPECT_TRUE(b.isNull());

    OPtr<CountedShared>& alias = a;
    a = std::move(alias);
    EXPECT_EQ(counts.deleted, 1);
    EXPECT_EQ(a->getId(), 2);

    a.reset(a.get());  // resetting to the object held keeps it
    EXPECT_EQ(counts.deleted, 1);
    a = nullptr;
    EXPECT_EQ(counts.deleted, 2);
}

TEST(OPtrTest, ReleaseGivesUpOwnershipWithoutDeleting) {
    LifeCounts counts;
    CountedShared* raw = nullptr;
    {
        OPtr<CountedShared> owner = makeOwned<CountedShared>(counts, 3);
        raw = owner.release();
        EXPECT_TRUE(owner.isNull());
    }
    EXPECT_EQ(counts.deleted, 0);
    OPtr<CountedShared> again(raw);
    EXPECT_EQ(again.get(), raw);
}

TEST(OPtrTest, ConvertsToABaseAndDeletesThroughTheVirtualDestructor) {
    LifeCounts counts;
    {
        OPtr<DerivedShared> derived = makeOwned<DerivedShared>(counts, 8);
        OPtr<CountedShared> base = std::move(derived);
        OPtr<const CountedShared> constBase = std::move(base);
        EXPECT_TRUE(derived.isNull());
        EXPECT_TRUE(base.isNull());
        EXPECT_EQ(constBase->getId(), 8);
    }
    EXPECT_EQ(counts.deleted, 1);
}

}  // namespace
}  // namespace Zr::Testing
