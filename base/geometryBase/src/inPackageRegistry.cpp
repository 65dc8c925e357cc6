#include "inPackageRegistry.h"


#include "assertions.h"
#include "inInit.h"
#include "inPackageInit.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = ".\\base/geometryBase/src/inPackageRegistry.cpp";

struct RegistryState {
    LkLock lock{"InPackageRegistry lock"};
    std::vector<InPackageInitBase*> packages;
};

// Made on first use and never destroyed: package objects of other libraries unregister from
// their static destructors, which may run after this library's statics at process exit.
RegistryState& state() {
    static RegistryState* s = new RegistryState;
    return *s;
}

}  // namespace

LkLock& InPackageRegistry::getLock() { return state().lock; }

void InPackageRegistry::addLocked(InPackageInitBase* package) {
    state().packages.push_back(package);
}

void InPackageRegistry::removeLocked(InPackageInitBase* package) {
    std::vector<InPackageInitBase*>& packages = state().packages;
    std::erase(packages, package);
}

const InPackageInitBase* InPackageRegistry::findByNameLocked(const std::string& name) {
    for (const InPackageInitBase* p : state().packages) {
        if (name == p->getName()) return p;
    }
    return nullptr;
}

std::string InPackageRegistry::getTagNameLocked(const std::type_info& tag) {
    if (const char* known = InInitTags::getPackageName(tag)) return known;
    for (const InPackageInitBase* p : state().packages) {
        const std::type_info* type = p->getTagType();
        if (type && *type == tag) return p->getName();
    }
    return tag.name();
}

std::vector<std::string> InPackageRegistry::getPackageNames() {
    LkLockGuard guard(getLock());
    std::vector<std::string> names;
    for (const InPackageInitBase* p : state().packages) names.emplace_back(p->getName());
    return names;
}

std::vector<InPackageRecord> InPackageRegistry::getPackages() {
    LkLockGuard guard(getLock());
    std::vector<InPackageRecord> records;
    for (const InPackageInitBase* p : state().packages) records.push_back(p->makeRecordLocked());
    return records;
}

std::optional<InPackageRecord> InPackageRegistry::findPackage(const std::string& name) {
    LkLockGuard guard(getLock());
    if (const InPackageInitBase* p = findByNameLocked(name)) return p->makeRecordLocked();
    return std::nullopt;
}

std::vector<std::string> InPackageRegistry::computeStartOrder() {
    LkLockGuard guard(getLock());
    const std::vector<InPackageInitBase*>& packages = state().packages;
    const std::size_t count = packages.size();

    // needs[i] lists the indices of the registered packages that package i depends on.
    std::vector<std::vector<std::size_t>> needs(count);
    for (std::size_t i = 0; i < count; ++i) {
        for (const InPackageInitBase::Dependency& d : packages[i]->_dependencies) {
            for (std::size_t j = 0; j < count; ++j) {
                const std::type_info* tag = packages[j]->getTagType();
                const bool byTag = d.tag && tag && *d.tag == *tag;
                const bool byObject = d.variable && d.variable == packages[j];
                if (j != i && (byTag || byObject)) needs[i].push_back(j);
            }
        }
    }

    // Repeatedly take the earliest registered package whose needs are all placed. Quadratic, but
    // a process has a handful of packages.
    std::vector<bool> placed(count, false);
    std::vector<std::string> order;
    while (order.size() < count) {
        bool progressed = false;
        for (std::size_t i = 0; i < count && !progressed; ++i) {
            if (placed[i]) continue;
            bool ready = true;
            for (std::size_t j : needs[i]) ready = ready && placed[j];
            if (ready) {
                placed[i] = true;
                order.emplace_back(packages[i]->getName());
                progressed = true;
            }
        }
        if (!progressed) {
            Assertions::throwAssertionFailed(kSourceFile, __LINE__,
                                             "no dependency cycle between packages");
        }
    }
    return order;
}

}  // namespace Zr
