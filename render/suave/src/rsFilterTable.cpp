#include "rsFilterTable.h"

#include <algorithm>

#include "rsAFragment.h"
#include "rsTolerance.h"

namespace Zr {

float RsFilterTable::normalisingSum(float positive, float negative) {
    if (!(negative > 0.0f)) return positive;
    const float ratio = std::max(1.0f, positive / negative);
    if (ratio > 3.0f) return positive - negative;
    return positive - negative * (1.0f - (3.0f - ratio) * 0.3f);
}

RsFilterTable::RsFilterTable(const RsFilterKernel& kernel)
    : _support(kernel.getKernelSupport()), _kernelSize(2 * _support + 1), _tapCount(_kernelSize * _kernelSize) {
    constexpr int kSamples = RsAFragment::kSamples;
    const int n = _kernelSize;
    _sampleWeights.assign(std::size_t(_tapCount) * kSamples, 0.0f);
    float positive = 0.0f;
    float negative = 0.0f;
    for (int j = 0; j < n; ++j) {
        for (int i = 0; i < n; ++i) {
            // A sample i - support columns right of the output pixel serves the output pixel
            // support - i columns right of the sample: tap column n - 1 - i.
            const int t = (n - 1 - j) * n + (n - 1 - i);
            const float x0 = static_cast<float>(i - _support) + 0.03125f;
            const float y0 = static_cast<float>(j - _support) + 0.03125f;
            for (int s = 0; s < kSamples; ++s) {
                const float w = kernel.evaluateKernel(static_cast<float>(RsAFragment::kSamplePattern[s]) * 0.0625f + x0,
                                                      static_cast<float>(s) * 0.0625f + y0);
                _sampleWeights[std::size_t(t) * kSamples + s] = w;
                if (w >= 0.0f) positive += w;
                else negative -= w;
            }
        }
    }
    const float sum = normalisingSum(positive, negative);
    const float norm = RsTolerance::isZero(sum) ? 1.0f : 1.0f / sum;
    for (float& w : _sampleWeights) w *= norm;

    _lowWeights.reserve(std::size_t(256) * _tapCount);
    _highWeights.reserve(std::size_t(256) * _tapCount);
    for (unsigned int m = 0; m < 256; ++m) {
        for (int t = 0; t < _tapCount; ++t) {
            const float* weights = &_sampleWeights[std::size_t(t) * kSamples];
            float low = 0.0f;
            float high = 0.0f;
            for (int b = 0; b < kSamples; ++b) {
                low += ((m >> b) & 1u) != 0 ? weights[b] : 0.0f;
                high += (((m << 8) >> b) & 1u) != 0 ? weights[b] : 0.0f;
            }
            _lowWeights.push_back(low);
            _highWeights.push_back(high);
        }
    }
}

}  // namespace Zr
