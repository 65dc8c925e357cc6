#pragma once
// A read-only walk over a contiguous run of values, for callers that want to step through a list
// without knowing how it is stored:
//
//   for (ConstIterator<RttiTypeBase*> it = type.getAncestors(); !it.atEnd(); ++it) use(*it);
//
// The iterator does not own the values: the list it was made from must outlive it.
#include <cstddef>

namespace Zr {

template <class T>
class ConstIterator {
public:
    // An iterator that is already at its end.
    ConstIterator() = default;
    // Walks the values from first up to, excluding, end.
    ConstIterator(const T* first, const T* end) : _current(first), _end(end) {}

    bool atEnd() const { return _current == _end; }
    // The current value; only valid while !atEnd().
    const T& operator*() const { return *_current; }
    const T* operator->() const { return _current; }
    ConstIterator& operator++() {
        ++_current;
        return *this;
    }
    ConstIterator operator++(int) {
        ConstIterator before = *this;
        ++_current;
        return before;
    }
    // The number of values not yet visited.
    std::size_t getRemaining() const { return static_cast<std::size_t>(_end - _current); }

private:
    const T* _current = nullptr;
    const T* _end = nullptr;
};

}  // namespace Zr
