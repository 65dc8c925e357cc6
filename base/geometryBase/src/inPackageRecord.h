#pragma once
// What the package registry tells about a package: plain copies, valid after the package went.
#include <string>
#include <vector>

namespace Zr {

struct InDependencyRecord {
    enum Kind { TAG, VARIABLE };

    Kind kind = TAG;
    // A tag's package name ("base", "yarp", ...) or a variable's name.
    std::string name;
    // For a tag, the name its type_info gives; empty for a variable.
    std::string typeName;
};

struct InPackageRecord {
    std::string name;
    // The type_info name of the package's tag, empty for a package without one.
    std::string tagTypeName;
    // In the order they were added.
    std::vector<InDependencyRecord> dependencies;

    std::vector<std::string> getDependencyNames() const {
        std::vector<std::string> names;
        names.reserve(dependencies.size());
        for (const InDependencyRecord& d : dependencies) names.push_back(d.name);
        return names;
    }
};

}  // namespace Zr
