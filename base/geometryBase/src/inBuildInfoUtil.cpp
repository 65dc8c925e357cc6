#include "inBuildInfoUtil.h"

#include <utility>

#include "lkLock.h"

namespace Zr {

namespace {

struct KeptInfos {
    LkLock lock{"InBuildInfoUtil lock"};
    std::vector<OPtr<InBuildInfo>> infos;
};

// Made on first use and never destroyed: the records' code lives in the libraries that made
// them, which may be gone by the time this library's statics would be destroyed.
KeptInfos& kept() {
    static KeptInfos* k = new KeptInfos;
    return *k;
}

}  // namespace

const InBuildInfo& InBuildInfoUtil::registerInfo(OPtr<InBuildInfo> info) {
    const InBuildInfo& record = *info;  // throws ExNullPtr for an empty pointer
    KeptInfos& k = kept();
    LkLockGuard guard(k.lock);
    k.infos.push_back(std::move(info));
    return record;
}

bool InBuildInfoUtil::unregisterInfo(const InBuildInfo& info) {
    KeptInfos& k = kept();
    OPtr<InBuildInfo> doomed;  // deleted after the lock is released
    {
        LkLockGuard guard(k.lock);
        for (auto it = k.infos.begin(); it != k.infos.end(); ++it) {
            if (it->get() == &info) {
                doomed = std::move(*it);
                k.infos.erase(it);
                break;
            }
        }
    }
    return !doomed.isNull();
}

std::vector<const InBuildInfo*> InBuildInfoUtil::getRegisteredInfos() {
    KeptInfos& k = kept();
    LkLockGuard guard(k.lock);
    std::vector<const InBuildInfo*> result;
    for (const OPtr<InBuildInfo>& info : k.infos) result.push_back(info.get());
    return result;
}

const InBuildInfo* InBuildInfoUtil::findInfo(const std::string& libraryName) {
    KeptInfos& k = kept();
    LkLockGuard guard(k.lock);
    for (const OPtr<InBuildInfo>& info : k.infos) {
        if (info->getLibraryName() == libraryName) return info.get();
    }
    return nullptr;
}

}  // namespace Zr
