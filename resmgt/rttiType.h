#pragma once
// The run-time type of a class within the hierarchy rooted at Root. Registries that serve one
// hierarchy take an RttiType<Root>, so that a type of another hierarchy cannot be given to them
// by mistake.
#include <typeinfo>

#include "rcExUtil.h"
#include "rttiTypeBase.h"

namespace Zr {

template <class Root>
class RttiType : public RttiTypeBase {
public:
    using RootClass = Root;

    // type seen as a member of this hierarchy; ExCastFailed when it belongs to another.
    static const RttiType& cast(const RttiTypeBase& type) {
        const RttiType* typed = dynamic_cast<const RttiType*>(&type);
        if (!typed) RCExUtil::throwExCastFailed(type.getName().c_str(), typeid(RttiType).name());
        return *typed;
    }

protected:
    RttiType(const std::type_info& info, RttiTypeBase* parent) : RttiTypeBase(info, parent) {}
};

}  // namespace Zr
