#include "renderInit.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "inBuildInfoUtil.h"
#include "inInit.h"
#include "inPackageRegistry.h"

namespace Zr::Testing {
namespace {

using Names = std::vector<std::string>;

// What each package of the library must state it needs, in the order stated.
struct ExpectedPackage {
    const char* name;
    const std::type_info& tag;
    Names dependencies;
};

const std::vector<ExpectedPackage>& expectedPackages() {
    static const std::vector<ExpectedPackage> packages = {
        {"render", typeid(ZrInit::render),
         {"media", "internalAPI", "primitives", "pluginAPI", "resmgt", "base", "suave", "shaders",
          "yarp"}},
        {"suave", typeid(ZrInit::suave),
         {"yarp", "internalAPI", "pluginAPI", "primitives", "resmgt", "base"}},
        {"shaders", typeid(ZrInit::shaders), {"yarp", "suave", "primitives", "resmgt", "base"}},
        {"yarp", typeid(ZrInit::yarp), {"primitives", "resmgt", "base"}},
    };
    return packages;
}

TEST(RenderInitTest, LoadingTheLibraryRegistersItsFourPackagesInOrder) {
    RenderInit::ensureLoaded();
    const Names all = InPackageRegistry::getPackageNames();
    Names ours;
    for (const std::string& n : all) {
        if (n == "render" || n == "suave" || n == "shaders" || n == "yarp") ours.push_back(n);
    }
    EXPECT_EQ(ours, (Names{"render", "suave", "shaders", "yarp"}));
}

TEST(RenderInitTest, EachPackageReadsBackItsDependenciesByTagInTheOrderStated) {
    RenderInit::ensureLoaded();
    const std::vector<InPackageRecord> own = RenderInit::getPackageRecords();
    ASSERT_EQ(own.size(), expectedPackages().size());
    for (std::size_t i = 0; i < own.size(); ++i) {
        const ExpectedPackage& expected = expectedPackages()[i];
        SCOPED_TRACE(expected.name);
        const std::optional<InPackageRecord> registered = InPackageRegistry::findPackage(expected.name);
        ASSERT_TRUE(registered.has_value());
        for (const InPackageRecord* record : {&own[i], &*registered}) {
            EXPECT_EQ(record->name, expected.name);
            EXPECT_EQ(record->tagTypeName, expected.tag.name());
            EXPECT_EQ(record->getDependencyNames(), expected.dependencies);
            for (const InDependencyRecord& d : record->dependencies) {
                EXPECT_EQ(d.kind, InDependencyRecord::TAG);
            }
        }
    }
    // The tag types behind the names are the ZrInit tags themselves.
    const std::optional<InPackageRecord> yarp = InPackageRegistry::findPackage("yarp");
    ASSERT_TRUE(yarp.has_value());
    ASSERT_EQ(yarp->dependencies.size(), 3u);
    EXPECT_EQ(yarp->dependencies[0].typeName, typeid(ZrInit::primitives).name());
    EXPECT_EQ(yarp->dependencies[1].typeName, typeid(ZrInit::resmgt).name());
    EXPECT_EQ(yarp->dependencies[2].typeName, typeid(ZrInit::base).name());
}

TEST(RenderInitTest, StartOrderBringsUpYarpSuaveShadersThenRender) {
    RenderInit::ensureLoaded();
    Names order;
    for (const std::string& n : InPackageRegistry::computeStartOrder()) {
        if (n == "render" || n == "suave" || n == "shaders" || n == "yarp") order.push_back(n);
    }
    EXPECT_EQ(order, (Names{"yarp", "suave", "shaders", "render"}));
}

TEST(RenderInitTest, BuildRecordIsRegisteredAndReadsBack) {
    const InBuildInfo& info = RenderInit::getBuildInfo();
    EXPECT_EQ(info.getLibraryName(), "libZrrender");
    EXPECT_EQ(info.getBuildConfiguration(), "opt.x86_32.intel");
    EXPECT_EQ(InBuildInfoUtil::findInfo("libZrrender"), &info);
    const std::vector<const InBuildInfo*> all = InBuildInfoUtil::getRegisteredInfos();
    EXPECT_EQ(std::count(all.begin(), all.end(), &info), 1);

    EXPECT_FALSE(info.getProductTitle().empty());
    EXPECT_FALSE(info.getLibraryVersion().empty());
    // The year is the one the build date names.
    const std::string date = info.getBuildDate();
    ASSERT_GE(date.size(), 4u);
    EXPECT_EQ(std::to_string(info.getYear()), date.substr(date.size() - 4));
    EXPECT_GE(info.getRevision(), 0);
    EXPECT_GT(info.getBuildNumber(), 0);
}

}  // namespace
}  // namespace Zr::Testing
