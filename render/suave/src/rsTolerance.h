#pragma once
// The float tolerance with which the fragment buffers, the image creators and the transfer
// functions compare a value with a constant: whether an alpha counts as one (an opaque fragment),
// whether a weight counts as one (no scaling), whether an alpha counts as zero (nothing to add, a
// destination to take as black).
//
// The tolerance is the float epsilon times the larger magnitude of the two, where an infinite
// magnitude counts as 0, so that an infinity never equals a finite constant. The comparison is
// written from the side of the larger value, as e + smaller >= larger, so that it holds in float
// arithmetic exactly where the rounded sum reaches the larger value. Against 0 only a signed zero
// passes; against 1 the values within one ulp-scale step on either side do.
#include <bit>
#include <cmath>
#include <cstdint>

namespace Zr {

class RsTolerance {
public:
    // The float epsilon, 1.1920929e-7 (bits 0x34000000).
    static constexpr float kEpsilon = std::bit_cast<float>(std::uint32_t{0x34000000});

    // v equals the constant c within the relative tolerance.
    static bool isEqual(float v, float c) {
        const float av = std::fabs(v);
        const float ac = std::fabs(c);
        float m = av > ac ? av : ac;
        if (std::isinf(m)) m = 0.0f;
        const float e = m * kEpsilon;
        if (v > c) return e + c >= v;
        return e + v >= c;
    }

    // An alpha that makes a fragment of an opaque-capable mode hide all behind it. An alpha clearly
    // above 1 is not opaque.
    static bool isOne(float alpha) { return isEqual(alpha, 1.0f); }
    // In effect: an alpha of exactly +0 or -0.
    static bool isZero(float alpha) { return isEqual(alpha, 0.0f); }

    RsTolerance() = delete;
};

}  // namespace Zr
