#pragma once
// Renders one picture as tiles on several threads.
//
// The picture is cut into square tiles of a fixed size, the same whatever the number of threads,
// and each tile is one call of RsRenderer over the whole picture's rectangle with the tile as its
// output: so a picture comes out bit for bit the same on any number of threads. A renderer scene
// serves one render at a time, so every thread makes its own (one thread at a time) and takes
// tiles from a shared counter until none is left.
//
// The lights' shadow maps do not depend on the tile: a thread's first tile renders them, and the
// thread then holds them (it clears the lights' _shadowsActive, which keeps a light's maps from
// its former render) for the rest of its tiles.
//
// Motion blur and depth of field render each tile as a weighted sum of passes through
// RsAccumulationRenderer, each pass showing the scene at its own time of the shutter and through
// its own point of the lens; the scenes of the passes are made once per thread and reused by every
// tile, and the passes' times and lens points are the same for every tile.
//
// With the motion pass, a plain render's thread also makes the moment one frame later
// (frameSeconds + 1 / the accumulation's framesPerSecond) and gives its scene and camera to each
// tile's outputs as their motion target.
//
// A failure on any thread (ExRenderCancelled from the interrupt handler among them) stops the
// others after their current tile and is thrown again by render once all have ended.
#include <functional>

#include <OpenImageIO/imagebuf.h>

#include "coRgbaColorTyped.h"
#include "rcShdPtr.h"
#include "rational.h"
#include "rsFilterKernel.h"
#include "rsScene.h"
#include "sdInstance.h"
#include "sdScene.h"

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

// Motion blur and depth of field; with neither, a frame is one ordinary render.
struct ZrAccumulationSettings {
    bool motionBlur = false;
    bool depthOfField = false;
    unsigned int samples = 8;
    // The shutter's opening as a fraction of a frame's time.
    float shutter = 1.0f;
    // The side of the square of lens points, in the camera's units; the camera's focal distance
    // stays sharp.
    float aperture = 0.1f;
    Rational framesPerSecond{24, 1};
    bool any() const { return motionBlur || depthOfField; }
};

// What a frame shows at a time of its animation: the renderer scene made from the description
// (whose lights the tile renderer switches to holding their maps), and the camera.
struct ZrMoment {
    RCShdPtr<SdScene> description;
    RCShdPtr<RsScene> scene;
    RCShdPtr<SdInstance> camera;
};

class ZrTileRenderer {
public:
    using MomentMaker = std::function<ZrMoment(double seconds)>;

    // The picture of width x height pixels at frameSeconds, rows from the top down (see
    // ZrImageFile), with the accumulation's effects. momentAt gives the scene and the camera at a
    // time; it is called once per thread (and per pass of the effects, and for the moment a frame
    // later of the motion pass), one call at a time.
    // progress, when given, hears of each tile done.
    static OIIO::ImageBuf render(const MomentMaker& momentAt, double frameSeconds, int width, int height,
                                 const ZrRenderSettings& settings, const ZrAccumulationSettings& accumulation = {},
                                 ZrRenderProgress* progress = nullptr);

    // The moment of a description: its renderer scene made by RsSceneBuilder, and the camera.
    static ZrMoment momentOf(const RCShdPtr<SdScene>& description, const RCShdPtr<SdInstance>& camera);

    // The number of tiles of a picture.
    static int tileCount(int width, int height, int tileSize);
};

}  // namespace Zr
