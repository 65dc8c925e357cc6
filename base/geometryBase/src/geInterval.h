#pragma once
// A closed range [min, max]. GeInterval<int> also names a run of pixels on a scanline, both ends
// included. An interval with min > max is empty.
#include <limits>
#include <ostream>

namespace Zr {

template <class T>
struct GeInterval {
    T min{};
    T max{};

    constexpr GeInterval() = default;
    constexpr GeInterval(T min_, T max_) : min(min_), max(max_) {}

    // The empty interval that any grow replaces.
    static constexpr GeInterval makeEmpty() {
        return {std::numeric_limits<T>::max(), std::numeric_limits<T>::lowest()};
    }

    constexpr bool isEmpty() const { return min > max; }
    constexpr bool contains(T v) const { return min <= v && v <= max; }
    // max - min; for integer pixel runs the count of pixels is getLength() + 1.
    constexpr T getLength() const { return max - min; }
    constexpr void grow(T v) {
        if (v < min) min = v;
        if (v > max) max = v;
    }
    constexpr GeInterval intersect(const GeInterval& o) const {
        return {min > o.min ? min : o.min, max < o.max ? max : o.max};
    }
    constexpr bool operator==(const GeInterval& o) const { return min == o.min && max == o.max; }
    constexpr bool operator!=(const GeInterval& o) const { return !(*this == o); }

    void dump(std::ostream& os) const { os << " min: " << min << " max: " << max; }
};

template <class T>
std::ostream& operator<<(std::ostream& os, const GeInterval<T>& i) { i.dump(os); return os; }

}  // namespace Zr
