// Run-time types: one numbered type object per class, ancestry, isA and checked casts.
#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <vector>

#include "exBase.h"
#include "rttiGenType.h"

namespace Zr {
namespace {

// A root, two levels below it, a class that derives from the root in the language but roots a
// hierarchy of its own, and classes that no other test touches, to see the order of creation.
struct Animal { using RttiClassType = RttiGenType0<Animal, Animal>; };
struct Mammal : Animal { using RttiClassType = RttiGenType1<Mammal, Animal>; };
struct Dog : Mammal { using RttiClassType = RttiGenType1<Dog, Mammal>; };
struct Cat : Mammal { using RttiClassType = RttiGenType1<Cat, Mammal>; };
struct Robot : Animal { using RttiClassType = RttiGenType0<Robot, Robot>; };
struct RobotDog : Robot { using RttiClassType = RttiGenType1<RobotDog, Robot>; };
struct Base1 { using RttiClassType = RttiGenType0<Base1, Base1>; };
struct Derived1 : Base1 { using RttiClassType = RttiGenType1<Derived1, Base1>; };

// Ancestors run from the parent to the root; isA holds exactly for the type itself and them.
TEST(RttiType, AncestryIdentityAndIsAFollowTheDeclaredHierarchy) {
    ASSERT_EQ(LkSingleton<Base1::RttiClassType>::getState(), LkSingletonBase::UNINITIALIZED);
    const RttiTypeBase& derived1 = Derived1::RttiClassType::getInstance();  // makes its parent first
    EXPECT_LT(Base1::RttiClassType::getInstance().getTypeId(), derived1.getTypeId());
    const RttiTypeBase* animal = &Animal::RttiClassType::getInstance();
    const RttiTypeBase* mammal = &Mammal::RttiClassType::getInstance();
    const RttiTypeBase* robot = &Robot::RttiClassType::getInstance();
    const std::vector<std::pair<const RttiTypeBase*, std::vector<const RttiTypeBase*>>> cases = {
        {animal, {}},
        {mammal, {animal}},
        {&Dog::RttiClassType::getInstance(), {mammal, animal}},
        {&Cat::RttiClassType::getInstance(), {mammal, animal}},
        {robot, {}},
        {&RobotDog::RttiClassType::getInstance(), {robot}},
    };
    std::set<int> ids;
    for (const auto& [type, ancestors] : cases) {
        SCOPED_TRACE(type->getName());
        EXPECT_TRUE(type->getTypeId() > 0 && ids.insert(type->getTypeId()).second);
        std::vector<const RttiTypeBase*> walked;
        for (ConstIterator<RttiTypeBase*> it = type->getAncestors(); !it.atEnd(); ++it) walked.push_back(*it);
        EXPECT_EQ(walked, ancestors);
        EXPECT_EQ(type->getParent(), ancestors.empty() ? nullptr : ancestors.front());
        EXPECT_EQ(type->getAncestors().getRemaining(), ancestors.size());
        for (const auto& other : cases) {
            const bool related = other.first == type || std::count(ancestors.begin(), ancestors.end(), other.first);
            EXPECT_EQ(type->isA(*other.first), related) << other.first->getName();
        }
    }
    const RttiTypeBase& dog = *cases[2].first;
    EXPECT_EQ(&RttiType<Animal>::cast(dog), &dog);
    EXPECT_THROW(RttiType<Robot>::cast(dog), ExCastFailed);
    EXPECT_EQ(&RttiType<Robot>::cast(*cases[5].first), cases[5].first);
}

}  // namespace
}  // namespace Zr
