#pragma once
// The build record of libZRrender, registered by its "render" package when the library loads.
#include "inBuildInfo.h"

namespace Zr {

class LibraryBuildInfo : public InBuildInfo {
public:
    std::string getProductTitle() const override;
    std::string getLibraryName() const override;  // "libZrrender"
    std::string getLibraryVersion() const override;
    int getYear() const override;
    int getRevision() const override;
    int getBuildNumber() const override;
    std::string getBuildDate() const override;
    std::string getBuildConfiguration() const override;  // "opt.x86_32.intel"
};

}  // namespace Zr
