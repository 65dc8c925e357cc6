#pragma once
// The command line of zrender, read through CLI11 into one ZrOptions.
#include <string>

#include "coRgbaColorTyped.h"
#include "rsFilterKernel.h"
#include "zrShadowOptions.h"
#include "zrTileRenderer.h"

namespace Zr {

struct ZrOptions {
    // A model file to render; empty for the sample scene.
    std::string model;
    // The picture's file, or its pattern with a run of # standing for the frame number.
    std::string output = "zrender.png";
    bool outputGiven = false;
    std::string compare;
    float tolerance = 0.0f;
    int width = 640;
    int height = 480;
    std::string camera;
    int threads = 1;
    int tileSize = 128;
    int firstFrame = 0;
    int lastFrame = 0;
    bool framesGiven = false;
    double framesPerSecond = 24.0;
    bool floatPixels = false;
    bool zBuffer = true;
    bool antialiasing = false;
    RsFilterKernel::KernelType filter = RsFilterKernel::KernelBox;
    // Straight colour of the pixels that no surface covers: a dark blue-grey, opaque.
    CoRgbaColorTyped<float> fill{0.16f, 0.18f, 0.23f, 1.0f};
    bool info = false;
    // Compositing passes: the names of --passes beside the picture, and the file of --deep.
    std::string passes;
    std::string deep;
    ZrShadowOptions shadows;
    // Motion blur and depth of field (the frame rate is framesPerSecond's).
    ZrAccumulationSettings accumulation;
    // Distance of the plane that depth of field keeps sharp; unset (0): the scene's middle.
    double focusDistance = 0.0;

    // Reads the arguments. Returns -1 when zrender is to go on, otherwise the exit status: 0 after
    // printing the help, 2 after printing a usage error of one line on standard error.
    static int parse(int argc, const char* const* argv, ZrOptions& options);

    // The output file of the frame: each run of # replaced by the frame number, zero-padded to
    // the run's length.
    std::string outputOfFrame(int frame) const { return fileOfFrame(output, frame); }
    // The deep file of the frame, alike.
    std::string deepOfFrame(int frame) const { return fileOfFrame(deep, frame); }
    static std::string fileOfFrame(const std::string& pattern, int frame);
    int frameCount() const { return lastFrame - firstFrame + 1; }
};

}  // namespace Zr
