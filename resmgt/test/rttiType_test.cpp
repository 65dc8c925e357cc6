// Run-time types: numbering, ancestry, hierarchy membership and the singleton type objects.
#include <gtest/gtest.h>

#include <set>
#include <string>
#include <thread>
#include <vector>

#include "exBase.h"
#include "rttiGenType.h"

namespace Zr {
namespace {

// A small hierarchy shaped like the scene description's: a root, two levels below it, and a class
// that derives from the root in the language but roots a hierarchy of its own.
class Animal {
public:
    using RttiClassType = RttiGenType0<Animal, Animal>;
    virtual ~Animal() = default;
    virtual const RttiTypeBase& getType() const { return RttiClassType::getInstance(); }
};
class Mammal : public Animal {
public:
    using RttiClassType = RttiGenType1<Mammal, Animal>;
    const RttiType<Animal>& getType() const override { return RttiClassType::getInstance(); }
};
class Dog : public Mammal {
public:
    using RttiClassType = RttiGenType1<Dog, Mammal>;
    const RttiType<Animal>& getType() const override { return RttiClassType::getInstance(); }
};
class Cat : public Mammal {
public:
    using RttiClassType = RttiGenType1<Cat, Mammal>;
    const RttiType<Animal>& getType() const override { return RttiClassType::getInstance(); }
};
class Robot : public Animal {
public:
    using RttiClassType = RttiGenType0<Robot, Robot>;
    const RttiType<Robot>& getType() const override { return RttiClassType::getInstance(); }
};
class RobotDog : public Robot {
public:
    using RttiClassType = RttiGenType1<RobotDog, Robot>;
    const RttiType<Robot>& getType() const override { return RttiClassType::getInstance(); }
};

std::vector<const RttiTypeBase*> ancestorsOf(const RttiTypeBase& type) {
    std::vector<const RttiTypeBase*> result;
    for (ConstIterator<RttiTypeBase*> it = type.getAncestors(); !it.atEnd(); ++it) {
        result.push_back(*it);
    }
    return result;
}

TEST(RttiType, EachClassHasOneTypeObjectWithItsOwnNumber) {
    std::vector<const RttiTypeBase*> types = {
        &Animal::RttiClassType::getInstance(), &Mammal::RttiClassType::getInstance(),
        &Dog::RttiClassType::getInstance(),    &Cat::RttiClassType::getInstance(),
        &Robot::RttiClassType::getInstance(),  &RobotDog::RttiClassType::getInstance()};
    std::set<int> ids;
    for (const RttiTypeBase* type : types) {
        EXPECT_GT(type->getTypeId(), 0);
        ids.insert(type->getTypeId());
    }
    EXPECT_EQ(ids.size(), types.size());

    // Asking again gives the same objects and numbers.
    EXPECT_EQ(&Dog::RttiClassType::getInstance(), types[2]);
    EXPECT_EQ(Dog::RttiClassType::getInstance().getTypeId(), types[2]->getTypeId());
}

TEST(RttiType, AncestorsRunFromTheParentToTheRoot) {
    struct Case {
        const RttiTypeBase* type;
        std::vector<const RttiTypeBase*> ancestors;
    };
    const RttiTypeBase* animal = &Animal::RttiClassType::getInstance();
    const RttiTypeBase* mammal = &Mammal::RttiClassType::getInstance();
    const RttiTypeBase* robot = &Robot::RttiClassType::getInstance();
    std::vector<Case> cases = {
        {animal, {}},
        {mammal, {animal}},
        {&Dog::RttiClassType::getInstance(), {mammal, animal}},
        {&Cat::RttiClassType::getInstance(), {mammal, animal}},
        // A language subclass that roots its own hierarchy has no ancestors...
        {robot, {}},
        // ...and its subclasses stop at it.
        {&RobotDog::RttiClassType::getInstance(), {robot}},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.type->getName());
        EXPECT_EQ(ancestorsOf(*c.type), c.ancestors);
        EXPECT_EQ(c.type->getParent(), c.ancestors.empty() ? nullptr : c.ancestors.front());
        EXPECT_EQ(c.type->getAncestors().getRemaining(), c.ancestors.size());
    }
}

TEST(RttiType, IsAHoldsForItselfAndItsAncestorsOnly) {
    const RttiTypeBase& animal = Animal::RttiClassType::getInstance();
    const RttiTypeBase& mammal = Mammal::RttiClassType::getInstance();
    const RttiTypeBase& dog = Dog::RttiClassType::getInstance();
    const RttiTypeBase& cat = Cat::RttiClassType::getInstance();
    const RttiTypeBase& robotDog = RobotDog::RttiClassType::getInstance();
    EXPECT_TRUE(dog.isA(dog));
    EXPECT_TRUE(dog.isA(mammal));
    EXPECT_TRUE(dog.isA(animal));
    EXPECT_FALSE(dog.isA(cat));
    EXPECT_FALSE(mammal.isA(dog));
    EXPECT_FALSE(robotDog.isA(animal));
}

TEST(RttiType, VirtualGetTypeAnswersTheDynamicClass) {
    Dog dog;
    Cat cat;
    RobotDog robotDog;
    const Animal* animals[] = {&dog, &cat, &robotDog};
    EXPECT_EQ(&animals[0]->getType(), &Dog::RttiClassType::getInstance());
    EXPECT_EQ(&animals[1]->getType(), &Cat::RttiClassType::getInstance());
    EXPECT_EQ(&animals[2]->getType(), &RobotDog::RttiClassType::getInstance());
    EXPECT_NE(animals[0]->getType().getName().find("Dog"), std::string::npos);
    EXPECT_EQ(animals[0]->getType().getTypeInfo(), typeid(Dog));
}

TEST(RttiType, CastChecksTheHierarchy) {
    const RttiTypeBase& dog = Dog::RttiClassType::getInstance();
    EXPECT_EQ(&RttiType<Animal>::cast(dog), &dog);
    EXPECT_THROW(RttiType<Robot>::cast(dog), ExCastFailed);
    EXPECT_EQ(&RttiType<Robot>::cast(RobotDog::RttiClassType::getInstance()),
              &RobotDog::RttiClassType::getInstance());
}

// Classes whose type objects no other test touches, to see the order of creation.
class Base1 {
public:
    using RttiClassType = RttiGenType0<Base1, Base1>;
};
class Derived1 : public Base1 {
public:
    using RttiClassType = RttiGenType1<Derived1, Base1>;
};

TEST(RttiType, AskingForADerivedTypeFirstMakesItsParentFirst) {
    ASSERT_EQ(LkSingleton<Base1::RttiClassType>::getState(), LkSingletonBase::UNINITIALIZED);
    const RttiTypeBase& derived = Derived1::RttiClassType::getInstance();
    ASSERT_EQ(LkSingleton<Base1::RttiClassType>::getState(), LkSingletonBase::INITIALIZED);
    EXPECT_LT(Base1::RttiClassType::getInstance().getTypeId(), derived.getTypeId());
}

class Raced {
public:
    using RttiClassType = RttiGenType0<Raced, Raced>;
};

TEST(RttiType, ThreadsRacingForTheFirstInstanceShareOne) {
    constexpr int threadCount = 8;
    std::vector<const RttiTypeBase*> seen(threadCount, nullptr);
    std::vector<std::thread> threads;
    for (int i = 0; i < threadCount; ++i) {
        threads.emplace_back([&seen, i] { seen[i] = &Raced::RttiClassType::getInstance(); });
    }
    for (std::thread& t : threads) t.join();
    for (const RttiTypeBase* type : seen) EXPECT_EQ(type, seen[0]);
}

TEST(ConstIterator, WalksARunOnceAndDefaultsToTheEnd) {
    EXPECT_TRUE(ConstIterator<int>().atEnd());
    const int values[] = {3, 1, 4, 1, 5};
    std::vector<int> walked;
    for (ConstIterator<int> it(values, values + 5); !it.atEnd(); it++) walked.push_back(*it);
    EXPECT_EQ(walked, (std::vector<int>{3, 1, 4, 1, 5}));
}

}  // namespace
}  // namespace Zr
