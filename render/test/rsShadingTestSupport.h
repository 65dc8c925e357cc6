#pragma once
// Test doubles of the shading tests: a sampler of one fixed colour that records how it is used,
// and texture parameters that hand out such samplers.
#include <atomic>

#include "coRgbaColorTyped.h"
#include "geLinearMatrix2.h"
#include "gePoint2.h"
#include "oPtr.h"
#include "sdTextureParams.h"
#include "sdTextureSampler.h"

namespace Zr::shadingTest {

// Answers every lookup with one colour; counts lookups and tile releases and keeps the arguments
// of the last shader lookup. The counters live outside the sampler when given, so that a test can
// read them after the owner has destroyed the sampler.
class ConstantSampler : public SdTextureSampler {
public:
    explicit ConstantSampler(const CoRgbaColorTyped<float>& colour,
                             std::atomic<int>* releases = nullptr,
                             std::atomic<int>* destructions = nullptr)
        : _colour(colour), _releases(releases), _destructions(destructions) {}
    ~ConstantSampler() override {
        if (_destructions) ++*_destructions;
    }

    using SdTextureSampler::sample;
    CoRgbaColorTyped<float> sample(const GePoint2<double>&, double, double) const override {
        return _colour;
    }
    CoRgbaColorTyped<float> sample(int, int) const override { return _colour; }
    CoRgbaColorTyped<float> sample(const GePoint2<double>& texCoord,
                                   const GeLinearMatrix2<double>& derivatives) const override {
        ++_lookups;
        _lastTexCoord = texCoord;
        _lastDerivatives = derivatives;
        return _colour;
    }
    void lockTiles() const override {}
    void releaseTiles() const override {
        if (_releases) ++*_releases;
    }

    int getLookups() const { return _lookups; }
    const GePoint2<double>& getLastTexCoord() const { return _lastTexCoord; }
    const GeLinearMatrix2<double>& getLastDerivatives() const { return _lastDerivatives; }

private:
    CoRgbaColorTyped<float> _colour;
    std::atomic<int>* _releases;
    std::atomic<int>* _destructions;
    mutable int _lookups = 0;
    mutable GePoint2<double> _lastTexCoord;
    mutable GeLinearMatrix2<double> _lastDerivatives;
};

// A map whose samplers are ConstantSamplers of one colour; counts how many it made. With
// handOutNone it makes none and answers a null pointer, as a faulty host map might.
class ConstantParams : public SdTextureParams {
public:
    explicit ConstantParams(const CoRgbaColorTyped<float>& colour, float weight = 1.0f,
                            bool handOutNone = false)
        : _colour(colour), _handOutNone(handOutNone) {
        _weight = weight;
    }

    OPtr<SdTextureSampler> createSampler() const override {
        if (_handOutNone) return OPtr<SdTextureSampler>();
        ++_samplersMade;
        return makeOwned<ConstantSampler>(_colour, &_releases, &_destructions);
    }

    int getSamplersMade() const { return _samplersMade; }
    int getReleases() const { return _releases; }
    int getDestructions() const { return _destructions; }

private:
    CoRgbaColorTyped<float> _colour;
    bool _handOutNone;
    mutable std::atomic<int> _samplersMade{0};
    mutable std::atomic<int> _releases{0};
    mutable std::atomic<int> _destructions{0};
};

}  // namespace Zr::shadingTest
