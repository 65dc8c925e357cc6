#pragma once
// A pointer with sole ownership. It cannot be copied; it is passed by value (moved) to hand the
// object over, and deletes the object when it goes out of scope still holding it.
#include <cstddef>
#include <type_traits>
#include <utility>

#include "rcBasePtr.h"

namespace Zr {

template <class T>
class OPtr : public RCBasePtr<T> {
    using Base = RCBasePtr<T>;
    template <class U>
    friend class OPtr;

public:
    OPtr() = default;
    OPtr(std::nullptr_t) {}
    // Takes ownership of p, made with new.
    explicit OPtr(T* p) : Base(p) {}
    OPtr(OPtr&& other) noexcept : Base(other.release()) {}
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    OPtr(OPtr<U>&& other) noexcept : Base(other.release()) {}
    OPtr(const OPtr&) = delete;
    OPtr& operator=(const OPtr&) = delete;

    ~OPtr() { delete this->_pointee; }

    OPtr& operator=(OPtr&& other) noexcept {
        reset(other.release());
        return *this;
    }
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    OPtr& operator=(OPtr<U>&& other) noexcept {
        reset(other.release());
        return *this;
    }
    OPtr& operator=(std::nullptr_t) {
        reset();
        return *this;
    }

    // Gives up ownership without deleting; the caller owns the result.
    T* release() {
        T* p = this->_pointee;
        this->_pointee = nullptr;
        return p;
    }
    // Owns p instead; the previous object is deleted unless it is p itself.
    void reset(T* p = nullptr) {
        T* old = this->_pointee;
        this->_pointee = p;
        if (old != p) delete old;
    }

    T& operator*() const { return *this->checked(); }
    T* operator->() const { return this->checked(); }

    friend bool operator==(const OPtr& a, std::nullptr_t) { return a._pointee == nullptr; }
};

// Makes a new object held by an OPtr.
template <class T, class... Args>
OPtr<T> makeOwned(Args&&... args) {
    return OPtr<T>(new T(std::forward<Args>(args)...));
}

}  // namespace Zr
