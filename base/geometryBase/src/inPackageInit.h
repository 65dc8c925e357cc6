#pragma once
// The announcement of a package. Each shared library makes one such object per package during its
// static initialisation, registers it and states what the package needs:
//
//   static InInit<ZrInit::yarp> yarpPackage("yarp");
//   yarpPackage.registerPackage();
//   yarpPackage.addDependency(InInit<ZrInit::base>::getType());
//
// A registered package stays in the process-wide registry (InPackageRegistry) until the object
// is destroyed, when its library is unloaded.
#include <string>
#include <typeinfo>
#include <vector>

#include "inPackageRecord.h"
#include "inVariableBase.h"

namespace Zr {

class InPackageInitBase : public InVariableBase {
public:
    ~InPackageInitBase() override;

    // Enters the package in the registry. Again for the same object does nothing; another
    // package object of the same name is a program fault (ExAssertionFailed).
    void registerPackage();
    bool isRegistered() const;

    // States that the package needs the package with this tag. A dependency already stated is
    // not added twice.
    void addDependency(const std::type_info* tag);
    // States that the package needs this variable (or package object).
    void addDependency(InVariableBase* variable);
    // Withdraws a variable dependency; one never added is ignored.
    void removeDependency(InVariableBase* variable);

    // The tag of the package, or null for a package known by its name only.
    virtual const std::type_info* getTagType() const { return nullptr; }

    // A copy of the package's name and dependencies, in the order added.
    InPackageRecord getRecord() const;

protected:
    explicit InPackageInitBase(const char* name);

private:
    friend class InPackageRegistry;

    struct Dependency {
        const std::type_info* tag;     // set for a tag dependency
        const InVariableBase* variable;  // set for a variable dependency; compared, never followed
        std::string variableName;      // taken when added, so the variable may die first
    };

    // Needs the registry lock held.
    InPackageRecord makeRecordLocked() const;

    std::vector<Dependency> _dependencies;
    bool _registered = false;
};

class InPackageInit : public InPackageInitBase {
public:
    // name must outlive the object (a literal).
    explicit InPackageInit(const char* name);
};

}  // namespace Zr
