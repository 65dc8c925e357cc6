#include "zrOptions.h"

#include <charconv>
#include <iostream>
#include <map>
#include <thread>
#include <vector>

#include <CLI/CLI.hpp>

#include "rsFilterKernelNames.h"

namespace Zr {

namespace {

constexpr int maxSide = 16384;

// A whole string as one number of type T; false if anything is left over.
template <class T>
bool parseNumber(const std::string& text, std::size_t first, std::size_t last, T& value) {
    const std::from_chars_result result = std::from_chars(text.data() + first, text.data() + last, value);
    return first < last && result.ec == std::errc() && result.ptr == text.data() + last;
}

void parseSize(const std::string& text, ZrOptions& o) {
    const std::size_t x = text.find('x');
    if (x == std::string::npos || !parseNumber(text, 0, x, o.width) ||
        !parseNumber(text, x + 1, text.size(), o.height) || o.width < 1 || o.height < 1 || o.width > maxSide ||
        o.height > maxSide)
        throw CLI::ValidationError("--size", "takes WIDTHxHEIGHT, each from 1 to " + std::to_string(maxSide) +
                                                 ", not " + text);
}

void parseFill(const std::string& text, ZrOptions& o) {
    std::vector<float> channels;
    for (std::size_t start = 0;;) {
        const std::size_t end = std::min(text.find(',', start), text.size());
        float value = 0.0f;
        if (!parseNumber(text, start, end, value) || channels.size() == 4) {
            channels.clear();
            break;
        }
        channels.push_back(value);
        if (end == text.size()) break;
        start = end + 1;
    }
    if (channels.size() < 3) throw CLI::ValidationError("--fill", "takes r,g,b or r,g,b,a, not " + text);
    if (channels.size() == 3) channels.push_back(1.0f);
    o.fill = {channels[0], channels[1], channels[2], channels[3]};
}

void parseFrames(const std::string& text, ZrOptions& o) {
    const std::size_t dash = text.find('-', 1);
    const bool ok = dash == std::string::npos
                        ? parseNumber(text, 0, text.size(), o.firstFrame) && (o.lastFrame = o.firstFrame, true)
                        : parseNumber(text, 0, dash, o.firstFrame) &&
                              parseNumber(text, dash + 1, text.size(), o.lastFrame);
    if (!ok || o.firstFrame < 0 || o.lastFrame < o.firstFrame || o.lastFrame - o.firstFrame >= 1000000)
        throw CLI::ValidationError("--frames", "takes FIRST-LAST or one frame, 0 <= FIRST <= LAST, not " + text);
    o.framesGiven = true;
}

}  // namespace

int ZrOptions::parse(int argc, const char* const* argv, ZrOptions& o) {
    const unsigned cores = std::thread::hardware_concurrency();
    o.threads = cores > 0 ? static_cast<int>(cores) : 1;

    CLI::App app{"zrender: renders a model file (or, without one, the built-in sample scene) with libZRrender "
                 "and writes the picture to an image file.",
                 "zrender"};
    app.get_formatter()->column_width(30);
    app.add_option("model", o.model, "a model file in any format that Assimp reads (OBJ, glTF, PLY, FBX, ...)");
    app.add_option("-o,--output", o.output,
                   "the picture's file; its extension picks the format (png, jpg, tif, exr, ...). With "
                   "--frames, a pattern such as out.####.exr (default zrender.png)")
        ->type_name("FILE");
    app.add_option_function<std::string>("--size", [&o](const std::string& v) { parseSize(v, o); },
                                         "picture size in pixels (default 640x480)")
        ->type_name("WxH");
    app.add_option("--camera", o.camera, "the model file's camera to look through (default: its first, or "
                                         "one that frames the model)")
        ->type_name("NAME");
    app.add_option("-j,--threads", o.threads, "render on N threads (default: one per core)")
        ->type_name("N")
        ->check(CLI::Range(1, 256));
    app.add_option("--tile-size", o.tileSize, "side of the square tiles shared out to the threads (default 128)")
        ->type_name("N")
        ->check(CLI::Range(8, 4096));
    app.add_option_function<std::string>("--frames", [&o](const std::string& v) { parseFrames(v, o); },
                                         "render the frames FIRST to LAST of the animation (the model file's "
                                         "first, or the sample scene's: the sphere swings, the torus turns), one file each")
        ->type_name("FIRST-LAST");
    app.add_option("--fps", o.framesPerSecond, "frames per second of the animation (default 24)")
        ->type_name("F")
        ->check(CLI::Range(0.001, 100000.0));
    app.add_flag("--float", o.floatPixels, "float pixels (OpenEXR: 32-bit float instead of half; TIFF: float)");
    app.add_flag("--motion-blur", o.accumulation.motionBlur,
                 "motion blur: --samples passes at times spread over the shutter's opening");
    app.add_option("--samples", o.accumulation.samples,
                   "passes of --motion-blur and --dof (default 8)")
        ->type_name("N")
        ->check(CLI::Range(1, 1024));
    app.add_option("--shutter", o.accumulation.shutter,
                   "the shutter's opening as a fraction of a frame (default 1)")
        ->type_name("W")
        ->check(CLI::Range(0.0f, 100.0f));
    app.add_flag("--dof", o.accumulation.depthOfField,
                 "depth of field: --samples passes through points of the lens");
    app.add_option("--focus-distance", o.focusDistance,
                   "distance from the camera that --dof keeps sharp (default: the scene's middle)")
        ->type_name("D")
        ->check(CLI::PositiveNumber);
    app.add_option("--aperture", o.accumulation.aperture,
                   "side of the square of lens points of --dof, in scene units (default 0.1)")
        ->type_name("A")
        ->check(CLI::Range(0.0f, 1e6f));
    app.add_flag("-a,--antialias", o.antialiasing,
                 "antialias: sixteen samples per pixel, resolved through the --filter kernel");
    std::map<std::string, RsFilterKernel::KernelType> kernels;
    std::string kernelList;
    for (int k = 0; k < RsFilterKernel::nbKernelTypes; ++k) {
        const auto type = static_cast<RsFilterKernel::KernelType>(k);
        kernels[RsFilterKernelNames::nameOf(type)] = type;
        kernelList += std::string(k ? ", " : "") + RsFilterKernelNames::nameOf(type) + " (support " +
                      std::to_string(RsFilterKernel::kernelSupport[k]) + ")";
    }
    app.add_option("--filter", o.filter, "the antialiasing filter kernel: " + kernelList + "; default box")
        ->type_name("NAME")
        ->transform(CLI::CheckedTransformer(kernels, CLI::ignore_case).description(""));
    app.add_flag_callback("--no-zbuffer", [&o] { o.zBuffer = false; }, "no depth test: what is drawn later lies in front");
    app.add_option_function<std::string>("--fill", [&o](const std::string& v) { parseFill(v, o); },
                                         "colour where no surface is, straight, 0 to 1 (default 0.16,0.18,0.23,1)")
        ->type_name("R,G,B[,A]");
    app.add_option("--compare", o.compare,
                   "compare the picture with the image FILE; exit 1 if they differ (writes no picture unless "
                   "--output is given)")
        ->type_name("FILE");
    app.add_option("--tolerance", o.tolerance, "largest difference of a channel, 0 to 1, that --compare "
                                               "accepts (default 0: exact)")
        ->type_name("T")
        ->check(CLI::Range(0.0f, 1.0f));
    const std::map<std::string, ZrShadowOptions::Shadows> shadowKinds{
        {"z", ZrShadowOptions::Shadows::z},
        {"midpoint", ZrShadowOptions::Shadows::midpoint},
        {"deep", ZrShadowOptions::Shadows::deep},
        {"off", ZrShadowOptions::Shadows::none}};
    app.add_option("--shadows", o.shadows.shadows,
                   "the lights' shadow maps: z (nearest depth, the default), midpoint (of the two nearest "
                   "depths), deep (coloured, semi-transparent shadows) or off")
        ->type_name("z|midpoint|deep|off")
        ->transform(CLI::CheckedTransformer(shadowKinds, CLI::ignore_case).description(""));
    app.add_option("--shadow-map-size", o.shadows.mapSize, "side of each shadow map in texels (default 1024)")
        ->type_name("N")
        ->check(CLI::Range(16, 16384));
    // Compositing passes.
    app.add_option("--passes", o.passes, "also write the passes LIST (of z, n, p, uv, id, motion, crypto) as layers of the "
                                         "picture, which must be an OpenEXR file")
        ->type_name("LIST");
    app.add_option("--deep", o.deep, "also write every fragment of every pixel to the deep OpenEXR FILE")
        ->type_name("FILE");
    app.add_flag("--info", o.info, "print the library's package records and build record, and exit");

    try {
        app.parse(argc, argv);
        o.outputGiven = app.count("--output") > 0;
        const double rate = o.framesPerSecond;
        o.accumulation.framesPerSecond = rate == static_cast<int>(rate) ? Rational(static_cast<int>(rate), 1)
                                                                         : Rational(static_cast<int>(rate * 1000), 1000);
        if (o.frameCount() > 1 && o.output.find('#') == std::string::npos)
            throw CLI::ValidationError("--output", "needs a # pattern, such as out.####.png, for several frames");
        if (!o.deep.empty() && o.frameCount() > 1 && o.deep.find('#') == std::string::npos)
            throw CLI::ValidationError("--deep", "needs a # pattern, such as deep.####.exr, for several frames");
        // The passes are gathered by single renders without antialiasing.
        if ((!o.passes.empty() || !o.deep.empty()) &&
            (o.antialiasing || o.accumulation.motionBlur || o.accumulation.depthOfField))
            throw CLI::ValidationError(o.passes.empty() ? "--deep" : "--passes",
                                       "comes from renders without --antialias, --motion-blur or --dof");
        if (!o.compare.empty() && o.frameCount() > 1)
            throw CLI::ValidationError("--compare", "compares one frame, not " + std::to_string(o.frameCount()));
    } catch (const CLI::CallForHelp& e) {
        return app.exit(e);
    } catch (const CLI::ParseError& e) {
        std::string message = e.what();
        for (char& c : message) if (c == '\n') c = ' ';
        std::cerr << "zrender: " << message << " (zrender --help lists the options)\n";
        return 2;
    }
    return -1;
}

std::string ZrOptions::fileOfFrame(const std::string& pattern, int frame) {
    std::string name;
    for (std::size_t i = 0; i < pattern.size();) {
        if (pattern[i] != '#') {
            name += pattern[i++];
            continue;
        }
        std::size_t run = 0;
        while (i + run < pattern.size() && pattern[i + run] == '#') ++run;
        std::string number = std::to_string(frame);
        if (number.size() < run) number.insert(0, run - number.size(), '0');
        name += number;
        i += run;
    }
    return name;
}

}  // namespace Zr
