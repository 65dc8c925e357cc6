#include "zrTileRenderer.h"

#include <algorithm>
#include <atomic>
#include <exception>
#include <mutex>
#include <thread>
#include <vector>

#include "ixReadGuard.h"
#include "ixTile.h"
#include "ixWriteGuard.h"
#include "rsRenderer.h"
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

OIIO::ImageBuf ZrTileRenderer::render(const SceneMaker& makeScene, const RCShdPtr<SdInstance>& camera, int width,
                                      int height, const ZrRenderSettings& settings, ZrRenderProgress* progress) {
    const OIIO::TypeDesc type = settings.floatPixels ? OIIO::TypeDesc::FLOAT : OIIO::TypeDesc::UINT8;
    OIIO::ImageBuf picture(OIIO::ImageSpec(width, height, 4, type));
    const int tileSize = std::max(1, settings.tileSize);
    const int columns = (width + tileSize - 1) / tileSize;
    const int tiles = tileCount(width, height, tileSize);
    const GeRectangle<int> rectangle{0, width, 0, height};
    const IxPixelFormat format(IxPixelFormat::RGBA, settings.floatPixels ? IxPixelFormat::FLOAT32 : IxPixelFormat::UINT8);

    std::atomic<int> nextTile{0};
    std::atomic<bool> failed{false};
    std::exception_ptr failure;
    std::mutex lock;  // guards failure, the scene maker and the picture

    const auto work = [&] {
        try {
            RCShdPtr<RsScene> scene;
            {
                const std::lock_guard<std::mutex> hold(lock);
                scene = makeScene();
            }
            RCShdPtr<RsRenderer> renderer = makeShared<RsRenderer>();
            renderer->setAntialiasing(settings.antialiasing);
            renderer->setZBuffer(settings.zBuffer);
            renderer->setFilterKernel(settings.filter);
            renderer->setFillColor(settings.fill);
            for (int t = nextTile++; t < tiles && !failed; t = nextTile++) {
                const int x0 = (t % columns) * tileSize;
                const int y0 = (t / columns) * tileSize;
                const GeRectangle<int> region{x0, std::min(width, x0 + tileSize), y0, std::min(height, y0 + tileSize)};
                IxTile tile(format, region, {0.0f, 0.0f, 0.0f, 0.0f});
                std::unique_ptr<RsAuxOutputs> passes;
                if (settings.passes) passes = settings.passes->makeTileOutputs(region);
                renderer->setAuxOutputs(passes.get());
                renderer->render(camera, scene, rectangle, IxWriteGuard(tile));
                {
                    const std::lock_guard<std::mutex> hold(lock);
                    copyTile(tile, height, settings.floatPixels, picture);
                }
                if (settings.passes) settings.passes->keepTile(std::move(passes));
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

}  // namespace Zr
