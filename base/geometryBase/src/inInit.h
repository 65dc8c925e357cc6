#pragma once
// Package objects with a tag type, so that dependencies can be named by type from any library
// without linking the library that makes the package.
#include <typeinfo>

#include "inPackageInit.h"

namespace Zr {

// The tags of the system's packages. Only their type_info is used.
namespace ZrInit {
struct render {};
struct suave {};
struct shaders {};
struct yarp {};
struct base {};
struct media {};
struct internalAPI {};
struct primitives {};
struct pluginAPI {};
struct resmgt {};
}  // namespace ZrInit

template <class Tag>
class InInit : public InPackageInit {
public:
    explicit InInit(const char* name) : InPackageInit(name) {}

    static const std::type_info* getType() { return &typeid(Tag); }
    const std::type_info* getTagType() const override { return getType(); }
};

// The package names of the tags above, for reading dependencies back.
class InInitTags {
public:
    // "render", "base", ... for a tag of ZrInit; null for any other type.
    static const char* getPackageName(const std::type_info& tag);
};

}  // namespace Zr
