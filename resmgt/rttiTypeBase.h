#pragma once
// The run-time type of an object in one of the system's class hierarchies. Unlike the language's
// own type information it carries a number, by which registries index types, and the list of the
// type's ancestors, by which a registry falls back from a type to its nearest registered base.
//
// Type objects are process-wide singletons (see RttiGenType0 and RttiGenType1): each class of a
// hierarchy has exactly one, compared by identity or by number.
#include <ostream>
#include <string>
#include <typeinfo>
#include <vector>

#include "constIterator.h"

namespace Zr {

class RttiTypeBase {
public:
    RttiTypeBase(const RttiTypeBase&) = delete;
    RttiTypeBase& operator=(const RttiTypeBase&) = delete;
    virtual ~RttiTypeBase();

    // A number unique among the type objects of the process, fixed for the object's life. Numbers
    // are handed out in the order in which type objects are made, starting at 1.
    int getTypeId() const { return _typeId; }
    // The readable name of the class this object describes.
    const std::string& getName() const { return _name; }
    // The language's type information of the described class.
    const std::type_info& getTypeInfo() const { return *_typeInfo; }

    // The ancestors, nearest first: the parent, its parent, and so on up to the root of the
    // hierarchy. A root type has none. The type itself is not among them.
    ConstIterator<RttiTypeBase*> getAncestors() const;
    // The parent type, or null for a root.
    RttiTypeBase* getParent() const { return _ancestors.empty() ? nullptr : _ancestors.front(); }
    // True when other is this type or one of its ancestors.
    bool isA(const RttiTypeBase& other) const;

    void dump(std::ostream& os) const;

protected:
    // parent may be null for the root of a hierarchy.
    RttiTypeBase(const std::type_info& info, RttiTypeBase* parent);

private:
    int _typeId;
    std::string _name;
    const std::type_info* _typeInfo;
    std::vector<RttiTypeBase*> _ancestors;
};

}  // namespace Zr
