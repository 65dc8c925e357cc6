#pragma once
// The singleton type objects of the classes of a hierarchy.
//
// A class takes part by naming its type object class in the member alias RttiClassType and by
// answering it from its virtual getType():
//
//   class SdLight : public SdObject {
//   public:
//       using RttiClassType = RttiGenType1<SdLight, SdObject>;
//       const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }
//   };
//
// RttiGenType0<T, Root> describes a root class (T is normally Root itself); it has no ancestors.
// RttiGenType1<T, Parent> describes a class derived from Parent; its ancestors are Parent's type
// followed by Parent's ancestors, and it belongs to Parent's hierarchy.
#include <typeinfo>

#include "lkSingleton.h"
#include "rcExUtil.h"
#include "rttiType.h"

namespace Zr {

// The type object class of a class of a hierarchy. Specialise it for a class that cannot carry
// the member alias.
template <class T>
struct RttiClassOf {
    using Type = typename T::RttiClassType;
};

template <class T, class Root>
class RttiGenType0 : public RttiType<Root> {
public:
    using DescribedClass = T;

    // The one type object of T, made on first demand.
    static RttiGenType0& getInstance() {
        RttiGenType0* instance = LkSingleton<RttiGenType0>::getInstance();
        // Only after the singletons were destroyed at the end of the process.
        if (!instance) RCExUtil::throwExNullPtr(typeid(RttiGenType0).name());
        return *instance;
    }

private:
    friend class LkSingleton<RttiGenType0>;
    RttiGenType0() : RttiType<Root>(typeid(T), nullptr) {}
};

template <class T, class Parent>
class RttiGenType1 : public RttiType<typename RttiClassOf<Parent>::Type::RootClass> {
    using ParentType = typename RttiClassOf<Parent>::Type;
    using Base = RttiType<typename ParentType::RootClass>;

public:
    using DescribedClass = T;
    using ParentClass = Parent;

    // The one type object of T, made on first demand; the parent's type object is made first.
    static RttiGenType1& getInstance() {
        RttiGenType1* instance = LkSingleton<RttiGenType1>::getInstance();
        if (!instance) RCExUtil::throwExNullPtr(typeid(RttiGenType1).name());
        return *instance;
    }

private:
    friend class LkSingleton<RttiGenType1>;
    RttiGenType1() : Base(typeid(T), &ParentType::getInstance()) {}
};

}  // namespace Zr
