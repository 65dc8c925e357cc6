#include "inPackageInit.h"

#include <algorithm>
#include <string>

#include "assertions.h"
#include "inPackageRegistry.h"
#include "lkLock.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = ".\\base/geometryBase/src/inPackageInit.cpp";
}

InPackageInitBase::InPackageInitBase(const char* name) : InVariableBase(name) {}

InPackageInitBase::~InPackageInitBase() {
    LkLockGuard guard(InPackageRegistry::getLock());
    if (_registered) InPackageRegistry::removeLocked(this);
}

void InPackageInitBase::registerPackage() {
    LkLockGuard guard(InPackageRegistry::getLock());
    if (_registered) return;
    const InPackageInitBase* other = InPackageRegistry::findByNameLocked(getName());
    if (other != nullptr) {
        Assertions::throwAssertionFailed(kSourceFile, __LINE__,
                                         "one registered package per package name");
    }
    InPackageRegistry::addLocked(this);
    _registered = true;
}

bool InPackageInitBase::isRegistered() const {
    LkLockGuard guard(InPackageRegistry::getLock());
    return _registered;
}

void InPackageInitBase::addDependency(const std::type_info* tag) {
    if (tag == nullptr) Assertions::throwAssertionFailed(kSourceFile, __LINE__, "tag != 0");
    LkLockGuard guard(InPackageRegistry::getLock());
    const bool known = std::any_of(_dependencies.begin(), _dependencies.end(),
                                   [tag](const Dependency& d) { return d.tag && *d.tag == *tag; });
    if (!known) _dependencies.push_back({tag, nullptr, std::string()});
}

void InPackageInitBase::addDependency(InVariableBase* variable) {
    if (variable == nullptr) Assertions::throwAssertionFailed(kSourceFile, __LINE__, "variable != 0");
    LkLockGuard guard(InPackageRegistry::getLock());
    const bool known = std::any_of(_dependencies.begin(), _dependencies.end(),
                                   [variable](const Dependency& d) { return d.variable == variable; });
    if (!known) _dependencies.push_back({nullptr, variable, variable->getName()});
}

void InPackageInitBase::removeDependency(InVariableBase* variable) {
    if (variable == nullptr) return;
    LkLockGuard guard(InPackageRegistry::getLock());
    std::erase_if(_dependencies, [variable](const Dependency& d) { return d.variable == variable; });
}

InPackageRecord InPackageInitBase::getRecord() const {
    LkLockGuard guard(InPackageRegistry::getLock());
    return makeRecordLocked();
}

InPackageRecord InPackageInitBase::makeRecordLocked() const {
    InPackageRecord record;
    record.name = getName();
    if (const std::type_info* tag = getTagType()) record.tagTypeName = tag->name();
    for (const Dependency& d : _dependencies) {
        InDependencyRecord r;
        if (d.tag) {
            r.kind = InDependencyRecord::TAG;
            r.name = InPackageRegistry::getTagNameLocked(*d.tag);
            r.typeName = d.tag->name();
        } else {
            r.kind = InDependencyRecord::VARIABLE;
            r.name = d.variableName;
        }
        record.dependencies.push_back(std::move(r));
    }
    return record;
}

InPackageInit::InPackageInit(const char* name) : InPackageInitBase(name) {}

}  // namespace Zr
