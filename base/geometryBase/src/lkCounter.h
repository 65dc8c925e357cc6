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

private:
    std::atomic<T> _value;
};

}  // namespace Zr
