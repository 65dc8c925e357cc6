#pragma once
// The library's uniform generator. It always starts from the same internal seed, so every run
// of the program draws the same sequence: renders that use it (time and lens samples) are
// reproducible. Not for cryptographic use.
#include <cstdint>

#include "rnRng.h"

namespace Zr {

template <class T>
class RnNumRecUniformRng : public RnRng<T> {
public:
    RnNumRecUniformRng() = default;
    RnNumRecUniformRng(const RnNumRecUniformRng&) = default;
    RnNumRecUniformRng& operator=(const RnNumRecUniformRng&) = default;
    ~RnNumRecUniformRng() override;

    T eval() override;

    // The next 64 raw bits of the sequence; eval() consumes exactly one of these per value.
    std::uint64_t nextBits();

    // Maps 64 random bits to [0, 1): the top bits that fit T's mantissa, scaled by a power of
    // two, so that every result is exact, evenly spaced and strictly below 1.
    static T toUnitInterval(std::uint64_t bits);

private:
    // A Weyl sequence (a counter advanced by an odd constant, period 2^64) whose values go
    // through a mixing function of multiplies and xor-shifts; the mixing makes consecutive
    // outputs look independent even though the counter is plain.
    static constexpr std::uint64_t initialState = 0x2545f4914f6cdd1dull;
    std::uint64_t _state = initialState;
};

extern template class RnNumRecUniformRng<float>;
extern template class RnNumRecUniformRng<double>;

}  // namespace Zr
