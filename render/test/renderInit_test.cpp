// The library's packages: registered in order with their dependencies, started in dependency
// order, and the build record findable by its library name.
#include "renderInit.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "inBuildInfoUtil.h"
#include "inPackageRegistry.h"

namespace Zr {
namespace {

using Names = std::vector<std::string>;

Names ours(const Names& all) {
    Names out;
    for (const std::string& n : all)
        if (n == "render" || n == "suave" || n == "shaders" || n == "yarp") out.push_back(n);
    return out;
}

TEST(RenderInit, PackagesRegisterTheirDependenciesAndStartInDependencyOrder) {
    RenderInit::ensureLoaded();
    const std::vector<std::pair<std::string, Names>> expected = {
        {"render", {"media", "internalAPI", "primitives", "pluginAPI", "resmgt", "base", "suave", "shaders", "yarp"}},
        {"suave", {"yarp", "internalAPI", "pluginAPI", "primitives", "resmgt", "base"}},
        {"shaders", {"yarp", "suave", "primitives", "resmgt", "base"}},
        {"yarp", {"primitives", "resmgt", "base"}},
    };
    const std::vector<InPackageRecord> own = RenderInit::getPackageRecords();
    ASSERT_EQ(own.size(), expected.size());
    for (std::size_t i = 0; i < own.size(); ++i) {
        const std::optional<InPackageRecord> registered = InPackageRegistry::findPackage(expected[i].first);
        ASSERT_TRUE(registered.has_value()) << expected[i].first;
        for (const InPackageRecord* record : {&own[i], &*registered}) {
            EXPECT_EQ(record->name, expected[i].first);
            EXPECT_EQ(record->getDependencyNames(), expected[i].second) << record->name;
        }
    }
    EXPECT_EQ(ours(InPackageRegistry::getPackageNames()), (Names{"render", "suave", "shaders", "yarp"}));
    EXPECT_EQ(ours(InPackageRegistry::computeStartOrder()), (Names{"yarp", "suave", "shaders", "render"}));
}

TEST(RenderInit, BuildRecordIsRegisteredOnceWithTheYearOfItsDate) {
    const InBuildInfo& info = RenderInit::getBuildInfo();
    EXPECT_EQ(InBuildInfoUtil::findInfo("libZrrender"), &info);
    const std::vector<const InBuildInfo*> all = InBuildInfoUtil::getRegisteredInfos();
    EXPECT_EQ(std::count(all.begin(), all.end(), &info), 1);
    const std::string date = info.getBuildDate();
    EXPECT_EQ(std::to_string(info.getYear()), date.substr(date.size() - 4));
}

}  // namespace
}  // namespace Zr
