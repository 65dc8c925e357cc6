#pragma once
// An observer of an object held by RCStrongPtr: it keeps the count block alive, not the object.
// It cannot be dereferenced; lock() gives a strong pointer while the object lives and an empty one
// after its last strong pointer went.
#include <cstddef>
#include <type_traits>
#include <utility>

#include "rcStrongPtr.h"

namespace Zr {

template <class T>
class RCWeakPtr {
    template <class U>
    friend class RCWeakPtr;

public:
    RCWeakPtr() = default;
    RCWeakPtr(std::nullptr_t) {}
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    RCWeakPtr(const RCStrongPtr<U>& strong) : _pointee(strong._pointee), _count(strong._count) {
        acquire();
    }
    RCWeakPtr(const RCWeakPtr& other) : _pointee(other._pointee), _count(other._count) { acquire(); }
    RCWeakPtr(RCWeakPtr&& other) noexcept : _pointee(other._pointee), _count(other._count) {
        other._pointee = nullptr;
        other._count = nullptr;
    }
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    RCWeakPtr(const RCWeakPtr<U>& other) : _pointee(other._pointee), _count(other._count) {
        acquire();
    }
    ~RCWeakPtr() {
        if (_count) _count->removeReference();
    }

    RCWeakPtr& operator=(RCWeakPtr other) noexcept {
        swap(other);
        return *this;
    }
    void swap(RCWeakPtr& other) noexcept {
        std::swap(_pointee, other._pointee);
        std::swap(_count, other._count);
    }
    void reset() { RCWeakPtr().swap(*this); }

    // True when there was never an object or its last strong pointer went.
    bool isExpired() const { return _count == nullptr || _count->isExpired(); }

    // A strong pointer to the object if it still lives, else an empty one.
    RCStrongPtr<T> lock() const {
        if (_count && _count->addStrongIfAlive()) {
            _count->addReference();
            return RCStrongPtr<T>(_pointee, _count);
        }
        return RCStrongPtr<T>();
    }

private:
    void acquire() {
        if (_count) _count->addReference();
    }

    T* _pointee = nullptr;
    RCSWCountInt* _count = nullptr;
};

}  // namespace Zr
