// Flat 2D fills of Rs2DBuffer: random triangles inside a 1024 by 1024 tile, small (vertices within
// 20 pixels of a centre, about 130 pixels of area) or large (within 200 pixels), plain and
// anti-aliased, replacing and blending, into 8-bit and float RGBA tiles. Mpixels/s counts the
// triangles' areas filled per second.
#include <benchmark/benchmark.h>

#include <array>
#include <cmath>
#include <random>
#include <vector>

#include "ixTile.h"
#include "rs2DBuffer.h"

namespace {

using namespace Zr;

constexpr int kTileSize = 1024;

struct Triangles {
    std::vector<std::array<Rs2DVertex, 3>> vertices;
    double area = 0.0;  // in pixels, all triangles together
};

Triangles randomTriangles(float reach, int count) {
    Triangles t;
    std::mt19937 rng(3);
    std::uniform_real_distribution<float> centre(reach, kTileSize - reach), offset(-reach, reach);
    for (int i = 0; i < count; ++i) {
        const float cx = centre(rng), cy = centre(rng);
        std::array<Rs2DVertex, 3> v;
        for (Rs2DVertex& p : v) p = {cx + offset(rng), cy + offset(rng)};
        t.area += 0.5 * std::abs(double(v[1]._x - v[0]._x) * (v[2]._y - v[0]._y) -
                                 double(v[2]._x - v[0]._x) * (v[1]._y - v[0]._y));
        t.vertices.push_back(v);
    }
    return t;
}

// Arguments: depth in bits (8 or 32), anti-aliased (0 or 1), blending (0 or 1), reach of the
// vertices in pixels (20 or 200).
void BM_Fill2D(benchmark::State& state) {
    const auto depth = static_cast<IxPixelFormat::Depth>(state.range(0));
    const bool antialiased = state.range(1) != 0, blending = state.range(2) != 0;
    IxTile tile(IxPixelFormat(IxPixelFormat::RGBA, depth), {0, kTileSize, 0, kTileSize}, {0.0f, 0.0f, 0.0f, 0.0f});
    Rs2DBuffer buffer(tile, {0.8f, 0.4f, 0.2f, 0.5f}, blending);
    const int reach = static_cast<int>(state.range(3));
    const Triangles triangles = randomTriangles(static_cast<float>(reach), reach < 100 ? 4096 : 64);
    for (auto _ : state) {
        for (const auto& v : triangles.vertices) {
            if (antialiased) buffer.rasterizeUnclippedAATriangle(v[0], v[1], v[2]);
            else buffer.rasterizeUnclippedTriangle(v[0], v[1], v[2]);
        }
        benchmark::ClobberMemory();
    }
    state.counters["Mpixels/s"] =
        benchmark::Counter(triangles.area / 1e6, benchmark::Counter::kIsIterationInvariantRate);
}
BENCHMARK(BM_Fill2D)
    ->ArgNames({"bits", "aa", "blend", "reach"})
    ->ArgsProduct({{8, 32}, {0, 1}, {0, 1}, {20, 200}})
    ->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
