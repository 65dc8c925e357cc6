#pragma once
// The process-wide list of registered packages, in the order they registered. It lives in
// libZRbase, so every library of the process sees the same one.
#include <optional>
#include <string>
#include <typeinfo>
#include <vector>

#include "inPackageRecord.h"
#include "lkLock.h"

namespace Zr {

class InPackageInitBase;

class InPackageRegistry {
public:
    InPackageRegistry() = delete;

    // The names of the registered packages in registration order.
    static std::vector<std::string> getPackageNames();
    // Every registered package with its dependencies, in registration order.
    static std::vector<InPackageRecord> getPackages();
    static std::optional<InPackageRecord> findPackage(const std::string& name);

    // The registered packages in an order in which each comes after the registered packages it
    // depends on, by tag or as a variable; otherwise registration order is kept. Dependencies on
    // packages not registered in this process are not ordered. A cycle is a program fault
    // (ExAssertionFailed).
    static std::vector<std::string> computeStartOrder();

private:
    friend class InPackageInitBase;

    // One lock guards the list and every package's dependencies.
    static LkLock& getLock();
    static void addLocked(InPackageInitBase* package);
    static void removeLocked(InPackageInitBase* package);
    static const InPackageInitBase* findByNameLocked(const std::string& name);
    // The package name a tag stands for: a ZrInit tag's name, else the name of the registered
    // package with that tag, else the type's own name.
    static std::string getTagNameLocked(const std::type_info& tag);
};

}  // namespace Zr
