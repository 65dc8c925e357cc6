// Pictures rendered as tiles on several threads: the same bytes on any number of threads, and a
// render cancelled from the interrupt handler at any scanline ends cleanly on every thread.
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <random>
#include <vector>

#include "exRenderCancelled.h"
#include "pxRequestMgr.h"
#include "zrSampleScene.h"
#include "zrTileRenderer.h"

namespace Zr {
namespace {

ZrTileRenderer::MomentMaker sampleScene(int width, int height) {
    return [=](double seconds) {
        return ZrTileRenderer::momentOf(ZrSampleScene::makeDescription({}, seconds),
                                        ZrSampleScene::makeCamera(width, height));
    };
}

std::vector<float> pixelsOf(const OIIO::ImageBuf& picture) {
    std::vector<float> values(static_cast<std::size_t>(picture.spec().image_pixels()) * 4);
    EXPECT_TRUE(picture.get_pixels(picture.roi(), OIIO::TypeDesc::FLOAT, values.data()));
    return values;
}

TEST(ZrTileRenderer, AnyNumberOfThreadsGivesTheSameBytes) {
    constexpr int width = 150, height = 110;
    ZrAccumulationSettings blurred;
    blurred.motionBlur = true;
    blurred.samples = 3;
    for (const bool floatPixels : {false, true}) {
        for (const ZrAccumulationSettings& accumulation : {ZrAccumulationSettings{}, blurred}) {
            ZrRenderSettings settings;
            settings.floatPixels = floatPixels;
            settings.tileSize = 32;  // tiles of every shape: whole, cut at the right, at the top, both
            settings.fill = {0.2f, 0.3f, 0.4f, 0.5f};
            settings.threads = 1;
            const auto render = [&] {
                return pixelsOf(ZrTileRenderer::render(sampleScene(width, height), 0.4, width, height, settings,
                                                       accumulation));
            };
            const std::vector<float> one = render();
            settings.threads = 3;
            const std::vector<float> three = render();
            ASSERT_EQ(one.size(), three.size());
            EXPECT_EQ(0, std::memcmp(one.data(), three.data(), one.size() * sizeof(float))) << floatPixels;
            // Float pixels are premultiplied: the fill's colour comes out times its alpha. The top
            // left corner is background in the sample scene.
            if (floatPixels && !accumulation.any()) {
                EXPECT_FLOAT_EQ(one[0], 0.2f * 0.5f);
            }
            // Tiles after a thread's first hold the shadow maps that tile rendered: the picture is
            // that of one tile rendering everything, but for the rounding of a few pixels.
            settings.tileSize = 4096;
            const std::vector<float> whole = render();
            int differing = 0;
            for (std::size_t i = 0; i < one.size(); ++i) differing += std::abs(one[i] - whole[i]) > 1.5f / 255;
            EXPECT_EQ(0, differing) << floatPixels << accumulation.any();
        }
    }
}

// Lets a number of interrupt checks pass, then cancels every check after them.
class CancelAfter : public PxInterruptHandler {
public:
    explicit CancelAfter(int checks) : _left(checks) {}
    void onInterruptCheck() override {
        if (--_left < 0) throw ExRenderCancelled();
    }
    int left() const { return _left; }

private:
    std::atomic<int> _left;
};

TEST(ZrTileRenderer, ACancelAtAnyScanlineEndsEveryThread) {
    std::mt19937 random(2026);
    ZrRenderSettings settings;
    settings.tileSize = 40;
    constexpr int plenty = 1 << 30;
    const RCShdPtr<CancelAfter> counter = makeShared<CancelAfter>(plenty);
    PxRequestMgr::getInstance()->setInterruptHandler(counter);
    ZrTileRenderer::render(sampleScene(200, 150), 0.0, 200, 150, settings);
    const int checks = plenty - counter->left();
    ASSERT_GT(checks, 100);
    for (int trial = 0; trial < 6; ++trial) {
        settings.threads = 1 + trial % 2;
        PxRequestMgr::getInstance()->setInterruptHandler(
            makeShared<CancelAfter>(std::uniform_int_distribution<int>(0, checks - 1)(random)));
        EXPECT_THROW(ZrTileRenderer::render(sampleScene(200, 150), 0.0, 200, 150, settings), ExRenderCancelled);
    }
    PxRequestMgr::getInstance()->setInterruptHandler({});
    // The renderer is usable again once the handler lets the work go on.
    EXPECT_NO_THROW(ZrTileRenderer::render(sampleScene(40, 30), 0.0, 40, 30, settings));
}

}  // namespace
}  // namespace Zr
