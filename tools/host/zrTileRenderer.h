#pragma once
// Renders one picture as tiles on several threads.
//
// The picture is cut into square tiles of a fixed size, the same whatever the number of threads,
// and each tile is one call of RsRenderer over the whole picture's rectangle with the tile as its
// output: so a picture comes out bit for bit the same on any number of threads. A renderer scene
// serves one render at a time, so every thread makes its own from the scene maker (called once
// per thread, one thread at a time) and takes tiles from a shared counter until none is left.
//
// A failure on any thread (ExRenderCancelled from the interrupt handler among them) stops the
// others after their current tile and is thrown again by render once all have ended.
#include <functional>

#include <OpenImageIO/imagebuf.h>

#include "coRgbaColorTyped.h"
#include "rcShdPtr.h"
#include "rsFilterKernel.h"
#include "rsScene.h"
#include "sdInstance.h"

namespace Zr {

class ZrPassImages;
class ZrRenderProgress;

struct ZrRenderSettings {
    bool antialiasing = false;
    bool zBuffer = true;
    RsFilterKernel::KernelType filter = RsFilterKernel::KernelBox;
    // Straight colour where nothing is drawn.
    CoRgbaColorTyped<float> fill{0.0f, 0.0f, 0.0f, 0.0f};
    // Float pixels (premultiplied, unclamped) instead of 8-bit straight ones.
    bool floatPixels = false;
    int threads = 1;
    int tileSize = 128;
    // Gathers the compositing passes of every tile when given; not owned.
    ZrPassImages* passes = nullptr;
};

class ZrTileRenderer {
public:
    using SceneMaker = std::function<RCShdPtr<RsScene>()>;

    // The picture of width x height pixels, rows from the top down (see ZrImageFile). progress,
    // when given, hears of each tile done.
    static OIIO::ImageBuf render(const SceneMaker& makeScene, const RCShdPtr<SdInstance>& camera, int width,
                                 int height, const ZrRenderSettings& settings, ZrRenderProgress* progress = nullptr);

    // The number of tiles of a picture.
    static int tileCount(int width, int height, int tileSize);
};

}  // namespace Zr
