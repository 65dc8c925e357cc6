// The process-wide registries of packages and of build records.
#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <numeric>
#include <random>
#include <string>
#include <vector>

#include "exBase.h"
#include "inBuildInfoUtil.h"
#include "inInit.h"
#include "inPackageRegistry.h"

namespace Zr {
namespace {

struct AlphaTag {};
struct BetaTag {};
struct UnclaimedTag {};
using Names = std::vector<std::string>;

// The registered names that belong to a test, in registry order.
Names namesAmong(const Names& all, const Names& ours) {
    Names result;
    for (const std::string& n : all)
        if (std::find(ours.begin(), ours.end(), n) != ours.end()) result.push_back(n);
    return result;
}

TEST(InPackageRegistry, RecordsReadBackInTheOrderGivenWithEachDependencyOnce) {
    InInit<BetaTag> beta("test.beta");
    InInit<AlphaTag> alpha("test.alpha");
    InVariableBase table("test.table"), neverAdded("neverAdded");
    beta.registerPackage();
    alpha.registerPackage();
    {
        InVariableBase shortLived("shortLived");  // its name outlives it
        alpha.addDependency(&shortLived);
    }
    // A ZrInit tag reads as its package's name, a registered package's tag as that package's
    // name, a tag nobody claims as its type's name, a variable as its own name.
    for (int repeat = 0; repeat < 2; ++repeat) {
        alpha.addDependency(InInit<ZrInit::resmgt>::getType());
        alpha.addDependency(InInit<BetaTag>::getType());
        alpha.addDependency(&table);
        alpha.addDependency(InInit<UnclaimedTag>::getType());
    }
    alpha.removeDependency(&neverAdded);
    alpha.removeDependency(nullptr);
    EXPECT_EQ(namesAmong(InPackageRegistry::getPackageNames(), {"test.alpha", "test.beta"}),
              (Names{"test.beta", "test.alpha"}));
    const std::optional<InPackageRecord> record = InPackageRegistry::findPackage("test.alpha");
    ASSERT_TRUE(record.has_value());
    EXPECT_EQ(record->tagTypeName, typeid(AlphaTag).name());
    EXPECT_EQ(record->getDependencyNames(),
              (Names{"shortLived", "resmgt", "test.beta", "test.table", typeid(UnclaimedTag).name()}));
    alpha.removeDependency(&table);
    EXPECT_EQ(alpha.getRecord().getDependencyNames(),
              (Names{"shortLived", "resmgt", "test.beta", typeid(UnclaimedTag).name()}));
    EXPECT_FALSE(InPackageRegistry::findPackage("test.nobody").has_value());
}

TEST(InPackageRegistry, RegistrationLastsAsLongAsThePackageObjectAndNamesAreUnique) {
    {
        InPackageInit package("test.scoped");
        EXPECT_FALSE(package.isRegistered());
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

// Random acyclic dependency graphs registered in random order: the start order holds every
// package once, each after all the registered packages it depends on.
TEST(InPackageRegistry, StartOrderPlacesEveryPackageAfterItsDependencies) {
    const Names names = {"test.p0", "test.p1", "test.p2", "test.p3", "test.p4", "test.p5", "test.p6", "test.p7"};
    for (unsigned seed = 1; seed <= 40; ++seed) {
        std::mt19937 rng(seed);
        std::vector<std::unique_ptr<InPackageInit>> packages;
        for (std::size_t i = 0, n = 2 + rng() % 7; i < n; ++i)
            packages.push_back(std::make_unique<InPackageInit>(names[i].c_str()));
        // A hidden rank keeps the graph acyclic: a package needs only lower-ranked ones.
        std::vector<std::size_t> rank(packages.size()), registration(packages.size());
        std::iota(rank.begin(), rank.end(), 0);
        std::shuffle(rank.begin(), rank.end(), rng);
        std::vector<std::vector<std::size_t>> needs(packages.size());
        for (std::size_t i = 0; i < packages.size(); ++i)
            for (std::size_t j = 0; j < packages.size(); ++j)
                if (rank[j] < rank[i] && rng() % 3 == 0) {
                    packages[i]->addDependency(packages[j].get());
                    needs[i].push_back(j);
                }
        std::iota(registration.begin(), registration.end(), 0);
        std::shuffle(registration.begin(), registration.end(), rng);
        for (std::size_t i : registration) packages[i]->registerPackage();
        const Names order = namesAmong(InPackageRegistry::computeStartOrder(), names);
        ASSERT_EQ(order.size(), packages.size()) << "seed " << seed;
        const auto position = [&](std::size_t i) {
            return std::find(order.begin(), order.end(), names[i]) - order.begin();
        };
        for (std::size_t i = 0; i < packages.size(); ++i) {
            ASSERT_LT(position(i), static_cast<long>(order.size())) << "seed " << seed;
            for (std::size_t j : needs[i]) EXPECT_LT(position(j), position(i)) << "seed " << seed;
        }
        // An edge against the ranks closes a cycle, which is a fault.
        const auto low = std::min_element(rank.begin(), rank.end()) - rank.begin();
        const auto high = std::max_element(rank.begin(), rank.end()) - rank.begin();
        packages[high]->addDependency(packages[low].get());
        packages[low]->addDependency(packages[high].get());
        EXPECT_THROW(InPackageRegistry::computeStartOrder(), ExAssertionFailed) << "seed " << seed;
        packages[low]->removeDependency(packages[high].get());
        EXPECT_NO_THROW(InPackageRegistry::computeStartOrder());
    }
}

class TestBuildInfo : public InBuildInfo {
public:
    TestBuildInfo(std::string name, int* deletions) : _name(std::move(name)), _deletions(deletions) {}
    ~TestBuildInfo() override { ++*_deletions; }
    std::string getProductTitle() const override { return "Test Product"; }
    std::string getLibraryName() const override { return _name; }
    std::string getLibraryVersion() const override { return "9.8.7"; }
    int getYear() const override { return 2001; }
    int getRevision() const override { return 42; }
    int getBuildNumber() const override { return 17; }
    std::string getBuildDate() const override { return "Jan  2 2001"; }
    std::string getBuildConfiguration() const override { return "debug.test"; }

private:
    std::string _name;
    int* _deletions;
};

TEST(InBuildInfoUtil, KeepsRecordsInOrderUntilUnregistered) {
    int deletions = 0;
    auto* first = new TestBuildInfo("libTestFirst", &deletions);
    auto* second = new TestBuildInfo("libTestSecond", &deletions);
    const InBuildInfo& keptFirst = InBuildInfoUtil::registerInfo(OPtr<InBuildInfo>(first));
    const InBuildInfo& keptSecond = InBuildInfoUtil::registerInfo(OPtr<InBuildInfo>(second));
    EXPECT_EQ(&keptFirst, first);  // the record itself is kept, not a copy
    const std::vector<const InBuildInfo*> all = InBuildInfoUtil::getRegisteredInfos();
    const auto at = [&](const InBuildInfo* p) { return std::find(all.begin(), all.end(), p); };
    ASSERT_NE(at(first), all.end());
    EXPECT_LT(at(first), at(second));
    EXPECT_EQ(InBuildInfoUtil::findInfo("libTestSecond"), second);
    EXPECT_EQ(InBuildInfoUtil::findInfo("libNotThere"), nullptr);

    EXPECT_TRUE(InBuildInfoUtil::unregisterInfo(keptFirst));
    EXPECT_EQ(deletions, 1);
    EXPECT_EQ(InBuildInfoUtil::findInfo("libTestFirst"), nullptr);
    EXPECT_TRUE(InBuildInfoUtil::unregisterInfo(keptSecond));
    EXPECT_FALSE(InBuildInfoUtil::unregisterInfo(keptSecond));
    EXPECT_EQ(deletions, 2);

    const std::size_t before = InBuildInfoUtil::getRegisteredInfos().size();
    EXPECT_THROW(InBuildInfoUtil::registerInfo(OPtr<InBuildInfo>()), ExNullPtr);
    EXPECT_EQ(InBuildInfoUtil::getRegisteredInfos().size(), before);
}

}  // namespace
}  // namespace Zr
