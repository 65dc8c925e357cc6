#pragma once
// A filter kernel sampled for the A-buffer's resolve: the normalised weight that each of the 16
// samples of a pixel gives to each output pixel within the kernel's reach, and two tables that make
// the weight of any group of samples one addition.
//
// A tap t = row * n + col (n = 2 * support + 1 taps across) stands for the output pixel at offset
// (col - support, row - support) from the pixel that holds the sample. The kernel is evaluated from
// the output pixel's point of view, at the sample's position relative to that pixel's corner, so
// the tap order runs against the offset of the sample.
//
// The weights are scaled so that they sum to one; a kernel with negative lobes is scaled by a sum
// that takes part of its negative weight off its positive weight, the more the smaller the
// positive share is, and all of it once the positive weight is more than three times the negative.
#include <cstdint>
#include <vector>

#include "rsFilterKernel.h"

namespace Zr {

class RsFilterTable {
public:
    explicit RsFilterTable(const RsFilterKernel& kernel);

    // The sum that the weights are divided by, given the sums of the positive weights and of the
    // magnitudes of the negative ones.
    static float normalisingSum(float positive, float negative);

    int getSupport() const { return _support; }
    int getKernelSize() const { return _kernelSize; }
    int getTapCount() const { return _tapCount; }
    // The normalised weight of sample s for tap t.
    float getSampleWeight(int t, int s) const { return _sampleWeights[std::size_t(t) * 16 + s]; }
    // Per tap, the summed weights of the samples 0 to 7 set in mask byte m, and of the samples 8 to
    // 15 set in mask byte m (bit b standing for sample 8 + b).
    const float* getLowWeights(unsigned int m) const { return _lowWeights.data() + std::size_t(m) * _tapCount; }
    const float* getHighWeights(unsigned int m) const { return _highWeights.data() + std::size_t(m) * _tapCount; }

private:
    int _support;
    int _kernelSize;
    int _tapCount;
    std::vector<float> _sampleWeights;
    std::vector<float> _lowWeights;
    std::vector<float> _highWeights;
};

}  // namespace Zr
