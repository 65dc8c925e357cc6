#pragma once
// The scalar conversions between the channel types of tiles and float: half floats and bytes.
// Every reader and writer of pixels in the system goes through these, so that a tile written by
// one component reads back identically in another.
//
// The half conversions are bit recipes rather than IEEE round-to-nearest-even:
// - half to float maps exponent 31 like any other exponent, so half infinities and NaNs read as
//   large finite floats;
// - float to half rounds half-ulp up in magnitude, saturates everything too large (infinities and
//   NaNs included) at the largest finite half 0x7bff, and never flushes tiny magnitudes to zero:
//   its subnormal shift count is taken modulo 32.
// Output written with them therefore never holds a half infinity or NaN.
#include <bit>
#include <cstdint>

namespace Zr {

class IxPixelConvert {
public:
    // 1 / 255 as a float; its bits are 0x3b808081.
    static constexpr float BYTE_TO_FLOAT = 0.003921569f;
    // 2^-24, the unit of half subnormals.
    static constexpr float HALF_SUBNORMAL_UNIT = 5.9604645e-8f;

    static float halfToFloat(std::uint16_t h) {
        const std::uint32_t sign = static_cast<std::uint32_t>(h & 0x8000u) << 16;
        const std::uint32_t m = h & 0x7fffu;
        if ((m << 13) < 0x800000u) {
            // Subnormal half (or zero): exact as an integer multiple of 2^-24.
            const float magnitude = static_cast<float>(m) * HALF_SUBNORMAL_UNIT;
            return std::bit_cast<float>(std::bit_cast<std::uint32_t>(magnitude) | sign);
        }
        // Rebias the exponent from 15 to 127: (127 - 15) << 23 == 0x38000000.
        return std::bit_cast<float>(((m << 13) + 0x38000000u) | sign);
    }

    static std::uint16_t floatToHalf(float f) {
        const std::uint32_t b = std::bit_cast<std::uint32_t>(f);
        const std::uint32_t sign = (b >> 16) & 0x8000u;
        // Half of the ulp of a normal half, in float mantissa units: rounds the magnitude.
        const std::uint32_t mag = (b & 0x7fffffffu) + 0x1000u;
        std::uint32_t result;
        if (mag < 0x387fffffu) {
            // Below the smallest normal half: shift the mantissa with its implicit one into the
            // subnormal position. The count is masked to five bits on purpose; the second shift
            // by 13 drops the float-only mantissa bits.
            const std::uint32_t shift = (17u - (mag >> 23)) & 31u;
            result = (((mag & 0x7fffffu) | 0x800000u) >> shift) >> 13;
        } else {
            // 0x477fffff rebased is 0x7bff << 13 plus float-only bits: saturates at 0x7bff.
            const std::uint32_t clamped = mag < 0x477fffffu ? mag : 0x477fffffu;
            result = (clamped - 0x38000000u) >> 13;
        }
        return static_cast<std::uint16_t>(result | sign);
    }

    static float byteToFloat(std::uint8_t v) { return static_cast<float>(v) * BYTE_TO_FLOAT; }

    // Rounds v * 255 to the nearest byte, clamped to 0..255. NaN gives 0.
    // Written as two selections rather than branches, so that a row converts without jumps.
    static std::uint8_t floatToByte(float v) {
        const float scaled = v * 255.0f + 0.5f;
        const float low = scaled > 0.0f ? scaled : 0.0f;
        const float clamped = low < 255.0f ? low : 255.0f;
        return static_cast<std::uint8_t>(static_cast<int>(clamped));
    }
};

}  // namespace Zr
