#pragma once
// A shared pointer with a separate count block (RCSWCount): it holds objects of any type, not
// only RCBase ones, and it can be observed by RCWeakPtr. Two pointers wide.
//
// Copies add a strong reference; destruction and reassignment drop one, and the last strong
// reference deletes the object with the type it was made with (so a RCStrongPtr<Base> made from a
// Derived deletes a Derived even without a virtual destructor). Assignment takes the new reference
// before dropping the old one, so self-assignment is harmless. Counts are atomic; one pointer
// object is not to be written from two threads.
#include <cstddef>
#include <type_traits>
#include <utility>

#include "rcBasePtr.h"
#include "rcSWCount.h"

namespace Zr {

template <class T>
class RCWeakPtr;

template <class T>
class RCStrongPtr : public RCBasePtr<T> {
    using Base = RCBasePtr<T>;
    template <class U>
    friend class RCStrongPtr;
    template <class U>
    friend class RCWeakPtr;

public:
    RCStrongPtr() = default;
    RCStrongPtr(std::nullptr_t) {}
    // Takes ownership of p, made with new. Should the count block fail to allocate, p is deleted.
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    explicit RCStrongPtr(U* p) : Base(p) {
        if (p) {
            try {
                _count = new RCSWCountInt(const_cast<std::remove_cv_t<U>*>(p),
                                          &RCSWCountInt::deleteAs<std::remove_cv_t<U>>);
            } catch (...) {
                delete p;
                throw;
            }
            _count->addReference();
            _count->addStrong();
        }
    }
    RCStrongPtr(const RCStrongPtr& other) : Base(other._pointee), _count(other._count) { acquire(); }
    RCStrongPtr(RCStrongPtr&& other) noexcept : Base(other._pointee), _count(other._count) {
        other.forget();
    }
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    RCStrongPtr(const RCStrongPtr<U>& other) : Base(other._pointee), _count(other._count) {
        acquire();
    }
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    RCStrongPtr(RCStrongPtr<U>&& other) noexcept : Base(other._pointee), _count(other._count) {
        other.forget();
    }

    ~RCStrongPtr() { release(); }

    RCStrongPtr& operator=(const RCStrongPtr& other) {
        RCStrongPtr(other).swap(*this);
        return *this;
    }
    RCStrongPtr& operator=(RCStrongPtr&& other) noexcept {
        RCStrongPtr(std::move(other)).swap(*this);
        return *this;
    }
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    RCStrongPtr& operator=(const RCStrongPtr<U>& other) {
        RCStrongPtr(other).swap(*this);
        return *this;
    }
    template <class U, class = std::enable_if_t<std::is_convertible_v<U*, T*>>>
    RCStrongPtr& operator=(RCStrongPtr<U>&& other) noexcept {
        RCStrongPtr(std::move(other)).swap(*this);
        return *this;
    }
    RCStrongPtr& operator=(std::nullptr_t) {
        reset();
        return *this;
    }

    void reset() { RCStrongPtr().swap(*this); }
    template <class U>
    void reset(U* p) {
        RCStrongPtr(p).swap(*this);
    }
    void swap(RCStrongPtr& other) noexcept {
        std::swap(this->_pointee, other._pointee);
        std::swap(_count, other._count);
    }

    T& operator*() const { return *this->checked(); }
    T* operator->() const { return this->checked(); }

    // The number of strong pointers sharing the object; 0 for an empty pointer.
    int getStrongCount() const { return _count ? _count->getStrongCount() : 0; }

    friend bool operator==(const RCStrongPtr& a, const RCStrongPtr& b) {
        return a._pointee == b._pointee;
    }
    friend bool operator==(const RCStrongPtr& a, std::nullptr_t) { return a._pointee == nullptr; }

private:
    // Adopts a strong reference and a block reference already taken by the caller.
    RCStrongPtr(T* p, RCSWCountInt* count) : Base(p), _count(count) {}

    void acquire() {
        if (_count) {
            _count->addReference();
            _count->addStrong();
        }
    }
    void release() {
        if (_count) {
            RCSWCountInt* count = _count;
            forget();
            count->removeStrong();
            count->removeReference();
        }
    }
    void forget() {
        this->_pointee = nullptr;
        _count = nullptr;
    }

    RCSWCountInt* _count = nullptr;
};

// Makes a new object held by an RCStrongPtr.
template <class T, class... Args>
RCStrongPtr<T> makeStrong(Args&&... args) {
    return RCStrongPtr<T>(new T(std::forward<Args>(args)...));
}

}  // namespace Zr
