// zrender: the command-line host of libZRrender. It renders a model file (through Assimp) or the
// built-in sample scene, on several threads, one picture per frame, and writes each picture to an
// image file (through OpenImageIO) or compares it with a reference picture.
//
// Exit status: 0 done, 1 a failure (one line on standard error naming the file and the reason),
// 2 a usage error, 130 cancelled by Ctrl-C (no file written).
#include <unistd.h>

#include <algorithm>
#include <exception>
#include <iostream>
#include <memory>
#include <string>

#include "exBase.h"
#include "exRenderCancelled.h"
#include "pxRequestMgr.h"
#include "sdCamera.h"
#include "zrHostError.h"
#include "zrImageFile.h"
#include "zrInfoReport.h"
#include "zrModelFile.h"
#include "zrOptions.h"
#include "zrPassImages.h"
#include "zrRenderProgress.h"
#include "zrSampleScene.h"
#include "zrTileRenderer.h"

namespace {

using namespace Zr;

constexpr int kCancelledStatus = 130;

// Keeps the progress handler installed for the renders of one run.
class InstalledHandler {
public:
    explicit InstalledHandler(const RCShdPtr<ZrRenderProgress>& progress) {
        PxRequestMgr::getInstance()->setInterruptHandler(progress);
    }
    ~InstalledHandler() { PxRequestMgr::getInstance()->setInterruptHandler({}); }
    InstalledHandler(const InstalledHandler&) = delete;
    InstalledHandler& operator=(const InstalledHandler&) = delete;
};

// Renders the frames the options ask for and writes or compares each; the exit status.
int run(const ZrOptions& options) {
    std::unique_ptr<ZrModelFile> model;
    if (!options.model.empty()) {
        model = std::make_unique<ZrModelFile>(options.model);
        for (const std::string& warning : model->warnings()) std::cerr << "zrender: warning: " << warning << '\n';
    }
    const ZrImageFile::Storage storage = ZrImageFile::storageFor(options.output, options.floatPixels);
    // The reference is read before the render, so that a missing one costs no time.
    const OIIO::ImageBuf reference = options.compare.empty() ? OIIO::ImageBuf() : ZrImageFile::read(options.compare);
    ZrRenderSettings settings;
    settings.zBuffer = options.zBuffer;
    settings.antialiasing = options.antialiasing;
    settings.filter = options.filter;
    settings.fill = options.fill;
    settings.floatPixels = storage != ZrImageFile::Storage::uint8;
    settings.threads = options.threads;
    settings.tileSize = options.tileSize;
    // Compositing passes: float pictures, layered into the output.
    const unsigned passList = ZrPassImages::parse(options.passes);
    if (passList != 0 && storage == ZrImageFile::Storage::uint8)
        throw ZrHostError(options.output + ": --passes needs an OpenEXR picture");
    if (passList != 0 || !options.deep.empty()) settings.floatPixels = true;

    RCShdPtr<ZrRenderProgress> progress = makeShared<ZrRenderProgress>(isatty(STDERR_FILENO) == 1);
    const InstalledHandler installed(progress);
    const double aspect = static_cast<double>(options.width) / options.height;
    int status = 0;
    // The scene and the camera at a time of the animation; each thread and pass has its own.
    const auto momentAt = [&](double seconds) {
        const RCShdPtr<SdScene> description = model ? model->sceneAt(seconds, options.shadows)
                                                    : ZrSampleScene::makeDescription(options.shadows, seconds);
        const RCShdPtr<SdInstance> camera = model ? model->cameraAt(options.camera, seconds, aspect)
                                                  : ZrSampleScene::makeCamera(options.width, options.height);
        if (options.accumulation.depthOfField) {
            // The focal plane: as asked, or through the middle of the scene.
            SdCamera& lens = dynamic_cast<SdCamera&>(*camera->getObject());
            double distance = options.focusDistance;
            if (!(distance > 0.0)) {
                const GeVector3<float> eye = camera->getMatrix().getTranslation();
                distance = model ? (model->centreAt(seconds) - GePoint3<double>{eye.x, eye.y, eye.z}).length()
                                 : ZrSampleScene::focusDistance();
            }
            lens._focalDistance = static_cast<float>(std::max(distance, 1e-6));
        }
        return ZrTileRenderer::momentOf(description, camera);
    };
    for (int frame = options.firstFrame; frame <= options.lastFrame; ++frame) {
        const double seconds = options.framesGiven ? frame / options.framesPerSecond : 0.0;
        progress->startFrame(frame - options.firstFrame + 1, options.frameCount(),
                             ZrTileRenderer::tileCount(options.width, options.height, options.tileSize));
        ZrPassImages passes(passList, !options.deep.empty(), options.width, options.height);
        settings.passes = &passes;
        const OIIO::ImageBuf picture = ZrTileRenderer::render(momentAt, seconds, options.width, options.height,
                                                              settings, options.accumulation, progress.get());
        progress->finish();
        // Ctrl-C after the last scanline still cancels: nothing is written.
        if (ZrRenderProgress::interrupted()) throw ExRenderCancelled();

        if (passList != 0) ZrPassImages::writeExr(options.outputOfFrame(frame), passes.layers(picture));
        else if (options.compare.empty() || options.outputGiven)
            ZrImageFile::write(options.outputOfFrame(frame), picture, storage);
        if (!options.deep.empty()) ZrPassImages::writeExr(options.deepOfFrame(frame), passes.deepImage());
        if (!options.compare.empty()) {
            const ZrImageFile::Difference difference =
                ZrImageFile::compare(picture, reference, options.tolerance);
            std::cout << options.compare << ": " << difference.describe() << '\n';
            if (difference.any()) status = 1;
        }
    }
    return status;
}

}  // namespace

int main(int argc, char** argv) {
    ZrOptions options;
    const int parsed = ZrOptions::parse(argc, argv, options);
    if (parsed >= 0) return parsed;
    if (options.info) {
        ZrInfoReport::print(std::cout);
        return 0;
    }

    ZrRenderProgress::catchInterrupts();
    try {
        return run(options);
    } catch (const ExRenderCancelled&) {
        std::cerr << "zrender: render cancelled\n";
        return kCancelledStatus;
    } catch (const ExBase& e) {
        std::cerr << "zrender: " << e.what() << '\n';
    } catch (const std::exception& e) {
        std::cerr << "zrender: " << e.what() << '\n';
    }
    return ZrRenderProgress::interrupted() ? kCancelledStatus : 1;
}
