#include "inBuildInfoUtil.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "exBase.h"

namespace Zr::Testing {
namespace {

class TestBuildInfo : public InBuildInfo {
public:
    TestBuildInfo(std::string name, int* deletions) : _name(std::move(name)), _deletions(deletions) {}
    ~TestBuildInfo() override {
        if (_deletions) ++*_deletions;
    }
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

TEST(InBuildInfoUtilTest, KeepsRecordsInOrderUntilUnregistered) {
    int deletions = 0;
    auto* first = new TestBuildInfo("libTestFirst", &deletions);
    auto* second = new TestBuildInfo("libTestSecond", &deletions);
    const InBuildInfo& keptFirst = InBuildInfoUtil::registerInfo(OPtr<InBuildInfo>(first));
    const InBuildInfo& keptSecond = InBuildInfoUtil::registerInfo(OPtr<InBuildInfo>(second));
    EXPECT_EQ(&keptFirst, first);  // the record itself is kept, not a copy
    EXPECT_EQ(&keptSecond, second);

    std::vector<const InBuildInfo*> all = InBuildInfoUtil::getRegisteredInfos();
    const auto at = [&](const InBuildInfo* p) { return std::find(all.begin(), all.end(), p); };
    ASSERT_NE(at(first), all.end());
    EXPECT_LT(at(first), at(second));
    EXPECT_EQ(InBuildInfoUtil::findInfo("libTestSecond"), second);
    EXPECT_EQ(InBuildInfoUtil::findInfo("libNotThere"), nullptr);

    EXPECT_TRUE(InBuildInfoUtil::unregisterInfo(keptFirst));
    EXPECT_EQ(deletions, 1);
    EXPECT_EQ(InBuildInfoUtil::findInfo("libTestFirst"), nullptr);
    EXPECT_FALSE(InBuildInfoUtil::unregisterInfo(keptSecond) && InBuildInfoUtil::unregisterInfo(keptSecond));
    EXPECT_EQ(deletions, 2);
}

TEST(InBuildInfoUtilTest, AnEmptyRecordThrowsExNullPtr) {
    const std::size_t before = InBuildInfoUtil::getRegisteredInfos().size();
    EXPECT_THROW(InBuildInfoUtil::registerInfo(OPtr<InBuildInfo>()), ExNullPtr);
    EXPECT_EQ(InBuildInfoUtil::getRegisteredInfos().size(), before);
}

}  // namespace
}  // namespace Zr::Testing
