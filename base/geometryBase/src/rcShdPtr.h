#pragma once
// A shared pointer to a reference-counted object, one pointer wide. Copies add a reference;
// destruction and reassignment drop one. Assignment takes the new reference before dropping the
// old one, so self-assignment and assignment of an object owned only through the old value are
// safe.
#include <cstddef>
#include <type_traits>
#include <utility>

#include "rcBasePtr.h"

namespace Zr {

template <class T>
class RCShdPtr : public RCBasePtr<T> {
    using Base = RCBasePtr<T>;
    template <class U>
    friend class RCShdPtr;

public:
    RCShdPtr() = default;
    RCShdPtr(std::nullptr_t) {}
    explicit RCShdPtr(T* p) : Base(p) { acquire(); }
    RCShdPtr(const RCShdPtr& other) : Base(other._pointee) { acquire(); }
    RCShdPtr(RCShdPtr&& other) noexcept : Base(other._pointee) { other._pointee = nullptr; }
    // From a pointer to a derived type, and from RCShdPtr<T> to RCShdPtr<const T>.
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    RCShdPtr(const RCShdPtr<U>& other) : Base(other._pointee) { acquire(); }
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    RCShdPtr(RCShdPtr<U>&& other) noexcept : Base(other._pointee) { other._pointee = nullptr; }

    ~RCShdPtr() { release(this->_pointee); }

    RCShdPtr& operator=(const RCShdPtr& other) { return reset(other._pointee); }
    RCShdPtr& operator=(RCShdPtr&& other) noexcept {
        if (this != &other) {
            T* old = this->_pointee;
            this->_pointee = other._pointee;
            other._pointee = nullptr;
            release(old);
        }
        return *this;
    }
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    RCShdPtr& operator=(const RCShdPtr<U>& other) { return reset(other._pointee); }
    RCShdPtr& operator=(std::nullptr_t) { return reset(nullptr); }

    // Holds p instead of the current object; the new reference is taken first.
    RCShdPtr& reset(T* p = nullptr) {
        if (p != this->_pointee) {
            if (p) p->addReference();
            T* old = this->_pointee;
            this->_pointee = p;
            release(old);
        }
        return *this;
    }

    T& operator*() const { return *this->checked(); }
    T* operator->() const { return this->checked(); }

    friend bool operator==(const RCShdPtr& a, const RCShdPtr& b) { return a._pointee == b._pointee; }
    friend bool operator==(const RCShdPtr& a, std::nullptr_t) { return a._pointee == nullptr; }

private:
    void acquire() const {
        if (this->_pointee) this->_pointee->addReference();
    }
    static void release(T* p) {
        if (p) p->removeReference();
    }
};

// Makes a new shared object held by an RCShdPtr.
template <class T, class... Args>
RCShdPtr<T> makeShared(Args&&... args) {
    return RCShdPtr<T>(new T(std::forward<Args>(args)...));
}

// A checked down-cast between shared pointers; an empty result when the object is not a U.
template <class U, class T>
RCShdPtr<U> dynamicPointerCast(const RCShdPtr<T>& p) {
    return RCShdPtr<U>(dynamic_cast<U*>(p.get()));
}

}  // namespace Zr
