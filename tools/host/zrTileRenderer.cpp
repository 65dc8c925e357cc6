#include "zrTileRenderer.h"

#include <algorithm>
#include <atomic>
#include <exception>
#include <functional>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

#include "ixReadGuard.h"
#include "ixTile.h"
#include "ixWriteGuard.h"
#include "rsAccumulationRenderer.h"
#include "rsRenderer.h"
#include "rsSceneBuilder.h"
#include "sdCamera.h"
#include "sdStdLight.h"
#include "zrPassImages.h"
#include "zrRenderProgress.h"

namespace Zr {

namespace {

// Copies a rendered tile into the picture: the renderer's rows count upwards, the picture's down;
// float colours are premultiplied on the way.
void copyTile(const IxTile& tile, int pictureHeight, bool floatPixels, OIIO::ImageBuf& picture) {
    const GeRectangle<int>& r = tile.getRectangle();
    const IxReadGuard guard(tile);
    std::vector<float> row(static_cast<std::size_t>(r.getWidth()) * 4);
    for (int y = r.y0; y < r.y1; ++y) {
        const OIIO::ROI roi(r.x0, r.x1, pictureHeight - 1 - y, pictureHeight - y, 0, 1, 0, 4);
        if (!floatPixels) {
            picture.set_pixels(roi, OIIO::TypeDesc::UINT8, guard.getPixelAddress(r.x0, y));
            continue;
        }
        const float* source = reinterpret_cast<const float*>(guard.getPixelAddress(r.x0, y));
        for (std::size_t i = 0; i < row.size(); i += 4) {
            const float a = source[i + 3];
            row[i] = source[i] * a;
            row[i + 1] = source[i + 1] * a;
            row[i + 2] = source[i + 2] * a;
            row[i + 3] = a;
        }
        picture.set_pixels(roi, OIIO::TypeDesc::FLOAT, row.data());
    }
}

}  // namespace

int ZrTileRenderer::tileCount(int width, int height, int tileSize) {
    return ((width + tileSize - 1) / tileSize) * ((height + tileSize - 1) / tileSize);
}

namespace {

// Renders into one tile; made once per thread.
using TileWorker = std::function<void(IxTile&)>;

// Shares the picture's tiles out to the threads, each rendering its tiles with the worker it makes
// (one thread at a time), and gathers them in the picture.
OIIO::ImageBuf renderTiles(int width, int height, const ZrRenderSettings& settings, ZrRenderProgress* progress,
                           const std::function<TileWorker()>& makeWorker) {
    const OIIO::TypeDesc type = settings.floatPixels ? OIIO::TypeDesc::FLOAT : OIIO::TypeDesc::UINT8;
    OIIO::ImageBuf picture(OIIO::ImageSpec(width, height, 4, type));
    const int tileSize = std::max(1, settings.tileSize);
    const int columns = (width + tileSize - 1) / tileSize;
    const int tiles = ZrTileRenderer::tileCount(width, height, tileSize);
    const IxPixelFormat format(IxPixelFormat::RGBA, settings.floatPixels ? IxPixelFormat::FLOAT32 : IxPixelFormat::UINT8);

    std::atomic<int> nextTile{0};
    std::atomic<bool> failed{false};
    std::exception_ptr failure;
    std::mutex lock;  // guards failure, the making of workers and the picture

    const auto work = [&] {
        try {
            TileWorker renderTile;
            {
                const std::lock_guard<std::mutex> hold(lock);
                renderTile = makeWorker();
            }
            for (int t = nextTile++; t < tiles && !failed; t = nextTile++) {
                const int x0 = (t % columns) * tileSize;
                const int y0 = (t / columns) * tileSize;
                const GeRectangle<int> region{x0, std::min(width, x0 + tileSize), y0, std::min(height, y0 + tileSize)};
                IxTile tile(format, region, {0.0f, 0.0f, 0.0f, 0.0f});
                renderTile(tile);
                {
                    const std::lock_guard<std::mutex> hold(lock);
                    copyTile(tile, height, settings.floatPixels, picture);
                }
                if (progress) progress->tileDone();
            }
        } catch (...) {
            const std::lock_guard<std::mutex> hold(lock);
            if (!failure) failure = std::current_exception();
            failed = true;
        }
    };

    const int threads = std::clamp(settings.threads, 1, std::max(1, tiles));
    std::vector<std::thread> helpers;
    for (int i = 1; i < threads; ++i) helpers.emplace_back(work);
    work();
    for (std::thread& helper : helpers) helper.join();
    if (failure) std::rethrow_exception(failure);
    return picture;
}

// After a moment's first render its lights keep the maps they have.
void holdShadowMaps(const ZrMoment& moment) {
    if (!moment.description) return;
    for (const RCShdPtr<SdInstance>& instance : moment.description->getLights())
        if (auto* light = dynamic_cast<SdStdLight*>(instance->getObject().get())) light->_shadowsActive = 0;
}

// Points the motion vectors of a tile's outputs at the moment later.
void aimMotion(RsAuxOutputs& outputs, const ZrMoment& later) {
    const auto* camera = dynamic_cast<const SdCamera*>(later.camera->getObject().get());
    if (camera == nullptr) return;
    GeProjectiveMatrix3<double> projection;
    camera->computeProjection(projection);
    outputs.setMotionTarget(*later.scene, later.camera->getMatrix().computeInverse(), projection);
}

template <class Renderer>
void configure(Renderer& renderer, const ZrRenderSettings& settings) {
    renderer.setAntialiasing(settings.antialiasing);
    renderer.setZBuffer(settings.zBuffer);
    renderer.setFilterKernel(settings.filter);
    renderer.setFillColor(settings.fill);
}

}  // namespace

ZrMoment ZrTileRenderer::momentOf(const RCShdPtr<SdScene>& description, const RCShdPtr<SdInstance>& camera) {
    RCShdPtr<RsSceneBuilder> builder = makeShared<RsSceneBuilder>();
    builder->addScene(description);
    return {description, builder->createRendererScene(), camera};
}

OIIO::ImageBuf ZrTileRenderer::render(const MomentMaker& momentAt, double frameSeconds, int width, int height,
                                      const ZrRenderSettings& settings, const ZrAccumulationSettings& accumulation,
                                      ZrRenderProgress* progress) {
    const GeRectangle<int> picture{0, width, 0, height};
    if (!accumulation.any()) {
        // One ordinary render; each thread has a scene of its own.
        return renderTiles(width, height, settings, progress, [&]() -> TileWorker {
            const ZrMoment moment = momentAt(frameSeconds);
            // The motion pass looks one frame ahead.
            ZrMoment later;
            if (settings.passes && settings.passes->wantsMotion())
                later = momentAt(frameSeconds + 1.0 / accumulation.framesPerSecond.getDouble());
            RCShdPtr<RsRenderer> renderer = makeShared<RsRenderer>();
            configure(*renderer, settings);
            return [=](IxTile& tile) {
                std::unique_ptr<RsAuxOutputs> passes;
                if (settings.passes) passes = settings.passes->makeTileOutputs(tile.getRectangle());
                if (passes && later.scene) aimMotion(*passes, later);
                renderer->setAuxOutputs(passes.get());
                renderer->render(moment.camera, moment.scene, picture, IxWriteGuard(tile));
                renderer->setAuxOutputs(nullptr);
                holdShadowMaps(moment);
                if (settings.passes) settings.passes->keepTile(std::move(passes));
            };
        });
    }
    std::mutex making;  // the moments are made one at a time, tiles of other threads running meanwhile
    return renderTiles(width, height, settings, progress, [&]() -> TileWorker {
        RCShdPtr<RsAccumulationRenderer> renderer = makeShared<RsAccumulationRenderer>();
        configure(*renderer, settings);
        renderer->setNbSamples(std::max(1u, accumulation.samples));
        renderer->setMotionBlurEnabled(accumulation.motionBlur);
        renderer->setGlobalFilterWidth(accumulation.shutter);
        renderer->setDepthOfFieldEnabled(accumulation.depthOfField);
        renderer->setDepthOfFieldSoftness(accumulation.aperture);
        // The moment of each pass, made when a tile first needs it and kept for the thread's tiles.
        auto moments = std::make_shared<std::vector<ZrMoment>>();
        return [=, &momentAt, &making](IxTile& tile) {
            renderer->beginFrame(picture, IxWriteGuard(tile));
            do {
                const unsigned int pass = renderer->getCurrentFrame();
                if (pass >= moments->size()) {
                    const double seconds = frameSeconds + renderer->getSampleOffsetTime(accumulation.framesPerSecond);
                    const std::lock_guard<std::mutex> hold(making);
                    moments->push_back(momentAt(seconds));
                }
                renderer->renderFrame((*moments)[pass].camera, (*moments)[pass].scene);
                holdShadowMaps((*moments)[pass]);
            } while (renderer->nextFrame());
        };
    });
}

}  // namespace Zr
