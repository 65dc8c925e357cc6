// The accumulation renderer against single renders: the lit sample scene at 960 by 540, one
// plain render, and frames of N motion-blurred passes (the scene held still, so that only the
// renderer's own cost is measured) into an 8-bit output (a float tile, divided and converted at
// the end) and a float RGBA output (added up in place). pass_ms is a frame's time over N: its
// excess over the single render's time is the overhead of accumulating.
#include <benchmark/benchmark.h>

#include "ixTile.h"
#include "ixWriteGuard.h"
#include "rational.h"
#include "rsAccumulationRenderer.h"
#include "zrSampleScene.h"

namespace {

using namespace Zr;

constexpr int kWidth = 960;
constexpr int kHeight = 540;

IxPixelFormat formatOf(const benchmark::State& state) {
    return IxPixelFormat(IxPixelFormat::RGBA, static_cast<IxPixelFormat::Depth>(state.range(0)));
}

// Argument: output depth in bits.
void BM_SingleRender(benchmark::State& state) {
    const RCShdPtr<RsScene> scene = ZrSampleScene::makeScene();
    const RCShdPtr<SdInstance> camera = ZrSampleScene::makeCamera(kWidth, kHeight);
    const GeRectangle<int> rect{0, kWidth, 0, kHeight};
    IxTile tile(formatOf(state), rect, {});
    const IxWriteGuard output(tile);
    RsRenderer renderer;
    renderer.setFillColor({0.16f, 0.18f, 0.23f, 1.0f});
    for (auto _ : state) renderer.render(camera, scene, rect, output);
    state.counters["pass_ms"] = benchmark::Counter(1e-3, benchmark::Counter::kIsIterationInvariantRate |
                                                             benchmark::Counter::kInvert);
}
BENCHMARK(BM_SingleRender)->ArgNames({"bits"})->Arg(8)->Arg(32)->Unit(benchmark::kMillisecond);

// Arguments: output depth in bits, passes.
void BM_AccumulatedFrame(benchmark::State& state) {
    const RCShdPtr<RsScene> scene = ZrSampleScene::makeScene();
    const RCShdPtr<SdInstance> camera = ZrSampleScene::makeCamera(kWidth, kHeight);
    const GeRectangle<int> rect{0, kWidth, 0, kHeight};
    IxTile tile(formatOf(state), rect, {});
    const IxWriteGuard output(tile);
    RsAccumulationRenderer renderer;
    renderer.setFillColor({0.16f, 0.18f, 0.23f, 1.0f});
    renderer.setMotionBlurEnabled(true);
    const auto passes = static_cast<unsigned int>(state.range(1));
    renderer.setNbSamples(passes);
    for (auto _ : state) {
        renderer.beginFrame(rect, output);
        do {
            benchmark::DoNotOptimize(renderer.getSampleOffsetTime(Rational(24, 1)));
            renderer.renderFrame(camera, scene);
        } while (renderer.nextFrame());
    }
    state.counters["pass_ms"] = benchmark::Counter(1e-3 * passes, benchmark::Counter::kIsIterationInvariantRate |
                                                                      benchmark::Counter::kInvert);
}
BENCHMARK(BM_AccumulatedFrame)
    ->ArgNames({"bits", "passes"})
    ->ArgsProduct({{8, 32}, {4, 16}})
    ->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
