#include "inPackageRegistry.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <numeric>
#include <random>
#include <string>
#include <vector>

#include "exBase.h"
#include "inInit.h"

namespace Zr::Testing {
namespace {

struct AlphaTag {};
struct BetaTag {};
struct UnclaimedTag {};

// The registered names that belong to this test, in registry order.
std::vector<std::string> namesAmong(const std::vector<std::string>& all,
                                    const std::vector<std::string>& ours) {
    std::vector<std::string> result;
    for (const std::string& n : all) {
        if (std::find(ours.begin(), ours.end(), n) != ours.end()) result.push_back(n);
    }
    return result;
}

TEST(InPackageRegistryTest, PackagesAndDependenciesReadBackInTheOrderGiven) {
    InInit<BetaTag> beta("test.beta");
    InInit<AlphaTag> alpha("test.alpha");
    InVariableBase table("test.table");
    beta.registerPackage();
    alpha.registerPackage();
    alpha.addDependency(InInit<ZrInit::resmgt>::getType());
    alpha.addDependency(InInit<BetaTag>::getType());
    alpha.addDependency(&table);
    alpha.addDependency(InInit<UnclaimedTag>::getType());
    alpha.addDependency(InInit<ZrInit::base>::getType());

    EXPECT_EQ(namesAmong(InPackageRegistry::getPackageNames(), {"test.alpha", "test.beta"}),
              (std::vector<std::string>{"test.beta", "test.alpha"}));

    const std::optional<InPackageRecord> record = InPackageRegistry::findPackage("test.alpha");
    ASSERT_TRUE(record.has_value());
    EXPECT_EQ(record->tagTypeName, typeid(AlphaTag).name());
    // ZrInit tags read back as their package names, a tag of a registered package as that
    // package's name, a tag nobody claims as its type's name.
    EXPECT_EQ(record->getDependencyNames(),
              (std::vector<std::string>{"resmgt", "test.beta", "test.table",
                                        typeid(UnclaimedTag).name(), "base"}));

    EXPECT_FALSE(InPackageRegistry::findPackage("test.nobody").has_value());
}

TEST(InPackageRegistryTest, RepeatedDependenciesCountOnceAndRemovalTakesOnlyThatVariable) {
    InPackageInit package("test.repeats");
    InVariableBase first("first"), second("second"), neverAdded("neverAdded");
    package.addDependency(&first);
    package.addDependency(InInit<ZrInit::yarp>::getType());
    package.addDependency(&second);
    package.addDependency(&first);
    package.addDependency(InInit<ZrInit::yarp>::getType());
    EXPECT_EQ(package.getRecord().getDependencyNames(),
              (std::vector<std::string>{"first", "yarp", "second"}));
    package.removeDependency(&neverAdded);
    package.removeDependency(nullptr);
    package.removeDependency(&first);
    EXPECT_EQ(package.getRecord().getDependencyNames(), (std::vector<std::string>{"yarp", "second"}));
    // An unregistered package reads back from itself but is not in the registry.
    EXPECT_FALSE(package.isRegistered());
    EXPECT_FALSE(InPackageRegistry::findPackage("test.repeats").has_value());
}

TEST(InPackageRegistryTest, AVariableDependencyKeepsItsNameAfterTheVariableWent) {
    InPackageInit package("test.survivor");
    package.registerPackage();
    {
        InVariableBase shortLived("shortLived");
        package.addDependency(&shortLived);
    }
    EXPECT_EQ(InPackageRegistry::findPackage("test.survivor")->getDependencyNames(),
              (std::vector<std::string>{"shortLived"}));
}

TEST(InPackageRegistryTest, RegistrationLastsAsLongAsThePackageObjectAndNamesAreUnique) {
    {
        InPackageInit package("test.scoped");
        package.registerPackage();
        package.registerPackage();  // the same object again: nothing changes
        EXPECT_TRUE(package.isRegistered());
        EXPECT_EQ(namesAmong(InPackageRegistry::getPackageNames(), {"test.scoped"}).size(), 1u);

        InPackageInit impostor("test.scoped");
        EXPECT_THROW(impostor.registerPackage(), ExAssertionFailed);
        EXPECT_FALSE(impostor.isRegistered());
    }
    EXPECT_FALSE(InPackageRegistry::findPackage("test.scoped").has_value());
    InPackageInit successor("test.scoped");
    EXPECT_NO_THROW(successor.registerPackage());
}

// Random dependency graphs without cycles, registered in random order: the start order must hold
// every package once and place each after all the registered packages it depends on.
TEST(InPackageRegistryTest, StartOrderPlacesEveryPackageAfterItsDependencies) {
    const std::vector<std::string> names = {"test.p0", "test.p1", "test.p2", "test.p3",
                                            "test.p4", "test.p5", "test.p6", "test.p7"};
    for (unsigned seed = 1; seed <= 40; ++seed) {
        std::mt19937 rng(seed);
        const std::size_t n = 2 + rng() % names.size() - (rng() % 2);
        std::vector<std::unique_ptr<InPackageInit>> packages;
        for (std::size_t i = 0; i < std::min(n, names.size()); ++i) {
            packages.push_back(std::make_unique<InPackageInit>(names[i].c_str()));
        }
        // A hidden rank makes the graph acyclic: a package may need only lower-ranked ones.
        std::vector<std::size_t> rank(packages.size());
        std::iota(rank.begin(), rank.end(), 0);
        std::shuffle(rank.begin(), rank.end(), rng);
        std::vector<std::vector<std::size_t>> needs(packages.size());
        for (std::size_t i = 0; i < packages.size(); ++i) {
            for (std::size_t j = 0; j < packages.size(); ++j) {
                if (rank[j] < rank[i] && rng() % 3 == 0) {
                    packages[i]->addDependency(packages[j].get());
                    needs[i].push_back(j);
                }
            }
        }
        std::vector<std::size_t> registration(packages.size());
        std::iota(registration.begin(), registration.end(), 0);
        std::shuffle(registration.begin(), registration.end(), rng);
        for (std::size_t i : registration) packages[i]->registerPackage();

        const std::vector<std::string> order = namesAmong(InPackageRegistry::computeStartOrder(), names);
        ASSERT_EQ(order.size(), packages.size()) << "seed " << seed;
        auto position = [&](std::size_t i) {
            return std::find(order.begin(), order.end(), names[i]) - order.begin();
        };
        for (std::size_t i = 0; i < packages.size(); ++i) {
            ASSERT_LT(position(i), static_cast<long>(order.size())) << "seed " << seed;
            for (std::size_t j : needs[i]) EXPECT_LT(position(j), position(i)) << "seed " << seed;
        }
    }
}

TEST(InPackageRegistryTest, StartOrderKeepsRegistrationOrderWhereNothingConstrainsIt) {
    InInit<AlphaTag> alpha("test.alpha");
    InInit<BetaTag> beta("test.beta");
    InPackageInit gamma("test.gamma");
    gamma.registerPackage();
    alpha.registerPackage();
    beta.registerPackage();
    const std::vector<std::string> ours = {"test.alpha", "test.beta", "test.gamma"};
    EXPECT_EQ(namesAmong(InPackageRegistry::computeStartOrder(), ours),
              (std::vector<std::string>{"test.gamma", "test.alpha", "test.beta"}));
    // Dependencies by tag move a package behind the one holding that tag.
    gamma.addDependency(InInit<BetaTag>::getType());
    alpha.addDependency(InInit<BetaTag>::getType());
    EXPECT_EQ(namesAmong(InPackageRegistry::computeStartOrder(), ours),
              (std::vector<std::string>{"test.beta", "test.gamma", "test.alpha"}));
}

TEST(InPackageRegistryTest, ACycleOfDependenciesIsAFault) {
    InInit<AlphaTag> alpha("test.alpha");
    InInit<BetaTag> beta("test.beta");
    alpha.registerPackage();
    beta.registerPackage();
    alpha.addDependency(InInit<BetaTag>::getType());
    beta.addDependency(&alpha);
    EXPECT_THROW(InPackageRegistry::computeStartOrder(), ExAssertionFailed);
    beta.removeDependency(&alpha);
    EXPECT_NO_THROW(InPackageRegistry::computeStartOrder());
}

}  // namespace
}  // namespace Zr::Testing
