#include "zrInfoReport.h"

#include "inBuildInfoUtil.h"
#include "inPackageRegistry.h"
#include "renderInit.h"

namespace Zr {

void ZrInfoReport::print(std::ostream& os) {
    RenderInit::ensureLoaded();

    os << "Packages (registration order):\n";
    for (const InPackageRecord& package : InPackageRegistry::getPackages()) {
        os << "  " << package.name << ":";
        for (const InDependencyRecord& d : package.dependencies) os << ' ' << d.name;
        os << '\n';
    }

    os << "Start order:";
    for (const std::string& name : InPackageRegistry::computeStartOrder()) os << ' ' << name;
    os << '\n';

    for (const InBuildInfo* info : InBuildInfoUtil::getRegisteredInfos()) {
        os << "Build record:\n"
           << "  product title:       " << info->getProductTitle() << '\n'
           << "  library name:        " << info->getLibraryName() << '\n'
           << "  library version:     " << info->getLibraryVersion() << '\n'
           << "  year:                " << info->getYear() << '\n'
           << "  revision:            " << info->getRevision() << '\n'
           << "  build number:        " << info->getBuildNumber() << '\n'
           << "  build date:          " << info->getBuildDate() << '\n'
           << "  build configuration: " << info->getBuildConfiguration() << '\n';
    }
}

}  // namespace Zr
