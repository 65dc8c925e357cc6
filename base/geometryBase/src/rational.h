#pragma once
// A ratio of two 32-bit integers, such as a frame rate or a pixel aspect ratio. It is kept as
// given, not reduced.
#include <cstdint>
#include <ostream>

namespace Zr {

struct Rational {
    std::int32_t numerator = 0;
    std::int32_t denominator = 1;

    constexpr Rational() = default;
    constexpr Rational(std::int32_t numerator_, std::int32_t denominator_ = 1)
        : numerator(numerator_), denominator(denominator_) {}

    // The value as a float; a denominator of 0 gives an infinity or NaN, as float division does.
    constexpr float getFloat() const { return static_cast<float>(numerator) / static_cast<float>(denominator); }
    constexpr double getDouble() const {
        return static_cast<double>(numerator) / static_cast<double>(denominator);
    }

    // Equal values, whatever the representation: 1/2 equals 2/4.
    constexpr bool operator==(const Rational& o) const {
        return static_cast<std::int64_t>(numerator) * o.denominator ==
               static_cast<std::int64_t>(o.numerator) * denominator;
    }
    constexpr bool operator!=(const Rational& o) const { return !(*this == o); }

    void dump(std::ostream& os) const { os << " numerator: " << numerator << " denominator: " << denominator; }
};

inline std::ostream& operator<<(std::ostream& os, const Rational& r) { r.dump(os); return os; }

}  // namespace Zr
