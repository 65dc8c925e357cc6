// The anti-aliased path: the A-buffer's coverage masks on shared edges, and whole renders through
// RsRenderer against the per-sample reference of the test support (every sample's fragments laid
// in depth or drawing order, then filtered), in both modes and with every kernel; a flat mesh over
// its own colour; and a picture drawn in many regions against windows drawn in one.
#include <gtest/gtest.h>

#include <bit>
#include <random>
#include <string>

#include "rsABuffer.h"
#include "rsDrawContext.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;
using Mode = SdMaterial::TransferMode;

// Camera space to -1..1 for a parallel view of w x h pixels whose units are pixels, with camera z
// from 0 to -2 mapped onto pixel depths 0 to 1 (pixel depth = -z / 2, exact in float).
GeProjectiveMatrix3<double> pixelView(int w, int h) {
    return {2.0 / w, 0, 0, 0, 0, 2.0 / h, 0, 0, 0, 0, -1, -1, 0, 0, 0, 1};
}

// One instance per triangle, in camera space of pixelView(w, h). With ordered, instance k has
// render order k, which makes the list's order the drawing order.
RCShdPtr<RsScene> sceneOf(const std::vector<ScreenTriangle>& triangles, int w, int h, bool ordered) {
    std::vector<RCShdPtr<RsGeomInstance>> instances;
    for (std::size_t k = 0; k < triangles.size(); ++k) {
        const ScreenTriangle& t = triangles[k];
        const auto corner = [&](Pt p, double z) {
            return GePoint3<float>(float(toPixels(p.x) - w / 2), float(toPixels(p.y) - h / 2), float(-2 * z));
        };
        MaterialSettings settings(t.colour);
        settings.mode = t.mode;
        settings.needed = k % 3 == 0 ? 0x02u : (k % 3 == 1 ? 0x7fu : 0u);  // every vertex kind
        instances.push_back(drawn(makeMesh({corner(t.a, t.za), corner(t.b, t.zb), corner(t.c, t.zc)}, {0, 1, 2}),
                                  settings));
        if (ordered) instances.back()->_renderOrder = int(k);
    }
    return makeScene(instances);
}

// Opaque and transparent triangles of several modes, at random depths, so that they overlap and
// cut through each other.
std::vector<ScreenTriangle> randomTriangles(std::mt19937& rng, int count, int w, int h) {
    std::uniform_real_distribution<float> unit(0.0f, 1.0f);
    const auto depth = [&] { return double(std::uniform_int_distribution<int>(100, 900)(rng)) / 1024; };
    const Mode modes[] = {Mode::normal, Mode::add, Mode::multiply, Mode::screen};
    std::vector<ScreenTriangle> triangles;
    for (int k = 0; k < count; ++k) {
        const Pt a{randomCoord(rng, 1, w - 1), randomCoord(rng, 1, h - 1)};
        const auto near = [&] {
            return Pt{randomCoord(rng, std::max(1.0, toPixels(a.x) - 14), std::min(w - 1.0, toPixels(a.x) + 14)),
                      randomCoord(rng, std::max(1.0, toPixels(a.y) - 14), std::min(h - 1.0, toPixels(a.y) + 14))};
        };
        const bool opaque = rng() % 2 == 0;
        triangles.push_back({a, near(), near(), depth(), depth(), depth(),
                             Rgba(unit(rng), unit(rng), unit(rng), opaque ? 1.0f : 0.2f + 0.6f * unit(rng)),
                             opaque ? Mode::normal : modes[rng() % 4]});
    }
    return triangles;
}

// Random scenes through the renderer, every kernel in turn, with and without Z, against the
// reference: with Z each sample sees its triangles by their depth there, without Z by the
// drawing order. No two triangles come within 1e-9 of each other in depth at a sample.
TEST(RsABuffer, RendersAgreeWithThePerSampleReference) {
    std::mt19937 rng(5);
    const int w = 32, h = 32;
    const GeRectangle<int> rect{0, w, 0, h};
    const Rgba fill(0.3f, 0.5f, 0.7f, 0.6f);
    for (int trial = 0; trial < 40; ++trial) {
        const bool zBuffer = trial % 2 == 0;
        const RsFilterKernel kernel(static_cast<RsFilterKernel::KernelType>(trial / 2 % 10));
        const int s = kernel.getKernelSupport();
        const std::vector<ScreenTriangle> triangles = randomTriangles(rng, 10, w, h);
        SampleGrid grid({-s, w + s, -s, h + s});
        if (!renderSamples(triangles, zBuffer, fill, grid)) continue;
        Picture picture(rect);
        RsRenderer renderer;
        renderer.setAntialiasing(true);
        renderer.setZBuffer(zBuffer);
        renderer.setFilterKernel(kernel.getKernelType());
        renderer.setFillColor(fill);
        renderer.render({}, pixelView(w, h), sceneOf(triangles, w, h, !zBuffer), rect, picture.guard);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x)
                expectNearRgba(picture.at(x, y), straight(filterAt(grid, kernel, x, y)), 2e-5,
                               "trial " + std::to_string(trial) + " at " + std::to_string(x) + "," + std::to_string(y));
        if (HasFailure()) return;
    }
}

}  // namespace
}  // namespace Zr
