// The host's tiled render of the sample scene at 1920x1080 on one and on two threads: the
// speed-up of the threads over the same tiles. Wall-clock time, since the work is on several
// threads; the scene is made anew per render, as zrender does per frame.
#include <benchmark/benchmark.h>

#include "rsSceneBuilder.h"
#include "zrSampleScene.h"
#include "zrTileRenderer.h"

namespace {

using namespace Zr;

void BM_TiledSampleScene(benchmark::State& state) {
    constexpr int width = 1920, height = 1080;
    const RCShdPtr<SdScene> description = ZrSampleScene::makeDescription();
    const RCShdPtr<SdInstance> camera = ZrSampleScene::makeCamera(width, height);
    const ZrTileRenderer::SceneMaker makeScene = [&description] {
        RCShdPtr<RsSceneBuilder> builder = makeShared<RsSceneBuilder>();
        builder->addScene(description);
        return builder->createRendererScene();
    };
    ZrRenderSettings settings;
    settings.threads = static_cast<int>(state.range(0));
    settings.tileSize = static_cast<int>(state.range(1));
    for (auto _ : state) benchmark::DoNotOptimize(ZrTileRenderer::render(makeScene, camera, width, height, settings));
    state.counters["Mpixel/s"] =
        benchmark::Counter(double(width) * height * state.iterations() / 1e6, benchmark::Counter::kIsRate);
}
BENCHMARK(BM_TiledSampleScene)
    ->ArgNames({"threads", "tile"})
    ->Args({1, 128})
    ->Args({2, 128})
    ->Args({1, 256})
    ->Args({2, 256})
    ->Args({1, 1920})
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();

}  // namespace

BENCHMARK_MAIN();
