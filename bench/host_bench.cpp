// The host's tiled render of the lit and shadowed sample scene at 1920x1080 on one and on two
// threads: the speed-up of the threads over the same tiles. Wall-clock time, since the work is on
// several threads; the scene is made anew per render, as zrender does per frame.
#include <benchmark/benchmark.h>

#include "zrSampleScene.h"
#include "zrTileRenderer.h"

namespace {

using namespace Zr;

void BM_TiledSampleScene(benchmark::State& state) {
    constexpr int width = 1920, height = 1080;
    const ZrTileRenderer::MomentMaker momentAt = [](double) {
        return ZrTileRenderer::momentOf(ZrSampleScene::makeDescription(), ZrSampleScene::makeCamera(width, height));
    };
    ZrRenderSettings settings;
    settings.threads = static_cast<int>(state.range(0));
    settings.tileSize = static_cast<int>(state.range(1));
    for (auto _ : state) benchmark::DoNotOptimize(ZrTileRenderer::render(momentAt, 0.0, width, height, settings));
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
