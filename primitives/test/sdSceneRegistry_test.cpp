// The builder registry: lookup by exact type, then along the ancestors nearest first, fresh clones
// for every caller, and the refused registrations.
#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

#include "exBase.h"
#include "rcBase.h"
#include "rttiGenType.h"
#include "sdEx.h"
#include "sdSceneRegistry.h"

namespace Zr {
namespace {

// Root <- Mid <- Leaf, and Other beside Mid.
struct Root {
    using RttiClassType = RttiGenType0<Root, Root>;
};
struct Mid : Root {
    using RttiClassType = RttiGenType1<Mid, Root>;
};
struct Leaf : Mid {
    using RttiClassType = RttiGenType1<Leaf, Mid>;
};
struct Other : Root {
    using RttiClassType = RttiGenType1<Other, Root>;
};

struct NamedBuilder : RCObject {
    explicit NamedBuilder(std::string n) : name(std::move(n)) {}
    RCShdPtr<NamedBuilder> clone() const { return makeShared<NamedBuilder>(name); }
    std::string name;
};

using Registry = SdSceneRegistry<Root, NamedBuilder>;

const RttiType<Root>& typeOf(const std::string& name) {
    if (name == "Root") return Root::RttiClassType::getInstance();
    if (name == "Mid") return Mid::RttiClassType::getInstance();
    if (name == "Leaf") return Leaf::RttiClassType::getInstance();
    return Other::RttiClassType::getInstance();
}

const char* const kFile = ".\\primitives/sdSceneRegistry.imp";

TEST(SdSceneRegistry, ResolvesTheTypeOrItsNearestRegisteredAncestorAsAFreshClone) {
    struct Case {
        std::vector<std::string> registered;
        std::vector<std::string> asked;
        std::vector<std::string> answered;  // "" for ExCantResolveBuilder
    };
    const std::vector<Case> cases = {
        {{"Root"}, {"Root", "Mid", "Leaf", "Other"}, {"Root", "Root", "Root", "Root"}},
        {{"Mid", "Root"}, {"Leaf", "Mid", "Other"}, {"Mid", "Mid", "Root"}},
        {{"Root", "Leaf"}, {"Leaf", "Mid"}, {"Leaf", "Root"}},
        {{"Mid"}, {"Leaf", "Root", "Other"}, {"Mid", "", ""}},
        {{}, {"Leaf"}, {""}},
    };
    for (const Case& c : cases) {
        Registry registry;
        std::vector<RCShdPtr<NamedBuilder>> stored;
        for (const std::string& name : c.registered)
            registry.registerBuilder(typeOf(name), stored.emplace_back(makeShared<NamedBuilder>(name)));
        for (std::size_t i = 0; i < c.asked.size(); ++i) {
            const RttiType<Root>& type = typeOf(c.asked[i]);
            if (c.answered[i].empty()) {
                try {
                    registry.resolveBuilder(type);
                    ADD_FAILURE() << c.asked[i] << " resolved";
                } catch (const SdEx::ExCantResolveBuilder& e) {
                    EXPECT_EQ(e.getFile(), kFile);
                    EXPECT_EQ(e.getLine(), 107);
                    EXPECT_EQ(e.getMessage(), type.getName());
                }
                continue;
            }
            const RCShdPtr<NamedBuilder> first = registry.resolveBuilder(type);
            const RCShdPtr<NamedBuilder> second = registry.resolveBuilder(type);
            EXPECT_EQ(first->name, c.answered[i]) << c.asked[i];
            EXPECT_EQ(second->name, c.answered[i]) << c.asked[i];
            EXPECT_NE(first.get(), second.get());
            for (const RCShdPtr<NamedBuilder>& s : stored) EXPECT_NE(first.get(), s.get());
        }
    }
}

TEST(SdSceneRegistry, RefusesANullBuilderAndASecondRegistrationKeepingTheFirst) {
    Registry registry;
    try {
        registry.registerBuilder(typeOf("Mid"), RCShdPtr<NamedBuilder>());
        ADD_FAILURE() << "null builder taken";
    } catch (const ExAssertionFailed& e) {
        EXPECT_EQ(e.getFile(), kFile);
        EXPECT_EQ(e.getLine(), 70);
        EXPECT_EQ(e.getMessage(), "!builder.isNull()");
    }
    EXPECT_THROW(registry.resolveBuilder(typeOf("Mid")), SdEx::ExCantResolveBuilder);
    registry.registerBuilder(typeOf("Mid"), makeShared<NamedBuilder>("first"));
    try {
        registry.registerBuilder(typeOf("Mid"), makeShared<NamedBuilder>("second"));
        ADD_FAILURE() << "second registration taken";
    } catch (const SdEx::ExDoubleRegistration& e) {
        EXPECT_EQ(e.getFile(), kFile);
        EXPECT_EQ(e.getLine(), 74);
        EXPECT_EQ(e.getMessage(), typeOf("Mid").getName());
    }
    EXPECT_EQ(registry.resolveBuilder(typeOf("Mid"))->name, "first");
}

}  // namespace
}  // namespace Zr
