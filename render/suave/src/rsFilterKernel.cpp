#include "rsFilterKernel.h"

#include <bit>
#include <cmath>
#include <cstdint>
#include <ostream>
#include <type_traits>

namespace Zr {

// The bell's pieces and the Gaussian's scale are tuned to these exact single-precision values;
// a change of one bit shows in the resolved images.
static_assert(std::bit_cast<std::uint32_t>(RsFilterKernel::bellRadius) == 0x3fb04189u);
static_assert(std::bit_cast<std::uint32_t>(RsFilterKernel::bellKnee) == 0x3ef837b5u);
static_assert(std::bit_cast<std::uint32_t>(RsFilterKernel::bellOuterDivisor) == 0x3f9d416fu);
static_assert(std::bit_cast<std::uint32_t>(RsFilterKernel::bellInnerSlope) == 0x3fbfbd85u);
static_assert(std::bit_cast<std::uint32_t>(RsFilterKernel::gaussianScale) == 0x3f4c422au);
static_assert(std::is_trivially_copyable_v<RsFilterKernel>);

const int RsFilterKernel::kernelSupport[nbKernelTypes] = {0, 1, 1, 1, 1, 1, 2, 2, 2, 2};
const int RsFilterKernel::kernelIsRadial[nbKernelTypes] = {0, 1, 1, 1, 1, 1, 1, 1, 1, 1};

int RsFilterKernel::getKernelSupport() const {
    return isKnownType(_kernelType) ? kernelSupport[_kernelType] : 0;
}

float RsFilterKernel::evaluateKernel(float x, float y) const {
    if (!isKnownType(_kernelType)) return 0.0f;

    // Everything below stays in single precision: the weight tables are built from these
    // values and must come out the same on every build.
    float r = 0.0f;
    if (kernelIsRadial[_kernelType] != 0) {
        const float dx = x - 0.5f;
        const float dy = y - 0.5f;
        r = std::sqrt(dx * dx + dy * dy);
    }
    const float r2 = r * r;

    switch (_kernelType) {
    case KernelBox:
        // Only the upper edges cut: samples of the neighbours below and to the left count fully.
        if (x >= 1.0f || y >= 1.0f) return 0.0f;
        return 1.0f;
    case KernelCone:
        return 1.0f > r ? 1.0f - r : 0.0f;
    case KernelBell: {
        if (r >= bellRadius) return 0.0f;
        if (r > bellKnee) {
            const float d = bellRadius - r;
            return d * d / bellOuterDivisor;
        }
        return 1.0f - bellInnerSlope * r2;
    }
    case KernelQuadraticBSpline: {
        if (0.5f > r) return 0.75f - r2;
        if (1.5f > r) {
            const float d = r - 1.5f;
            return 0.5f * (d * d);
        }
        return 0.0f;
    }
    case KernelGaussian:
        return gaussianScale * std::exp(-2.0f * r2);
    case KernelPow2Narrow:
        return std::pow(2.0f, -2.0f * r2);
    case KernelPow2Wide:
        return std::pow(2.0f, -4.0f * r2);
    case KernelCubicBSpline: {
        if (1.0f > r) return (r2 * (3.0f * r - 6.0f) + 4.0f) / 6.0f;
        if (2.0f > r) {
            const float d = 2.0f - r;
            return d * d * d / 6.0f;
        }
        return 0.0f;
    }
    case KernelTruncatedGaussian:
        // The offset is recomputed each time rather than cached, so that it rounds exactly as
        // the first term does at the cut-off radius and the weight reaches 0 there.
        if (r > 1.5f) return 0.0f;
        return std::exp(-r2) - std::exp(-2.25f);
    case KernelParabolicPair:
        if (r >= 2.0f) return 0.0f;
        if (1.0f > r) return 3.0f - 1.5f * r2;
        return r * (1.5f * r - 6.0f) + 6.0f;
    }
    return 0.0f;
}

void RsFilterKernel::dump(std::ostream& os) const {
    os << " _kernelType: " << static_cast<int>(_kernelType);
}

}  // namespace Zr
