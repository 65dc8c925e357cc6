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

// Runs call and checks that it fails with Ex at the registry's source path, line and message.
template <class Ex, class Call>
void expectFailure(Call call, int line, const std::string& message) {
    try {
        call();
        ADD_FAILURE() << "no failure; line " << line;
    } catch (const Ex& e) {
        EXPECT_EQ(e.getFile(), ".\\primitives/sdSceneRegistry.imp");
        EXPECT_EQ(e.getLine(), line);
        EXPECT_EQ(e.getMessage(), message);
    }
}

TEST(SdSceneRegistry, ResolvesTheTypeOrItsNearestRegisteredAncestorAsAFreshClone) {
    struct Case {
        std::vector<std::string> registered, asked, answered;  // answered "": ExCantResolveBuilder
    };
    const std::vector<Case> cases = {
        {{"Root"}, {"Root", "Mid", "Leaf", "Other"}, {"Root", "Root", "Root", "Root"}},
        {{"Mid", "Root"}, {"Leaf", "Mid", "Other"}, {"Mid", "Mid", "Root"}},
        {{"Root", "Leaf"}, {"Leaf", "Mid"}, {"Leaf", "Root"}},
        {{"Mid"}, {"Leaf", "Root", "Other"}, {"Mid", "", ""}},
    };
    for (const Case& c : cases) {
        Registry registry;
        std::vector<RCShdPtr<NamedBuilder>> stored;
        for (const std::string& name : c.registered)
            registry.registerBuilder(typeOf(name), stored.emplace_back(makeShared<NamedBuilder>(name)));
        for (std::size_t i = 0; i < c.asked.size(); ++i) {
            const RttiType<Root>& type = typeOf(c.asked[i]);
            if (c.answered[i].empty()) {
                expectFailure<SdEx::ExCantResolveBuilder>([&] { registry.resolveBuilder(type); }, 107, type.getName());
                continue;
            }
            const RCShdPtr<NamedBuilder> first = registry.resolveBuilder(type), second = registry.resolveBuilder(type);
            EXPECT_EQ(first->name, c.answered[i]) << c.asked[i];
            EXPECT_EQ(second->name, c.answered[i]) << c.asked[i];
            EXPECT_NE(first.get(), second.get());
            for (const RCShdPtr<NamedBuilder>& s : stored) EXPECT_NE(first.get(), s.get());
        }
    }
}

TEST(SdSceneRegistry, RefusesANullBuilderAndASecondRegistrationKeepingTheFirst) {
    Registry registry;
    expectFailure<ExAssertionFailed>([&] { registry.registerBuilder(typeOf("Mid"), nullptr); }, 70,
                                     "!builder.isNull()");
    EXPECT_THROW(registry.resolveBuilder(typeOf("Mid")), SdEx::ExCantResolveBuilder);
    registry.registerBuilder(typeOf("Mid"), makeShared<NamedBuilder>("first"));
    expectFailure<SdEx::ExDoubleRegistration>(
        [&] { registry.registerBuilder(typeOf("Mid"), makeShared<NamedBuilder>("second")); }, 74,
        typeOf("Mid").getName());
    EXPECT_EQ(registry.resolveBuilder(typeOf("Mid"))->name, "first");
}

}  // namespace
}  // namespace Zr
