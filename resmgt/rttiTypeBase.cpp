#include "rttiTypeBase.h"

#include <atomic>
#include <cstdlib>

#if __has_include(<cxxabi.h>)
#include <cxxabi.h>
#define ZR_RTTI_DEMANGLE 1
#endif

namespace Zr {

namespace {

// Type objects may be made from several threads at once (each under its own singleton lock), so
// the numbering is atomic.
std::atomic<int> nextTypeId{1};

std::string readableName(const std::type_info& info) {
#ifdef ZR_RTTI_DEMANGLE
    int status = 0;
    char* demangled = abi::__cxa_demangle(info.name(), nullptr, nullptr, &status);
    if (status == 0 && demangled) {
        std::string name(demangled);
        std::free(demangled);
        return name;
    }
    std::free(demangled);
#endif
    return info.name();
}

}  // namespace

RttiTypeBase::RttiTypeBase(const std::type_info& info, RttiTypeBase* parent)
    : _typeId(nextTypeId.fetch_add(1, std::memory_order_relaxed)),
      _name(readableName(info)),
      _typeInfo(&info) {
    if (parent) {
        _ancestors.reserve(parent->_ancestors.size() + 1);
        _ancestors.push_back(parent);
        _ancestors.insert(_ancestors.end(), parent->_ancestors.begin(), parent->_ancestors.end());
    }
}

RttiTypeBase::~RttiTypeBase() = default;

ConstIterator<RttiTypeBase*> RttiTypeBase::getAncestors() const {
    return ConstIterator<RttiTypeBase*>(_ancestors.data(), _ancestors.data() + _ancestors.size());
}

bool RttiTypeBase::isA(const RttiTypeBase& other) const {
    if (&other == this) return true;
    for (const RttiTypeBase* ancestor : _ancestors) {
        if (ancestor == &other) return true;
    }
    return false;
}

void RttiTypeBase::dump(std::ostream& os) const {
    os << " _typeId: " << _typeId << " _name: " << _name << " _ancestors:";
    for (const RttiTypeBase* ancestor : _ancestors) os << ' ' << ancestor->_typeId;
}

}  // namespace Zr
