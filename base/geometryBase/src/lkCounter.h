#pragma once
// A counter changed by atomic increment and decrement: the reference count of shared objects.
#include <atomic>

namespace Zr {

template <class T>
class LkCounter {
public:
    LkCounter() : _value(0) {}
    explicit LkCounter(T value) : _value(value) {}
    LkCounter(const LkCounter&) = delete;
    LkCounter& operator=(const LkCounter&) = delete;

    // Both return the value after the change.
    T increment() { return _value.fetch_add(1, std::memory_order_relaxed) + 1; }
    T decrement() { return _value.fetch_sub(1, std::memory_order_acq_rel) - 1; }
    T get() const { return _value.load(std::memory_order_acquire); }
    // Adds 1 unless the value is 0, atomically; returns whether it added. A weak reference turns
    // into a strong one this way, so an object whose last strong reference went is never revived.
    bool incrementIfNotZero() {
        T seen = _value.load(std::memory_order_relaxed);
        while (seen != 0) {
            if (_value.compare_exchange_weak(seen, seen + 1, std::memory_order_acq_rel,
                                             std::memory_order_relaxed)) {
                return true;
            }
        }
        return false;
    }

private:
    std::atomic<T> _value;
};

}  // namespace Zr
