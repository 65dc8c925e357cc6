#pragma once
// Motion blur and depth of field as a weighted sum of whole renders. The host drives the passes:
//
//   renderer->beginFrame(rectangle, output);
//   do {
//       const double offset = renderer->getSampleOffsetTime(frameRate);  // seconds from the frame
//       ... move the scene to the frame's time plus offset, rebuild the RsScene if need be ...
//       renderer->renderFrame(cameraInstance, scene);
//   } while (renderer->nextFrame());
//
// Each pass is an ordinary render of the picture, seen from a point of the lens and at a time of
// the shutter, premultiplied and scaled by the pass's weight, the first replacing and the others
// adding to the accumulation target: the output itself when it holds float channels with alpha,
// else a float tile (alpha only for an alpha output, RGBA otherwise) of the output's rectangle.
// The weights of a frame add up to 1. After the last pass the target is divided by alpha (unless
// it holds alpha only) and converted into the output when it is not the output.
//
// Without either effect nextFrame stops after one pass, but that pass only finishes the picture
// when the number of samples is 1: with more, the picture stays undivided in the target, and an
// output of another format is not written. A host that wants a plain picture sets one sample.
#include <ostream>
#include <utility>
#include <vector>

#include "geRectangle.h"
#include "ixTileManip.h"
#include "ixWriteGuard.h"
#include "rational.h"
#include "rsRenderer.h"

namespace Zr {

class RsAccumulationRenderer : public RsRenderer {
public:
    RsAccumulationRenderer();
    ~RsAccumulationRenderer() override;

    // The number of passes of a frame; read at once by renderFrame and nextFrame, the other
    // settings at the next beginFrame.
    unsigned int getNbSamples() const { return _nbSamples; }
    void setNbSamples(unsigned int nbSamples) { _nbSamples = nbSamples; }
    bool isMotionBlurEnabled() const { return _motionBlurEnabled; }
    void setMotionBlurEnabled(bool enabled) { _motionBlurEnabled = enabled; }
    // Time samples drawn from the shutter's weighting (flat) rather than at the centres of equal
    // strata of it.
    bool isImportanceSampled() const { return _importanceSampled; }
    void setImportanceSampled(bool importanceSampled) { _importanceSampled = importanceSampled; }
    // The shutter's length in frames: sample times run over -width / 2 to width / 2 frames.
    float getGlobalFilterWidth() const { return _globalFilterWidth; }
    void setGlobalFilterWidth(float width) { _globalFilterWidth = width; }
    bool isDepthOfFieldEnabled() const { return _depthOfFieldEnabled; }
    void setDepthOfFieldEnabled(bool enabled) { _depthOfFieldEnabled = enabled; }
    // The side of the square of lens offsets, in camera-space units (the aperture).
    float getDepthOfFieldSoftness() const { return _depthOfFieldSoftness; }
    void setDepthOfFieldSoftness(float softness) { _depthOfFieldSoftness = softness; }
    unsigned int getCurrentFrame() const { return _currentFrame; }

    // Starts a frame of region into output: chooses the accumulation target and draws the time
    // and lens samples. Returns true.
    bool beginFrame(const GeRectangle<int>& region, const IxWriteGuard& output);
    // Draws the current pass through camera (an instance of an SdCamera; any other draws nothing)
    // and finishes the frame after the last one. A null camera raises the null-pointer failure.
    void renderFrame(const RCShdPtr<SdInstance>& camera, const RCShdPtr<RsScene>& scene);
    // Moves to the next pass; true while there is one to draw.
    bool nextFrame();
    // The current pass's time offset from the frame's time, in seconds, at rate frames a second;
    // 0 without motion blur.
    double getSampleOffsetTime(const Rational& rate) const;

    // The current pass's weight, lens offset and time offset (in frames, before the filter
    // width). A pass beyond the samples drawn (no samples, or more passes asked for in mid-frame)
    // is a plain one: weight 1, no offset.
    float getPassWeight() const;
    std::pair<float, float> getLensOffset() const;
    float getPassTime() const;

    void dump(std::ostream& os) const;

private:
    void generateTimeSamples();
    void generateLensSamples();
    // Divides the target by alpha and converts it into the output.
    void finishFrame();
    bool hasTimeSample() const { return _motionBlurEnabled && _currentFrame < _timeSamples.size(); }
    bool hasLensSample() const { return _depthOfFieldEnabled && _currentFrame < _lensOffsets.size(); }

    unsigned int _nbSamples = 4;
    bool _motionBlurEnabled = false;
    bool _importanceSampled = false;
    float _globalFilterWidth = 1.0f;
    bool _depthOfFieldEnabled = false;
    float _depthOfFieldSoftness = 1.0f;
    std::vector<std::pair<float, float>> _timeSamples;  // (time in -0.5..0.5 frames, weight)
    std::vector<float> _lensWeights;
    std::vector<std::pair<float, float>> _lensOffsets;
    unsigned int _currentFrame = 0;
    WriteGuardNoCheck _accumulationGuard;
    WriteGuardNoCheck _outputGuard;
    GeRectangle<int> _region{0, 0, 0, 0};
    float _jointNormalisation = 1.0f;
};

}  // namespace Zr
