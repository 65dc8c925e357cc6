// Whole render calls of RsRenderer on the fragment Z-buffer path, and some of them on the
// antialiased path (A-buffer, with the box kernel or the cubic B-spline of support 2): the sample
// scene of zrender
// (unlit with the host's diffuse shader, and lit as zrender draws it),
// a mesh of about 100,000 small triangles, one quad over the same picture (the grid's time minus
// the quad's, over 100,352, is the cost of one triangle), and ten transparent layers over the
// whole picture. Each reports megapixels and fragments (shaded surface samples) per second, and
// the process's peak resident memory so far (run one benchmark per process to read it per scene).
// The lit sample scene with each kind of shadow map at two map sizes is timed twice: its lights'
// shadow passes alone, and whole render calls, whose time less the passes' is the camera pass.
#include <benchmark/benchmark.h>

#include <sys/resource.h>

#include <cstdint>
#include <vector>

#include "ixTile.h"
#include "ixWriteGuard.h"
#include "rsAuxOutputs.h"
#include "rsRenderer.h"
#include "sdCamera.h"
#include "zrBenchScenes.h"
#include "zrDiffuseShader.h"
#include "zrSampleScene.h"
#include "zrSceneKit.h"

namespace {

using namespace Zr;

// The host's shader, counting its calls: one call per fragment.
class CountingShader : public ZrDiffuseShader {
public:
    CountingShader(const RCShdPtr<const SdMaterial>& material, std::uint64_t& count)
        : ZrDiffuseShader(material), _count(count) {}
    CoRgbaColorTyped<float> shade(RsShadingContext& context) override {
        ++_count;
        return ZrDiffuseShader::shade(context);
    }

private:
    std::uint64_t& _count;
};

ZrSceneKit::ShaderMaker countingShaders(std::uint64_t& count) {
    return [&count](const RCShdPtr<const SdMaterial>& material) -> RCShdPtr<RsMaterialShader> {
        return makeShared<CountingShader>(material, count);
    };
}

// Renders scene through camera at the size of the benchmark's first two arguments, once per
// iteration; antialiased with the given kernel unless it is negative.
void renderLoop(benchmark::State& state, const RCShdPtr<RsScene>& scene, const RCShdPtr<SdInstance>& camera,
                const std::uint64_t& fragments, int antialiasKernel = -1, RsAuxOutputs* aux = nullptr) {
    const int width = static_cast<int>(state.range(0));
    const int height = static_cast<int>(state.range(1));
    const GeRectangle<int> rectangle{0, width, 0, height};
    IxTile tile(IxPixelFormat(IxPixelFormat::RGBA, IxPixelFormat::UINT8), rectangle, {0.0f, 0.0f, 0.0f, 0.0f});
    const IxWriteGuard output(tile);
    RCShdPtr<RsRenderer> renderer = makeShared<RsRenderer>();
    renderer->setFillColor({0.16f, 0.18f, 0.23f, 1.0f});
    if (antialiasKernel >= 0) {
        renderer->setAntialiasing(true);
        renderer->setFilterKernel(static_cast<RsFilterKernel::KernelType>(antialiasKernel));
    }

    renderer->setAuxOutputs(aux);

    const std::uint64_t fragmentsBefore = fragments;
    for (auto _ : state) renderer->render(camera, scene, rectangle, output);

    const double megapixels = static_cast<double>(width) * height / 1e6;
    state.counters["Mpixels/s"] = benchmark::Counter(megapixels, benchmark::Counter::kIsIterationInvariantRate);
    state.counters["fragments/s"] = benchmark::Counter(static_cast<double>(fragments - fragmentsBefore),
                                                       benchmark::Counter::kIsRate, benchmark::Counter::OneK::kIs1000);
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    state.counters["peakMiB"] = static_cast<double>(usage.ru_maxrss) / 1024.0;
}

RCShdPtr<SdInstance> sampleCamera(const benchmark::State& state) {
    return ZrSampleScene::makeCamera(static_cast<int>(state.range(0)), static_cast<int>(state.range(1)));
}

// The sample scene's geometry, unlit, every material drawn by the host's diffuse shader.
void sampleScene(benchmark::State& state, int antialiasKernel) {
    std::uint64_t fragments = 0;
    const RCShdPtr<RsScene> scene = ZrSampleScene::makeUnlitScene(countingShaders(fragments));
    renderLoop(state, scene, sampleCamera(state), fragments, antialiasKernel);
}
void BM_SampleScene(benchmark::State& state) { sampleScene(state, -1); }
BENCHMARK(BM_SampleScene)->Args({512, 512})->Args({1920, 1080})->Args({3840, 2160})->Unit(benchmark::kMillisecond);

// The sample scene with compositing passes: third argument 0 for none, 1 for the surface channels
// (Z, N, P, UV, IDs), 2 for deep samples, 3 for both, 5 for the surface channels with motion
// vectors (towards the camera a step to the right), 7 for all of them.
void BM_SampleScenePasses(benchmark::State& state) {
    std::uint64_t fragments = 0;
    const RCShdPtr<RsScene> scene = ZrSampleScene::makeUnlitScene(countingShaders(fragments));
    const GeRectangle<int> rectangle{0, static_cast<int>(state.range(0)), 0, static_cast<int>(state.range(1))};
    RsAuxOutputs aux(rectangle, (state.range(2) & 1) != 0, (state.range(2) & 2) != 0);
    if ((state.range(2) & 4) != 0) {
        const RCShdPtr<SdInstance> camera = sampleCamera(state);
        GeProjectiveMatrix3<double> projection;
        dynamic_cast<const SdCamera&>(*camera->getObject()).computeProjection(projection);
        aux.setMotionTarget(
            *scene, (GeAffineMatrix3<float>::makeTranslation({0.1f, 0.0f, 0.0f}) * camera->getMatrix()).computeInverse(),
            projection);
    }
    renderLoop(state, scene, sampleCamera(state), fragments, -1, state.range(2) != 0 ? &aux : nullptr);
}
BENCHMARK(BM_SampleScenePasses)
    ->Args({1920, 1080, 0})
    ->Args({1920, 1080, 1})
    ->Args({1920, 1080, 2})
    ->Args({1920, 1080, 3})
    ->Args({1920, 1080, 5})
    ->Args({1920, 1080, 7})
    ->Unit(benchmark::kMillisecond);

// The sample scene as zrender draws it: three lights and the standard material. Its fragments
// are those of the unlit scene (the same surfaces, the same opacities), counted in one render of
// that scene first; fragmentLights/s is the rate of fragments times lights.
void BM_LitSampleScene(benchmark::State& state) {
    std::uint64_t fragments = 0;
    {
        const int width = static_cast<int>(state.range(0)), height = static_cast<int>(state.range(1));
        IxTile tile(IxPixelFormat(IxPixelFormat::RGBA, IxPixelFormat::UINT8), {0, width, 0, height}, {});
        RsRenderer().render(sampleCamera(state), ZrSampleScene::makeUnlitScene(countingShaders(fragments)),
                            {0, width, 0, height}, IxWriteGuard(tile));
    }
    const RCShdPtr<RsScene> scene = ZrSampleScene::makeScene();
    const std::uint64_t perFrame = fragments;
    renderLoop(state, scene, sampleCamera(state), fragments);
    const double lights = static_cast<double>(scene->_lights.size());
    state.counters["fragments/s"] = benchmark::Counter(static_cast<double>(perFrame) * state.iterations(),
                                                       benchmark::Counter::kIsRate, benchmark::Counter::OneK::kIs1000);
    state.counters["fragmentLights/s"] =
        benchmark::Counter(static_cast<double>(perFrame) * state.iterations() * lights, benchmark::Counter::kIsRate,
                           benchmark::Counter::OneK::kIs1000);
}
BENCHMARK(BM_LitSampleScene)->Args({1920, 1080})->Unit(benchmark::kMillisecond);

// The sample scene's lights with the map type of the first argument (0 none, 1 depth, 2 midpoint,
// 3 deep) at the map size of the second.
RCShdPtr<RsScene> shadowedScene(const benchmark::State& state) {
    ZrSampleScene::Options options;
    options.shadows = static_cast<ZrSampleScene::Options::Shadows>(state.range(0));
    options.mapSize = static_cast<int>(state.range(1));
    return ZrSampleScene::makeScene(options);
}

void shadowArgs(benchmark::internal::Benchmark* b, bool withNone) {
    b->ArgNames({"maps", "size"});
    for (int type = withNone ? 0 : 1; type <= 3; ++type)
        for (int size : {1024, 2048}) b->Args({type, size});
    b->Unit(benchmark::kMillisecond);
}

// The shadow passes of the three lights (one spot, one direct, six for the omni light), as a
// render call makes them before its camera pass: each light placed for the camera of a
// 1920 x 1080 picture, then its maps rendered.
void BM_ShadowPasses(benchmark::State& state) {
    const RCShdPtr<RsScene> scene = shadowedScene(state);
    const GeAffineMatrix3<float> worldToCamera = ZrSampleScene::makeCamera(1920, 1080)->getMatrix().computeInverse();
    for (auto _ : state) {
        for (const RCShdPtr<RsLightShader>& light : scene->_lights) {
            light->setupRender(worldToCamera);
            light->initializeMaps(scene);
        }
    }
    state.counters["mapPixels/s"] = benchmark::Counter(8.0 * static_cast<double>(state.range(1) * state.range(1)),
                                                       benchmark::Counter::kIsIterationInvariantRate);
}
BENCHMARK(BM_ShadowPasses)->Apply([](benchmark::internal::Benchmark* b) { shadowArgs(b, false); });

// Whole render calls of the sample scene at 1920 x 1080 with those maps: the passes above, then
// the camera pass, whose every lit fragment asks each light's map.
void BM_ShadowedSampleScene(benchmark::State& state) {
    const RCShdPtr<RsScene> scene = shadowedScene(state);
    const GeRectangle<int> rectangle{0, 1920, 0, 1080};
    IxTile tile(IxPixelFormat(IxPixelFormat::RGBA, IxPixelFormat::UINT8), rectangle, {0.0f, 0.0f, 0.0f, 0.0f});
    const IxWriteGuard output(tile);
    const RCShdPtr<SdInstance> camera = ZrSampleScene::makeCamera(1920, 1080);
    RCShdPtr<RsRenderer> renderer = makeShared<RsRenderer>();
    for (auto _ : state) renderer->render(camera, scene, rectangle, output);
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    state.counters["peakMiB"] = static_cast<double>(usage.ru_maxrss) / 1024.0;
}
BENCHMARK(BM_ShadowedSampleScene)->Apply([](benchmark::internal::Benchmark* b) { shadowArgs(b, true); });

double aspectOf(const benchmark::State& state) {
    return static_cast<double>(state.range(0)) / static_cast<double>(state.range(1));
}

// 224 by 224 cells: 100,352 triangles, about 2.6 pixels each at 512 by 512.
void smallTriangles(benchmark::State& state, int antialiasKernel) {
    std::uint64_t fragments = 0;
    const ZrBenchScene grid = ZrBenchScenes::makeGrid(224, aspectOf(state), countingShaders(fragments));
    renderLoop(state, grid.scene, grid.camera, fragments, antialiasKernel);
}
void BM_SmallTriangles(benchmark::State& state) { smallTriangles(state, -1); }
BENCHMARK(BM_SmallTriangles)->Args({512, 512})->Args({1920, 1080})->Args({3840, 2160})->Unit(benchmark::kMillisecond);

// The same square as one quad: the same pixels, two triangles.
void BM_OneQuad(benchmark::State& state) {
    std::uint64_t fragments = 0;
    const ZrBenchScene quad = ZrBenchScenes::makeGrid(1, aspectOf(state), countingShaders(fragments));
    renderLoop(state, quad.scene, quad.camera, fragments);
}
BENCHMARK(BM_OneQuad)->Args({512, 512})->Args({1920, 1080})->Args({3840, 2160})->Unit(benchmark::kMillisecond);

// Every pixel composites ten fragments.
void transparentLayers(benchmark::State& state, int antialiasKernel) {
    std::uint64_t fragments = 0;
    const ZrBenchScene layers = ZrBenchScenes::makeLayers(aspectOf(state), countingShaders(fragments));
    renderLoop(state, layers.scene, layers.camera, fragments, antialiasKernel);
}
void BM_TransparentLayers(benchmark::State& state) { transparentLayers(state, -1); }
BENCHMARK(BM_TransparentLayers)->Args({512, 512})->Args({1920, 1080})->Args({3840, 2160})->Unit(benchmark::kMillisecond);

// The antialiased path: the third argument is the kernel, 0 the box (support 0) and 7 the cubic
// B-spline (support 2). A fragment is a shaded pixel of a triangle, whatever its coverage.
void antialiasedArgs(benchmark::internal::Benchmark* b) {
    for (const int kernel : {RsFilterKernel::KernelBox, RsFilterKernel::KernelCubicBSpline}) {
        b->Args({512, 512, kernel});
        b->Args({1920, 1080, kernel});
    }
    b->Unit(benchmark::kMillisecond);
}

void BM_SampleSceneAntialiased(benchmark::State& state) { sampleScene(state, int(state.range(2))); }
BENCHMARK(BM_SampleSceneAntialiased)->Apply(antialiasedArgs);

void BM_SmallTrianglesAntialiased(benchmark::State& state) { smallTriangles(state, int(state.range(2))); }
BENCHMARK(BM_SmallTrianglesAntialiased)->Apply(antialiasedArgs);

void BM_TransparentLayersAntialiased(benchmark::State& state) { transparentLayers(state, int(state.range(2))); }
BENCHMARK(BM_TransparentLayersAntialiased)->Apply(antialiasedArgs);

}  // namespace

BENCHMARK_MAIN();
