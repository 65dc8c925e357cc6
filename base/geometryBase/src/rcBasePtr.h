#pragma once
// The common base of the RC pointers: one raw pointer, a null test and a debug printer.
#include <ostream>
#include <typeinfo>

#include "rcExUtil.h"

namespace Zr {

template <class T>
class RCBasePtr {
public:
    bool isNull() const { return _pointee == nullptr; }
    explicit operator bool() const { return _pointee != nullptr; }
    // The raw pointer, null allowed; no check.
    T* get() const { return _pointee; }

    void dump(std::ostream& os) const {
        os << " _pointee: " << static_cast<const void*>(_pointee);
    }

protected:
    RCBasePtr() = default;
    explicit RCBasePtr(T* p) : _pointee(p) {}

    // The pointee for a dereference; an empty pointer reports the pointed-to type.
    T* checked() const {
        if (_pointee == nullptr) RCExUtil::throwExNullPtr(typeid(T).name());
        return _pointee;
    }

    T* _pointee = nullptr;
};

}  // namespace Zr
