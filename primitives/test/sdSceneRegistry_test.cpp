// The builder registry: by exact type, then nearest ancestor first; fresh clones; refused registrations.
#include <gtest/gtest.h>

#include <string_view>

#include "rcBase.h"
#include "rttiGenType.h"
#include "sdEx.h"
#include "sdSceneRegistry.h"

namespace Zr {
namespace {

// Root <- Mid <- Leaf, and Other beside Mid.
struct Root { using RttiClassType = RttiGenType0<Root, Root>; };
struct Mid : Root { using RttiClassType = RttiGenType1<Mid, Root>; };
struct Leaf : Mid { using RttiClassType = RttiGenType1<Leaf, Mid>; };
struct Other : Root { using RttiClassType = RttiGenType1<Other, Root>; };

struct NamedBuilder : RCObject {
    explicit NamedBuilder(char n) : name(n) {}
    RCShdPtr<NamedBuilder> clone() const { return makeShared<NamedBuilder>(name); }
    char name;
};
using Registry = SdSceneRegistry<Root, NamedBuilder>;

const RttiType<Root>& typeOf(char initial) {
    const RttiType<Root>* types[] = {&Root::RttiClassType::getInstance(), &Mid::RttiClassType::getInstance(),
                                     &Leaf::RttiClassType::getInstance(), &Other::RttiClassType::getInstance()};
    return *types[std::string_view("RMLO").find(initial)];
}

// The name of the builder that registry hands out for type; '-' when none resolves.
char nameOf(const Registry& registry, const RttiType<Root>& type) try {
    return registry.resolveBuilder(type)->name;
} catch (const SdEx::ExCantResolveBuilder&) {
    return '-';
}

// The types registered, the types asked for and the builder that answers each ('-': none). A null
// builder and a second one for a type are refused, and the first stays.
TEST(SdSceneRegistry, ResolvesTheNearestRegisteredTypeAsAFreshCloneAndRefusesNullOrSecondBuilders) {
    const char* cases[][3] = {{"R", "RMLO", "RRRR"}, {"MR", "LMO", "MMR"}, {"RL", "LM", "LR"}, {"M", "LRO", "M--"}};
    for (const auto& [registered, asked, answered] : cases) {
        Registry registry;
        EXPECT_THROW(registry.registerBuilder(typeOf(*registered), nullptr), ExAssertionFailed);
        for (const char* r = registered; *r; ++r) registry.registerBuilder(typeOf(*r), makeShared<NamedBuilder>(*r));
        EXPECT_THROW(registry.registerBuilder(typeOf(*registered), makeShared<NamedBuilder>('2')),
                     SdEx::ExDoubleRegistration);
        for (int i = 0; asked[i]; ++i) {
            const RttiType<Root>& type = typeOf(asked[i]);
            EXPECT_EQ(nameOf(registry, type), answered[i]) << registered << ' ' << asked[i];
            EXPECT_TRUE(answered[i] == '-' || registry.resolveBuilder(type) != registry.resolveBuilder(type));
        }
    }
}

}  // namespace
}  // namespace Zr
