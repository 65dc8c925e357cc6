#pragma once
// The start of libZRrender. Loading the library constructs its four package records, "render",
// "suave", "shaders" and "yarp", which register themselves and their dependencies with the
// process-wide package registry; the "render" package also registers the library's build record.
//
// A host that wants to see those records calls RenderInit: calling into the library also makes
// sure the linker keeps it, even when the host uses nothing else of it yet.
#include <vector>

#include "inBuildInfo.h"
#include "inPackageRecord.h"

namespace Zr {

class RenderInit {
public:
    RenderInit() = delete;

    // Does nothing but guarantee that the library is loaded and its packages are up.
    static void ensureLoaded();
    // The records of this library's packages, in registration order.
    static std::vector<InPackageRecord> getPackageRecords();
    // The build record this library registered.
    static const InBuildInfo& getBuildInfo();
};

}  // namespace Zr
