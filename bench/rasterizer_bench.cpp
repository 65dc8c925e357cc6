// Scan conversion alone: triangles of about 10, 1,000 and 100,000 pixels into a buffer whose span
// method does nothing but touch the pixels it is given, at whole-pixel grain and with 16 x 16
// sub-pixel spans. Reported as pixels per second (items) and triangles per second.
#include <benchmark/benchmark.h>

#include <cmath>
#include <random>
#include <vector>

#include "rsRasterizer.h"

namespace {

using namespace Zr;

constexpr int kSize = 1024;

// Touches each pixel of a span once: the least a buffer can do with it.
class TouchBuffer {
public:
    struct Context {};

    TouchBuffer() : _pixels(static_cast<std::size_t>(kSize) * kSize, 0) {}
    GeRectangle<int> getPixelRegion() const { return {0, kSize, 0, kSize}; }

    template <class PixelData>
    void touchPixels(const Context&, int row, const RsPixelSpan<0, 0>& span, PixelData&) {
        unsigned* line = &_pixels[static_cast<std::size_t>(row) * kSize];
        for (int x = span._x1; x < span._x2; ++x) ++line[x];
    }

    // Every pixel from the one holding the first sub-pixel to the one holding the last.
    template <class PixelData>
    void touchSubPixels(const Context&, int row, const RsPixelSpan<4, 4>& span, PixelData&) {
        unsigned* line = &_pixels[static_cast<std::size_t>(row) * kSize];
        const int end = (span._maxX2 + 15) >> 4;
        for (int x = span._minX1 >> 4; x < end; ++x) ++line[x];
    }

    long touched() const {
        long sum = 0;
        for (unsigned v : _pixels) sum += v;
        return sum;
    }
    void clear() { std::fill(_pixels.begin(), _pixels.end(), 0u); }

private:
    std::vector<unsigned> _pixels;
};

template <class Vertex>
Vertex vertexAt(double x, double y) {
    Vertex v{};
    v._pixCoord = GeHomogeneousCoord3<double>(x, y, 0.5, 1.0);
    v._w = 1.0;
    return v;
}

// Triangles of about the given area, in random positions, orientations and shapes, all inside
// the buffer.
template <class Vertex>
std::vector<Vertex> makeTriangles(double area, int count) {
    std::mt19937 rng(2024);
    std::uniform_real_distribution<double> unit(0.0, 1.0);
    std::vector<Vertex> vertices;
    const double radius = std::sqrt(area / 1.299);  // circumradius of an equilateral triangle
    while (static_cast<int>(vertices.size()) < 3 * count) {
        const double cx = radius + 1 + unit(rng) * (kSize - 2 * radius - 2);
        const double cy = radius + 1 + unit(rng) * (kSize - 2 * radius - 2);
        const double turn = unit(rng) * 2 * M_PI;
        for (int k = 0; k < 3; ++k) {
            const double a = turn + k * 2 * M_PI / 3 + (unit(rng) - 0.5) * 0.6;
            const double r = radius * (0.85 + 0.3 * unit(rng));
            vertices.push_back(vertexAt<Vertex>(cx + r * std::cos(a), cy + r * std::sin(a)));
        }
    }
    return vertices;
}

template <class Vertex, class Span>
void rasterize(benchmark::State& state) {
    using PixelData = RsPixelData<Vertex>;
    using Rasterizer = RsRasterizer<TouchBuffer, Vertex, Span>;
    const double area = static_cast<double>(state.range(0));
    const int count = area > 50000 ? 64 : 4096;
    const std::vector<Vertex> vertices = makeTriangles<Vertex>(area, count);
    TouchBuffer buffer;
    typename Rasterizer::DrawSpan method;
    if constexpr (Span::kSubPixelBits == 0) {
        method = &TouchBuffer::touchPixels<PixelData>;
    } else {
        method = &TouchBuffer::touchSubPixels<PixelData>;
    }
    const Rasterizer rasterizer(buffer, method);
    const TouchBuffer::Context context;
    // Pixels touched by one pass over the triangles.
    for (int i = 0; i < count; ++i)
        rasterizer.rasterizeTriangle(context, vertices[3 * i], vertices[3 * i + 1], vertices[3 * i + 2]);
    const long pixelsPerPass = buffer.touched();
    buffer.clear();

    long passes = 0;
    for (auto _ : state) {
        for (int i = 0; i < count; ++i)
            rasterizer.rasterizeTriangle(context, vertices[3 * i], vertices[3 * i + 1],
                                         vertices[3 * i + 2]);
        benchmark::ClobberMemory();
        ++passes;
    }
    state.SetItemsProcessed(passes * pixelsPerPass);
    state.counters["triangles/s"] =
        benchmark::Counter(static_cast<double>(passes * count), benchmark::Counter::kIsRate);
    state.counters["px/triangle"] = static_cast<double>(pixelsPerPass) / count;
}

void sizes(benchmark::internal::Benchmark* b) { b->Arg(10)->Arg(1000)->Arg(100000); }

BENCHMARK(rasterize<RsPlainVertex, RsPixelSpan<0, 0>>)->Apply(sizes)->Name("Raster/Pixel/Plain");
BENCHMARK(rasterize<RsPlainVertex, RsPixelSpan<4, 4>>)->Apply(sizes)->Name("Raster/Sub4x4/Plain");
// The set-up cost of the attributes a vertex kind carries, on small triangles.
BENCHMARK(rasterize<RsDepthVertex, RsPixelSpan<0, 0>>)->Arg(10)->Name("Raster/Pixel/Depth");
BENCHMARK(rasterize<RsTangentVertex, RsPixelSpan<0, 0>>)->Arg(10)->Name("Raster/Pixel/Tangent");

}  // namespace

BENCHMARK_MAIN();
