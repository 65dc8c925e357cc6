#pragma once
// The process-wide keeper of the libraries' build records. It lives in libZRbase, so every library
// of the process registers into, and reads back from, the same list.
#include <string>
#include <vector>

#include "inBuildInfo.h"
#include "oPtr.h"

namespace Zr {

class InBuildInfoUtil {
public:
    InBuildInfoUtil() = delete;

    // Keeps the record and answers a reference to the kept one, valid until it is unregistered.
    // An empty pointer throws ExNullPtr.
    static const InBuildInfo& registerInfo(OPtr<InBuildInfo> info);
    // Deletes a kept record; for a library that is being unloaded, whose code the record's
    // methods are. Answers whether the record was kept.
    static bool unregisterInfo(const InBuildInfo& info);

    // The kept records in registration order.
    static std::vector<const InBuildInfo*> getRegisteredInfos();
    // The first kept record with this library name, or null.
    static const InBuildInfo* findInfo(const std::string& libraryName);
};

}  // namespace Zr
