#pragma once
// The exact ceiling of a coordinate as an int, computed without rounding modes and without a
// branch. Scan conversion takes every row and column limit through it, so that a sample exactly
// on a limit is decided the same way in every triangle that shares that limit.
#include <bit>
#include <cstdint>
#include <type_traits>

namespace Zr {

namespace RsCeilDetail {
template <class T>
using Bits = std::conditional_t<sizeof(T) == 4, std::uint32_t, std::uint64_t>;
}  // namespace RsCeilDetail

// For a positive value, one unit in the last place is taken off (the bits minus one, which is the
// next value towards zero), the result truncated and 1 added: an integer maps to itself and any
// fraction above it to the next integer. A value not greater than zero is only truncated, which
// rounds it towards zero, that is up. The result is exact while the unit in the last place is at
// most 1, i.e. up to 2^24 in float and over the whole range of int in double; coordinates of
// pixels and sub-pixels stay far below that. The value must lie within the range of int.
template <class T>
inline int rsCeil(T value) {
    static_assert(std::is_same_v<T, float> || std::is_same_v<T, double>,
                  "rsCeil works on float and double");
    using Bits = RsCeilDetail::Bits<T>;
    const Bits positive = static_cast<Bits>(value > T(0));
    // For a positive value this adds the all-ones mask, i.e. subtracts 1 from the bits; a value
    // not above zero keeps its bits, so no NaN is ever formed.
    const T below = std::bit_cast<T>(std::bit_cast<Bits>(value) + (Bits(0) - positive));
    return static_cast<int>(below) + static_cast<int>(positive);
}

}  // namespace Zr
