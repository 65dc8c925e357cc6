#pragma once
// The record of one library's build: what it is, which version, when and how it was built. Each
// library derives its own and hands it to InBuildInfoUtil::registerInfo when it loads.
#include <ostream>
#include <string>

namespace Zr {

class InBuildInfo {
public:
    virtual ~InBuildInfo();

    virtual std::string getProductTitle() const = 0;
    virtual std::string getLibraryName() const = 0;
    virtual std::string getLibraryVersion() const = 0;
    virtual int getYear() const = 0;
    virtual int getRevision() const = 0;
    virtual int getBuildNumber() const = 0;
    virtual std::string getBuildDate() const = 0;
    virtual std::string getBuildConfiguration() const = 0;

    // Debug printer: every field under its name.
    void dump(std::ostream& os) const;

protected:
    InBuildInfo() = default;
    InBuildInfo(const InBuildInfo&) = default;
    InBuildInfo& operator=(const InBuildInfo&) = default;
};

}  // namespace Zr
