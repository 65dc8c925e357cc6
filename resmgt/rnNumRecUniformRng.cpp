#include "rnNumRecUniformRng.h"

#include <cmath>
#include <limits>

namespace Zr {

template <class T>
RnNumRecUniformRng<T>::~RnNumRecUniformRng() = default;

template <class T>
std::uint64_t RnNumRecUniformRng<T>::nextBits() {
    // The increment is the odd number nearest 2^64 divided by the golden ratio, which spreads
    // successive counter values evenly over the whole range.
    _state += 0x9e3779b97f4a7c15ull;
    std::uint64_t z = _state;
    z = (z ^ (z >> 30)) * 0xbf58476d1ce4e5b9ull;
    z = (z ^ (z >> 27)) * 0x94d049bb133111ebull;
    return z ^ (z >> 31);
}

template <class T>
T RnNumRecUniformRng<T>::toUnitInterval(std::uint64_t bits) {
    constexpr int digits = std::numeric_limits<T>::digits;
    static_assert(digits <= 64, "the generator delivers 64 bits a value");
    // Keeping only as many bits as the mantissa holds makes the conversion exact; the largest
    // result is 1 - 2^-digits.
    return std::ldexp(static_cast<T>(bits >> (64 - digits)), -digits);
}

template <class T>
T RnNumRecUniformRng<T>::eval() {
    return toUnitInterval(nextBits());
}

template class RnNumRecUniformRng<float>;
template class RnNumRecUniformRng<double>;

}  // namespace Zr
