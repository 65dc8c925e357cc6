#pragma once
// The count block of RCStrongPtr and RCWeakPtr: it lives beside the object it counts, so the object
// itself needs no count of its own and need not derive from RCBase.
//
// Two counts, two lifetimes:
// - The strong count is the number of RCStrongPtr holding the object. When it drops to 0 the object
//   is deleted, once, with the type it was made with.
// - The block's own RCBase count is the number of pointers of either kind (strong or weak) holding
//   the block. When it drops to 0 the block is deleted. Every strong pointer holds a block
//   reference too, so the block always outlives the deletion of its object.
// A weak pointer becomes strong only while the strong count is above 0 (addStrongIfAlive); an
// object whose last strong reference went stays dead.
#include "rcBase.h"

namespace Zr {

template <class Counter>
class RCSWCount : public RCBase<Counter> {
public:
    using Deleter = void (*)(void*);

    // A block for object, with no references of either kind yet; deleter ends the object.
    RCSWCount(void* object, Deleter deleter) : _object(object), _deleter(deleter) {}
    RCSWCount(const RCSWCount&) = delete;
    RCSWCount& operator=(const RCSWCount&) = delete;

    void addStrong() { _strong.increment(); }
    // Adds a strong reference unless the object is already gone; says whether it did.
    bool addStrongIfAlive() { return _strong.incrementIfNotZero(); }
    // Drops a strong reference; the last one deletes the object. The block reference that the
    // caller also holds is dropped separately, after this.
    void removeStrong() {
        if (_strong.decrement() == 0) {
            void* object = _object;
            _object = nullptr;
            _deleter(object);
        }
    }
    int getStrongCount() const { return _strong.get(); }
    bool isExpired() const { return _strong.get() == 0; }

    // The deleter for objects made as a T.
    template <class T>
    static void deleteAs(void* object) {
        delete static_cast<T*>(object);
    }

private:
    Counter _strong;
    void* _object;
    Deleter _deleter;
};

using RCSWCountInt = RCSWCount<LkCounter<int>>;

}  // namespace Zr
