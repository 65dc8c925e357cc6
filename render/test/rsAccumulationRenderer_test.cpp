// The accumulation renderer: a frame of a still scene equals the single render in every output
// format; the samples, weights and pass counts of the sampling modes; the finishing step and its
// asymmetry; depth of field that keeps the focal plane sharp and blurs with the distance from it.
#include <gtest/gtest.h>

#include <cmath>
#include <numeric>
#include <string>
#include <vector>

#include "rsAccumulationRenderer.h"
#include "rsTestSupport.h"
#include "sdCamera.h"

namespace Zr {
namespace {

using namespace RsTest;

// A rectangle [x0, x1] x [y0, y1] at depth z, facing the camera.
RCShdPtr<const SdMesh> quad(float x0, float x1, float y0, float y1, float z) {
    return makeMesh({{x0, y0, z}, {x1, y0, z}, {x1, y1, z}, {x0, y1, z}}, {0, 1, 2, 0, 2, 3});
}

// A camera at the origin looking down -z.
RCShdPtr<SdInstance> cameraAtOrigin(SdCamera::Projection kind, float aspect, float focalDistance = 10.0f) {
    RCShdPtr<SdCamera> camera = makeShared<SdCamera>();
    camera->_projection = kind;
    camera->_aspect = aspect;
    camera->_orthographicHeight = 20.0f;
    camera->_focalDistance = focalDistance;
    return makeShared<SdInstance>(camera);
}

struct Settings {
    const char* name;
    unsigned int samples;
    bool motionBlur, importance, depthOfField;
};

void configure(RsAccumulationRenderer& r, const Settings& s, float softness = 0.0f) {
    r.setNbSamples(s.samples);
    r.setMotionBlurEnabled(s.motionBlur);
    r.setImportanceSampled(s.importance);
    r.setDepthOfFieldEnabled(s.depthOfField);
    r.setDepthOfFieldSoftness(softness);
}

// The host's loop over the passes of one frame; returns the number of passes drawn.
int renderLoop(RsAccumulationRenderer& r, const RCShdPtr<SdInstance>& camera, const RCShdPtr<RsScene>& scene,
               const GeRectangle<int>& rect, const IxWriteGuard& output) {
    int passes = 0;
    r.beginFrame(rect, output);
    do {
        r.renderFrame(camera, scene);
        ++passes;
    } while (r.nextFrame());
    return passes;
}

// Overlapping half-transparent quads over a half-transparent fill: colour and alpha vary.
RCShdPtr<RsScene> stillScene() {
    return makeScene({drawn(quad(-3, 1, -2, 2, -5), MaterialSettings({0.9f, 0.2f, 0.1f, 0.5f})),
                      drawn(quad(-1, 3, -3, 1, -6), MaterialSettings({0.1f, 0.7f, 0.8f, 0.7f})),
                      drawn(quad(0, 2, 0, 3, -4), MaterialSettings({0.3f, 0.3f, 1.0f, 1.0f}))});
}

// Every pass of a still scene is the same picture and the weights add up to 1, so that the
// finished frame is the single render up to the output's rounding: for each output format, each
// sampling mode (a lens of no size keeps the view), and several numbers of passes.
TEST(RsAccumulationRenderer, FrameOfAStillSceneEqualsTheSingleRender) {
    const GeRectangle<int> rect{-4, 28, 3, 27};
    const RCShdPtr<RsScene> scene = stillScene();
    const RCShdPtr<SdInstance> camera = cameraAtOrigin(SdCamera::Projection::perspective, 32.0f / 24.0f);
    const Settings settings[] = {{"plain pass", 1, false, false, false},
                                 {"motion blur", 4, true, false, false},
                                 {"importance-sampled motion blur", 7, true, true, false},
                                 {"depth of field", 5, false, false, true},
                                 {"both", 3, true, false, true},
                                 {"both, importance sampled", 6, true, true, true}};
    for (const Format& format : allFormats())
        for (const Settings& s : settings) {
            const std::string where = std::string(s.name) + " into " + std::to_string(format.comps) + "x" +
                                      std::to_string(format.depth);
            RsRenderer single;
            RsAccumulationRenderer accumulated;
            for (RsRenderer* r : {&single, static_cast<RsRenderer*>(&accumulated)})
                r->setFillColor({0.2f, 0.4f, 0.6f, 0.6f});
            // The output starts with other pixels: the first pass must replace them.
            const IxWriteGuard want = makeTile(format, rect), got = makeTile(format, rect, {0.5f, 0.5f, 0.5f, 0.5f});
            single.render(camera, scene, rect, want);
            configure(accumulated, s);
            EXPECT_EQ(renderLoop(accumulated, camera, scene, rect, got), int(s.samples)) << where;
            const double tolerance = format.depth == 8 ? 1.01 / 255 : format.depth == 16 ? 2e-3 : 2e-6;
            for (int y = rect.y0; y < rect.y1; ++y)
                for (int x = rect.x0; x < rect.x1; ++x)
                    expectNearRgba(pixelColour(got, x, y), pixelColour(want, x, y), tolerance,
                                   where + " at " + std::to_string(x) + ", " + std::to_string(y));
            if (::testing::Test::HasFailure()) return;
        }
}

// What the loop sees per pass: time (through getSampleOffsetTime at one frame a second with the
// filter width 1), weight and lens offset.
struct Pass {
    double time;
    float weight;
    std::pair<float, float> lens;
};

std::vector<Pass> passesOf(RsAccumulationRenderer& r, float softness = 1.0f) {
    r.setDepthOfFieldSoftness(softness);
    const IxWriteGuard output = makeTile({4, 8}, {0, 1, 0, 1});
    std::vector<Pass> passes;
    r.beginFrame({0, 1, 0, 1}, output);
    do passes.push_back({r.getSampleOffsetTime(Rational(1, 1)), r.getPassWeight(), r.getLensOffset()});
    while (r.nextFrame() && passes.size() < 100);
    return passes;
}

TEST(RsAccumulationRenderer, SampleTimesWeightsAndPassCounts) {
    RsAccumulationRenderer r;
    // Uniform: the centres of four strata, equal weights.
    configure(r, {"", 4, true, false, false});
    std::vector<Pass> p = passesOf(r);
    ASSERT_EQ(p.size(), 4u);
    const double centres[] = {-0.375, -0.125, 0.125, 0.375};
    for (int i = 0; i < 4; ++i) {
        EXPECT_DOUBLE_EQ(p[i].time, centres[i]);
        EXPECT_FLOAT_EQ(p[i].weight, 0.25f);
        EXPECT_EQ(p[i].lens, std::make_pair(0.0f, 0.0f));
    }
    // The offset in seconds: time times the filter width over the rate.
    r.setGlobalFilterWidth(0.5f);
    r.beginFrame({0, 1, 0, 1}, makeTile({4, 8}, {0, 1, 0, 1}));
    EXPECT_DOUBLE_EQ(r.getSampleOffsetTime(Rational(24, 1)), -0.375 * 0.5 / 24);
    EXPECT_DOUBLE_EQ(r.getSampleOffsetTime(Rational(30000, 1001)), -0.375 * 0.5 * 1001 / 30000);
    r.setGlobalFilterWidth(1.0f);

    // Importance sampled from the flat shutter: distinct ascending times within the frame, equal
    // weights since the density is 1 everywhere.
    configure(r, {"", 9, true, true, false});
    p = passesOf(r);
    ASSERT_EQ(p.size(), 9u);
    for (int i = 0; i < 9; ++i) {
        EXPECT_TRUE(p[i].time >= -0.5 && p[i].time < 0.5) << p[i].time;
        if (i > 0) {
            EXPECT_LT(p[i - 1].time, p[i].time);
        }
        EXPECT_NEAR(p[i].weight, 1.0f / 9, 1e-6);
    }

    // Depth of field alone: 1 / N each, offsets spread over the square of the softness.
    configure(r, {"", 5, false, false, true});
    p = passesOf(r, 3.0f);
    ASSERT_EQ(p.size(), 5u);
    for (const Pass& pass : p) {
        EXPECT_EQ(pass.time, 0.0);
        EXPECT_FLOAT_EQ(pass.weight, 0.2f);
        EXPECT_TRUE(std::abs(pass.lens.first) <= 1.5f && std::abs(pass.lens.second) <= 1.5f);
    }
    EXPECT_NE(p[0].lens, p[1].lens);
    EXPECT_NE(p[0].lens.first, p[0].lens.second);

    // Both: the joint normalisation brings the products back to a sum of 1.
    configure(r, {"", 4, true, true, true});
    p = passesOf(r);
    ASSERT_EQ(p.size(), 4u);
    float sum = 0.0f;
    for (const Pass& pass : p) sum += pass.weight;
    EXPECT_NEAR(sum, 1.0f, 1e-6);
    EXPECT_NE(p[0].lens, std::make_pair(0.0f, 0.0f));

    // No samples with an effect on, or no effect with several samples: one plain pass.
    for (const Settings& s : {Settings{"", 0, true, false, false}, Settings{"", 3, false, false, false}}) {
        configure(r, s);
        p = passesOf(r);
        ASSERT_EQ(p.size(), 1u);
        EXPECT_EQ(p[0].time, 0.0);
        EXPECT_EQ(p[0].weight, 1.0f);
    }
}

// Without an effect the one pass only finishes the frame when one sample is set: with four, a
// float RGBA output keeps the premultiplied sum and an 8-bit output is not written at all.
TEST(RsAccumulationRenderer, OnePassOfSeveralSamplesLeavesTheFrameUnfinished) {
    const GeRectangle<int> rect{0, 8, 0, 8};
    const RCShdPtr<RsScene> scene =
        makeScene({drawn(quad(-9, 9, -9, 9, -5), MaterialSettings({1.0f, 0.5f, 0.0f, 0.5f}))});
    const RCShdPtr<SdInstance> camera = cameraAtOrigin(SdCamera::Projection::perspective, 1.0f);
    RsAccumulationRenderer r;
    const IxWriteGuard floats = makeTile({4, 32}, rect), bytes = makeTile({4, 8}, rect, {0.1f, 0.2f, 0.3f, 0.4f});
    const std::vector<unsigned char> before = snapshot(bytes);
    EXPECT_EQ(renderLoop(r, camera, scene, rect, floats), 1);
    expectNearRgba(pixelColour(floats, 3, 3), {0.5f, 0.25f, 0.0f, 0.5f}, 1e-6, "float output");
    renderLoop(r, camera, scene, rect, bytes);
    EXPECT_TRUE(snapshot(bytes) == before);
}

// An edge seen through a lens of the given softness at distance z: the number of pixels of the
// middle row that are neither empty nor full.
int blurredPixels(float z, float softness) {
    const GeRectangle<int> rect{0, 64, 0, 16};
    // 4 pixels a unit across; the edge at x = 0.3 lies between pixel centres.
    const RCShdPtr<RsScene> scene = makeScene({drawn(quad(-100, 0.3f, -100, 100, z), MaterialSettings())});
    RsAccumulationRenderer r;
    configure(r, {"", 16, false, false, true}, softness);
    Picture picture(rect);
    renderLoop(r, cameraAtOrigin(SdCamera::Projection::orthographic, 64.0f / 80.0f), scene, rect, picture.guard);
    int blurred = 0;
    for (int x = rect.x0; x < rect.x1; ++x) {
        const float a = picture.at(x, 8).a;
        blurred += a > 1e-4f && a < 1.0f - 1e-4f;
    }
    return blurred;
}

// The focal plane (z = -10) stays sharp through any lens; the blur of an edge widens with its
// distance from that plane, in front of it and behind, and with the lens's size.
TEST(RsAccumulationRenderer, DepthOfFieldIsSharpOnTheFocalPlaneAndBlurGrowsAwayFromIt) {
    EXPECT_EQ(blurredPixels(-10.0f, 2.0f), 0);
    EXPECT_EQ(blurredPixels(-20.0f, 0.0f), 0);
    const int front = blurredPixels(-5.0f, 2.0f), near = blurredPixels(-15.0f, 2.0f);
    const int far = blurredPixels(-20.0f, 2.0f), farther = blurredPixels(-30.0f, 2.0f);
    EXPECT_GT(front, 1);
    EXPECT_GT(near, 1);
    EXPECT_LT(near, far);
    EXPECT_LT(far, farther);
    EXPECT_LT(blurredPixels(-20.0f, 1.0f), far);
}

}  // namespace
}  // namespace Zr
