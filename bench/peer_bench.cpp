// Side by side with a peer: the scenes of the render benchmark (render_bench.cpp) drawn by
// RsRenderer and by Mesa's CPU rasterizer through OSMesa (peer_gl.h), both on one thread, into
// RGBA8 pictures of the same size through the same camera. For each scene and size it prints the
// best of five frames of each, their ratio, and how far the two pictures are apart: the mean
// absolute difference per channel, in 255ths, which should be at most 1.
//
// The peer's times move with the machine's load more than ours do, so the two are always measured
// in the same run. A frame of ours is one render call; a frame of the peer is a clear, the draw
// calls and glFinish, its geometry already loaded and sorted (the camera does not move).
//
// Usage: zr_bench_peer [--size WIDTHxHEIGHT]... [--dump DIRECTORY]
// Without --size, both 1920x1080 and 3840x2160. --dump writes both pictures of each row as PPM.
#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <fstream>
#include <functional>
#include <limits>
#include <string>
#include <utility>
#include <vector>

#include "ixReadGuard.h"
#include "ixTile.h"
#include "ixWriteGuard.h"
#include "peer_gl.h"
#include "rsRenderer.h"
#include "zrBenchScenes.h"
#include "zrSampleScene.h"
#include "zrSceneKit.h"

namespace {

using namespace Zr;

constexpr int kFrames = 5;
const CoRgbaColorTyped<float> kFill{0.16f, 0.18f, 0.23f, 1.0f};

struct Scene {
    RCShdPtr<RsScene> scene;
    RCShdPtr<SdInstance> camera;
};

struct SceneCase {
    const char* name;
    std::function<Scene(int width, int height)> make;
};

double aspectOf(int width, int height) { return static_cast<double>(width) / static_cast<double>(height); }

// The scenes of render_bench.cpp with the host's own shader.
const std::vector<SceneCase>& sceneCases() {
    static const std::vector<SceneCase> cases = {
        {"sample scene",
         [](int width, int height) {
             return Scene{ZrSampleScene::makeUnlitScene(), ZrSampleScene::makeCamera(width, height)};
         }},
        // 224 by 224 cells of two triangles (100,352 triangles) facing the camera.
        {"100k triangles",
         [](int width, int height) {
             const ZrBenchScene grid =
                 ZrBenchScenes::makeGrid(224, aspectOf(width, height), ZrSceneKit::diffuseShaderMaker());
             return Scene{grid.scene, grid.camera};
         }},
        // Ten squares one behind the other, each larger than the view, of opacity 0.3.
        {"10 layers",
         [](int width, int height) {
             const ZrBenchScene layers = ZrBenchScenes::makeLayers(aspectOf(width, height),
                                                                    ZrSceneKit::diffuseShaderMaker());
             return Scene{layers.scene, layers.camera};
         }},
    };
    return cases;
}

// The best of kFrames runs of frame, in milliseconds.
double bestOf(const std::function<void()>& frame) {
    double best = std::numeric_limits<double>::infinity();
    for (int i = 0; i < kFrames; ++i) {
        const auto start = std::chrono::steady_clock::now();
        frame();
        const std::chrono::duration<double, std::milli> elapsed = std::chrono::steady_clock::now() - start;
        best = std::min(best, elapsed.count());
    }
    return best;
}

// RGBA8 rows, the bottom row first; both pictures are laid out so.
using Picture = std::vector<std::uint8_t>;

Picture pictureOf(const IxTile& tile, int width, int height) {
    Picture picture(static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 4);
    const IxReadGuard guard(tile);
    const std::size_t rowBytes = static_cast<std::size_t>(width) * 4;
    for (int y = 0; y < height; ++y)
        std::copy_n(guard.getPixelAddress(0, y), rowBytes, picture.begin() + static_cast<std::ptrdiff_t>(y * rowBytes));
    return picture;
}

// The largest over the four channels of the mean absolute difference, in 255ths.
double meanDifference(const Picture& a, const Picture& b) {
    std::uint64_t sums[4] = {};
    for (std::size_t i = 0; i < a.size(); ++i)
        sums[i % 4] += static_cast<std::uint64_t>(std::abs(static_cast<int>(a[i]) - static_cast<int>(b[i])));
    const double pixels = static_cast<double>(a.size() / 4);
    return static_cast<double>(*std::max_element(std::begin(sums), std::end(sums))) / pixels;
}

void writePpm(const std::string& path, const Picture& picture, int width, int height) {
    std::ofstream out(path, std::ios::binary);
    out << "P6\n" << width << ' ' << height << "\n255\n";
    for (int y = height - 1; y >= 0; --y)
        for (int x = 0; x < width; ++x)
            out.write(reinterpret_cast<const char*>(&picture[(static_cast<std::size_t>(y) * width + x) * 4]), 3);
    if (!out) std::fprintf(stderr, "cannot write %s\n", path.c_str());
}

std::string fileNameOf(const char* scene, int width, int height) {
    std::string name;
    for (const char* c = scene; *c != '\0'; ++c) name += *c == ' ' ? '-' : *c;
    return name + "-" + std::to_string(width) + "x" + std::to_string(height) + ".ppm";
}

int run(int argc, char** argv) {
    std::vector<std::pair<int, int>> sizes;
    std::string dumpDirectory;
    for (int i = 1; i < argc; ++i) {
        const std::string option = argv[i];
        if (option == "--size" && i + 1 < argc) {
            int width = 0, height = 0;
            if (std::sscanf(argv[++i], "%dx%d", &width, &height) != 2 || width <= 0 || height <= 0) {
                std::fprintf(stderr, "bad size %s\n", argv[i]);
                return 2;
            }
            sizes.emplace_back(width, height);
        } else if (option == "--dump" && i + 1 < argc) {
            dumpDirectory = argv[++i];
        } else {
            std::fprintf(stderr, "usage: %s [--size WIDTHxHEIGHT]... [--dump DIRECTORY]\n", argv[0]);
            return 2;
        }
    }
    if (sizes.empty()) sizes = {{1920, 1080}, {3840, 2160}};

    PeerContext context;
    std::printf("peer: %s, LP_NUM_THREADS=%s; best of %d frames, one thread each\n", context.describe().c_str(),
                std::getenv("LP_NUM_THREADS"), kFrames);
    std::printf("%-16s %-10s %10s %10s %8s %10s\n", "scene", "size", "ours ms", "peer ms", "ratio", "mean diff");

    int disagreements = 0;
    for (const auto& [width, height] : sizes) {
        for (const SceneCase& sceneCase : sceneCases()) {
            const Scene scene = sceneCase.make(width, height);
            const GeRectangle<int> rectangle{0, width, 0, height};

            IxTile tile(IxPixelFormat(IxPixelFormat::RGBA, IxPixelFormat::UINT8), rectangle, {0.0f, 0.0f, 0.0f, 0.0f});
            double ours = 0.0;
            {
                const IxWriteGuard output(tile);
                const RCShdPtr<RsRenderer> renderer = makeShared<RsRenderer>();
                renderer->setFillColor(kFill);
                ours = bestOf([&] { renderer->render(scene.camera, scene.scene, rectangle, output); });
            }
            const Picture oursPicture = pictureOf(tile, width, height);

            context.resize(width, height);
            double peer = 0.0;
            {
                PeerScene peerScene(context, *scene.scene, *scene.camera);
                peer = bestOf([&] { peerScene.draw(kFill); });
            }
            const Picture peerPicture(context.getPixels(), context.getPixels() + oursPicture.size());

            const double difference = meanDifference(oursPicture, peerPicture);
            const bool agree = difference <= 1.0;
            if (!agree) ++disagreements;
            const std::string size = std::to_string(width) + "x" + std::to_string(height);
            std::printf("%-16s %-10s %10.1f %10.1f %8.2f %10.3f%s\n", sceneCase.name, size.c_str(), ours, peer,
                        ours / peer, difference, agree ? "" : "  <<< PICTURES DISAGREE (more than 1/255) >>>");
            std::fflush(stdout);
            if (!dumpDirectory.empty()) {
                const std::string name = fileNameOf(sceneCase.name, width, height);
                writePpm(dumpDirectory + "/ours-" + name, oursPicture, width, height);
                writePpm(dumpDirectory + "/peer-" + name, peerPicture, width, height);
            }
        }
    }
    if (disagreements != 0)
        std::printf("%d row(s) where the pictures disagree: their times do not compare\n", disagreements);
    return 0;
}

}  // namespace

int main(int argc, char** argv) {
    // Mesa's rasterizer reads its thread count when the first context is made.
    setenv("LP_NUM_THREADS", "1", 1);
    try {
        return run(argc, argv);
    } catch (const std::exception& e) {
        std::fprintf(stderr, "zr_bench_peer: %s\n", e.what());
        return 1;
    }
}
