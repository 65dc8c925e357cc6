#include "inBuildInfo.h"

namespace Zr {

InBuildInfo::~InBuildInfo() = default;

void InBuildInfo::dump(std::ostream& os) const {
    os << " _productTitle: " << getProductTitle() << " _libraryName: " << getLibraryName()
       << " _libraryVersion: " << getLibraryVersion() << " _year: " << getYear()
       << " _revision: " << getRevision() << " _buildNumber: " << getBuildNumber()
       << " _buildDate: " << getBuildDate() << " _buildConfiguration: " << getBuildConfiguration();
}

}  // namespace Zr
