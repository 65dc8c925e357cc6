#pragma once
// The base of every shared object: a virtual destructor and an intrusive reference count that
// starts at 0. The pointers of the RC family add and drop references; the object deletes itself
// through the virtual destructor when the last reference goes.
#include "lkCounter.h"

namespace Zr {

template <class Counter>
class RCBase {
public:
    virtual ~RCBase() = default;

    void addReference() const { _refCount.increment(); }
    // Drops one reference and deletes the object when it was the last one.
    void removeReference() const {
        if (_refCount.decrement() == 0) delete this;
    }
    int getReferenceCount() const { return _refCount.get(); }

protected:
    RCBase() = default;
    // A copy is a new object: it starts with no references of its own.
    RCBase(const RCBase&) {}
    RCBase& operator=(const RCBase&) { return *this; }

private:
    mutable Counter _refCount;
};

using RCObject = RCBase<LkCounter<int>>;

}  // namespace Zr
