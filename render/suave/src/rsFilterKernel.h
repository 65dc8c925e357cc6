#pragma once
// The reconstruction filter of the anti-aliased path: a small value that names one of ten
// kernels and answers how far the kernel reaches and what weight it gives a point. The weights
// are not normalised; whoever samples the kernel into a table normalises the sum.
#include <iosfwd>

namespace Zr {

class RsFilterKernel {
public:
    // The numbering is part of the interface: hosts store and pass these values.
    enum KernelType : int {
        KernelBox = 0,
        KernelCone = 1,
        KernelBell = 2,
        KernelQuadraticBSpline = 3,
        KernelGaussian = 4,
        KernelPow2Narrow = 5,
        KernelPow2Wide = 6,
        KernelCubicBSpline = 7,
        KernelTruncatedGaussian = 8,
        KernelParabolicPair = 9
    };
    static constexpr int nbKernelTypes = 10;

    // Reach of each kernel, in whole pixels on each side of the centre pixel. The narrow
    // power-of-two kernel gets the wider window and the wide one the narrower window on purpose:
    // images made so far depend on it.
    static const int kernelSupport[nbKernelTypes];
    // 1 when the kernel depends only on the distance from the pixel's centre, 0 for the box.
    static const int kernelIsRadial[nbKernelTypes];

    // Constants of the bell and Gaussian kernels, as single-precision values whose exact bits
    // matter (the bell's two pieces meet at bellKnee only with these values).
    static constexpr float bellRadius = 1.377f;
    static constexpr float bellKnee = 0.4848f;
    static constexpr float bellOuterDivisor = 1.2285594f;
    static constexpr float bellInnerSlope = 1.4979712f;
    static constexpr float gaussianScale = 0.7978846f;  // sqrt(2 / pi) as a float

    RsFilterKernel() = default;
    // A kernel type is a complete description of a kernel, so it converts implicitly.
    RsFilterKernel(KernelType type) : _kernelType(type) {}

    void setKernelType(KernelType type) { _kernelType = type; }
    KernelType getKernelType() const { return _kernelType; }

    // Pixels on each side of the centre pixel that the kernel reaches; 0 for a type outside
    // the ten known ones.
    int getKernelSupport() const;

    // The weight at (x, y), measured from the corner of the pixel, so that the pixel's centre
    // is (0.5, 0.5). Points of neighbour pixels have coordinates below 0 or from 1 upward.
    // A type outside the ten known ones weighs everything 0.
    float evaluateKernel(float x, float y) const;

    void dump(std::ostream& os) const;

private:
    static bool isKnownType(KernelType type) { return type >= 0 && type < nbKernelTypes; }

    KernelType _kernelType = KernelBox;
};

}  // namespace Zr
