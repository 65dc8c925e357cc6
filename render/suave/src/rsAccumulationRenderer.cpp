#include "rsAccumulationRenderer.h"

#include <algorithm>

#include "assertions.h"
#include "coRgbaColorTyped.h"
#include "ipFormatChange.h"
#include "ixReadGuard.h"
#include "ixScanline.h"
#include "ixScanlineUtil.h"
#include "ixTile.h"
#include "rnHistogramRng.h"
#include "rnNumRecUniformRng.h"
#include "rnSeparableBiRng.h"
#include "rnUniformHistogram.h"
#include "sdCamera.h"

namespace Zr {

namespace {

// The shutter's weighting in histogram form: 48 bins over one frame, filled at 480 evenly spaced
// points.
constexpr int kShutterBins = 48;
constexpr int kShutterPoints = 480;
// The smallest density a sample's weight is divided by.
constexpr float kMinPdf = 1.1920929e-07f;

constexpr const char* kSourceFile = "render\\suave\\src\\rsAccumulationRenderer";

}  // namespace

RsAccumulationRenderer::RsAccumulationRenderer() = default;

RsAccumulationRenderer::~RsAccumulationRenderer() = default;

bool RsAccumulationRenderer::beginFrame(const GeRectangle<int>& region, const IxWriteGuard& output) {
    _region = region;
    const IxPixelFormat& format = output._pixelFormat;
    if (format._depth == IxPixelFormat::FLOAT32 && format._comps != IxPixelFormat::RGB) {
        // Float channels with alpha add up in place.
        _accumulationGuard = output;
        _outputGuard = WriteGuardNoCheck();
    } else {
        _outputGuard = output;
        const IxPixelFormat::Comps comps =
            format._comps == IxPixelFormat::ALPHA ? IxPixelFormat::ALPHA : IxPixelFormat::RGBA;
        const IxTile target(IxPixelFormat(comps, IxPixelFormat::FLOAT32, format._aspectRatio), output._rectangle,
                            CoRgbaColorTyped<float>(0.0f, 0.0f, 0.0f, 0.0f));
        _accumulationGuard = WriteGuardNoCheck(target);
    }
    generateTimeSamples();
    generateLensSamples();
    _jointNormalisation = 1.0f;
    if (_motionBlurEnabled && _depthOfFieldEnabled) {
        float sum = 0.0f;
        for (std::size_t i = 0; i < _timeSamples.size() && i < _lensWeights.size(); ++i)
            sum += _timeSamples[i].second * _lensWeights[i];
        if (sum > 0.0f) _jointNormalisation = 1.0f / sum;
    }
    _currentFrame = 0;
    return true;
}

void RsAccumulationRenderer::generateTimeSamples() {
    _timeSamples.clear();
    if (!_motionBlurEnabled) return;
    const unsigned int n = _nbSamples;
    if (!_importanceSampled) {
        // The centres of n equal strata of the frame, ascending.
        const float step = 1.0f / static_cast<float>(n);
        float t = step * 0.5f;
        for (unsigned int i = 0; i < n; ++i) {
            _timeSamples.emplace_back(t - 0.5f, 1.0f);
            t += step;
        }
    } else {
        RnUniformHistogram<float> shutter(kShutterBins, 0.0f, 1.0f);
        const float spacing = 1.0f / kShutterPoints;
        float x = 1.0f / (2 * kShutterPoints);
        for (int i = 0; i < kShutterPoints; ++i, x += spacing) {
            const int bin = shutter.findBin(x);
            if (bin >= 0 && bin < shutter.getNbBins()) {
                shutter[bin] += 1.0f;
                shutter.setTotal(shutter.getTotal() + 1.0f);
            }
        }
        RnNumRecUniformRng<float> uniform;
        RnHistogramRng<float> draw(shutter, &uniform);
        for (unsigned int i = 0; i < n; ++i) {
            const float t = draw();
            _timeSamples.emplace_back(t - 0.5f, 1.0f / std::max(draw.getPdf(t), kMinPdf));
        }
        std::sort(_timeSamples.begin(), _timeSamples.end(),
                  [](const auto& a, const auto& b) { return a.first < b.first; });
    }
    float sum = 0.0f;
    for (const auto& sample : _timeSamples) sum += sample.second;
    if (sum > 0.0f) {
        const float scale = 1.0f / sum;
        for (auto& sample : _timeSamples) sample.second *= scale;
    }
}

void RsAccumulationRenderer::generateLensSamples() {
    _lensWeights.clear();
    _lensOffsets.clear();
    if (!_depthOfFieldEnabled) return;
    const unsigned int n = _nbSamples;
    RnNumRecUniformRng<float> uniform;
    RnSeparableBiRng<float> pairs(&uniform);
    for (unsigned int i = 0; i < n; ++i) {
        float a = 0.0f, b = 0.0f;
        pairs.getSample(a, b);
        _lensOffsets.emplace_back((a - 0.5f) * _depthOfFieldSoftness, (b - 0.5f) * _depthOfFieldSoftness);
        _lensWeights.push_back(1.0f / static_cast<float>(n));
    }
}

float RsAccumulationRenderer::getPassWeight() const {
    const bool timed = hasTimeSample(), lensed = hasLensSample();
    if (timed && lensed)
        return _jointNormalisation * _timeSamples[_currentFrame].second * _lensWeights[_currentFrame];
    if (timed) return _timeSamples[_currentFrame].second;
    if (lensed) return _lensWeights[_currentFrame];
    return 1.0f;
}

std::pair<float, float> RsAccumulationRenderer::getLensOffset() const {
    return hasLensSample() ? _lensOffsets[_currentFrame] : std::pair<float, float>(0.0f, 0.0f);
}

float RsAccumulationRenderer::getPassTime() const { return hasTimeSample() ? _timeSamples[_currentFrame].first : 0.0f; }

void RsAccumulationRenderer::renderFrame(const RCShdPtr<SdInstance>& camera, const RCShdPtr<RsScene>& scene) {
    const std::pair<float, float> lens = getLensOffset();
    // Passes add up in the target that beginFrame chose.
    ZR_ASSERT_AT(_accumulationGuard.holdsTile(), kSourceFile, __LINE__);
    const SdInstance& instance = *camera;
    const SdCamera* sdCamera = dynamic_cast<const SdCamera*>(instance.getObject().get());
    if (sdCamera == nullptr) return;
    GeAffineMatrix3<float> worldToCamera = instance.getMatrix().computeInverse();
    GeProjectiveMatrix3<double> projection;
    sdCamera->computeProjection(projection, lens);
    // The view moves by the lens offset; the projection shears it back on the focal plane.
    GeVector3<float> translation = worldToCamera.getTranslation();
    translation.x -= lens.first;
    translation.y -= lens.second;
    worldToCamera.setTranslation(translation);

    renderCommon(scene, worldToCamera, projection, _currentFrame != 0, getPassWeight(), _region, _accumulationGuard,
                 false);
    if (_currentFrame + 1 >= _nbSamples) finishFrame();
}

void RsAccumulationRenderer::finishFrame() {
    if (_accumulationGuard._pixelFormat._comps != IxPixelFormat::ALPHA) {
        const GeRectangle<int>& r = _accumulationGuard._rectangle;
        for (int y = r.y0; y < r.y1; ++y) {
            IxScanline<CoRgbaColorTyped<float>> row(_accumulationGuard, y);
            IxScanlineUtil::divideByAlpha(row, nullptr);
        }
    }
    if (_outputGuard.holdsTile()) ipFormatChange(_outputGuard, IxReadGuard(_accumulationGuard), nullptr);
}

bool RsAccumulationRenderer::nextFrame() {
    ++_currentFrame;
    if (!_motionBlurEnabled && !_depthOfFieldEnabled) return false;
    return _currentFrame < _nbSamples;
}

double RsAccumulationRenderer::getSampleOffsetTime(const Rational& rate) const {
    if (!_motionBlurEnabled) return 0.0;
    const float t = getPassTime() * _globalFilterWidth;
    return static_cast<double>(t) * (static_cast<double>(rate.denominator) / static_cast<double>(rate.numerator));
}

void RsAccumulationRenderer::dump(std::ostream& os) const {
    RsRenderer::dump(os);
    os << " _nbSamples: " << _nbSamples << " _motionBlurEnabled: " << _motionBlurEnabled
       << " _importanceSampled: " << _importanceSampled << " _globalFilterWidth: " << _globalFilterWidth
       << " _depthOfFieldEnabled: " << _depthOfFieldEnabled << " _depthOfFieldSoftness: " << _depthOfFieldSoftness
       << " _timeSamples:";
    for (const auto& s : _timeSamples) os << " (" << s.first << ", " << s.second << ")";
    os << " _lensWeights:";
    for (float w : _lensWeights) os << " " << w;
    os << " _lensOffsets:";
    for (const auto& o : _lensOffsets) os << " (" << o.first << ", " << o.second << ")";
    os << " _currentFrame: " << _currentFrame << " _accumulationGuard:";
    _accumulationGuard.dump(os);
    os << " _outputGuard:";
    _outputGuard.dump(os);
    os << " _region: " << _region.x0 << " " << _region.x1 << " " << _region.y0 << " " << _region.y1
       << " _jointNormalisation: " << _jointNormalisation;
}

}  // namespace Zr
