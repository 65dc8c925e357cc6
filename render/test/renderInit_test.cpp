// The library's build record: registered once, findable by its library name, its year read
// from its date.
#include "renderInit.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "inBuildInfoUtil.h"

namespace Zr {
namespace {

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
