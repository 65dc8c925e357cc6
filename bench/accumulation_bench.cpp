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

// The still sample scene, its camera and an output tile of the depth in bits of the benchmark's
// first argument.
struct Frame {
    explicit Frame(const benchmark::State& state)
        : tile(IxPixelFormat(IxPixelFormat::RGBA, static_cast<IxPixelFormat::Depth>(state.range(0))), rect, {}),
          output(tile) {}
    const RCShdPtr<RsScene> scene = ZrSampleScene::makeScene();
    const RCShdPtr<SdInstance> camera = ZrSampleScene::makeCamera(kWidth, kHeight);
    const GeRectangle<int> rect{0, kWidth, 0, kHeight};
    IxTile tile;
    const IxWriteGuard output;
};

constexpr CoRgbaColorTyped<float> kFill(0.16f, 0.18f, 0.23f, 1.0f);

// Argument: output depth in bits.
void BM_SingleRender(benchmark::State& state) {
    const Frame frame(state);
    RsRenderer renderer;
    renderer.setFillColor(kFill);
    for (auto _ : state) renderer.render(frame.camera, frame.scene, frame.rect, frame.output);
    state.counters["pass_ms"] = benchmark::Counter(1e-3, benchmark::Counter::kIsIterationInvariantRate |
                                                             benchmark::Counter::kInvert);
}
BENCHMARK(BM_SingleRender)->ArgNames({"bits"})->Arg(8)->Arg(32)->Unit(benchmark::kMillisecond);

// Arguments: output depth in bits, passes.
void BM_AccumulatedFrame(benchmark::State& state) {
    const Frame frame(state);
    RsAccumulationRenderer renderer;
    renderer.setFillColor(kFill);
    renderer.setMotionBlurEnabled(true);
    const auto passes = static_cast<unsigned int>(state.range(1));
    renderer.setNbSamples(passes);
    for (auto _ : state) {
        renderer.beginFrame(frame.rect, frame.output);
        do {
            benchmark::DoNotOptimize(renderer.getSampleOffsetTime(Rational(24, 1)));
            renderer.renderFrame(frame.camera, frame.scene);
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
