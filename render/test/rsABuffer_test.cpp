// The anti-aliased path: whole renders through RsRenderer against the per-sample reference of the
// test support (every sample's fragments laid in depth or drawing order, then filtered), in both
// modes and with every kernel; the lists of one pixel against a model, exact ties included; the
// coverage masks on shared edges; and a picture drawn in many regions against windows drawn in one.
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

// Fragments offered one after the other to one pixel through hand-made spans, with masks at
// random (some whole, which take the interior run), planes from a few tilted ones so that samples
// often tie, opaque or not. Without Z a fragment is made when it covers a sample left open,
// keeps its whole mask and goes at the head; with Z it is made unless its near end lies at or
// behind a whole opaque fragment's far end, and at every sample the fragments that cover it lie
// from far to near, a newcomer behind those level with it there. Depths are binary fractions, so
// the model's are exact.
TEST(RsABuffer, OfferedFragmentsListAsTheModelSays) {
    std::mt19937 rng(31);
    for (int trial = 0; trial < 300; ++trial) {
        const bool zBuffer = trial % 2 == 0;
        RsABuffer buffer(0, 0, 1, 1, zBuffer, true);
        std::vector<RCShdPtr<TestMaterial>> materials;
        std::vector<std::vector<int>> expected(16);  // per sample with Z; else entry 0, head first
        std::uint16_t closed = 0;
        double nearest = RsABuffer::kEmptyDepth;
        double planes[6][3];
        std::uint16_t masks[6];
        int made = 0;
        for (int id = 0; id < 6; ++id) {
            const std::uint16_t mask = rng() % 3 == 0 ? 0xffff : static_cast<std::uint16_t>(rng());
            const double z0 = double(1 + rng() % 3) / 4, dx = (double(rng() % 3) - 1) / 16, dy = (double(rng() % 3) - 1) / 8;
            const bool opaque = rng() % 2 == 0;
            masks[id] = mask;
            materials.push_back(makeShared<TestMaterial>(Rgba(float(id), 0.0f, 0.0f, opaque ? 1.0f : 0.5f)));
            RsDrawContext context;
            context._transfer = RsTransferFunc::getFunction(Mode::normal);
            context._canBeOpaque = true;
            context._material = materials.back().get();
            RsABuffer::Span span;
            span.resetExtents();
            for (int i = 0; i < 16; ++i) {
                if (mask == 0xffff) span.store(i, 0, 16);
                else if ((mask >> i) & 1) span.store(i, kPattern[i], kPattern[i] + 1);
                else span.markMissed(i);
            }
            RsPixelData<RsPlainVertex> data{};
            data._w._q = 1.0;
            data._z._q = z0;
            data._z._dq_dx = dx;
            data._z._dq_dy = dy;
            data._z._slope = (std::abs(dx) + std::abs(dy)) / 2;
            if (zBuffer) buffer.drawSpanZ(context, 0, span, data);
            else buffer.drawSpanNoZ(context, 0, span, data);

            if (zBuffer ? mask == 0 || !(nearest > z0 - data._z._slope) : (mask & ~closed) == 0) continue;
            ++made;
            if (!zBuffer) {
                expected[0].insert(expected[0].begin(), id);
                if (opaque) closed |= mask;
                continue;
            }
            if (opaque && mask == 0xffff) nearest = std::min(nearest, z0 + data._z._slope);
            const auto depth = [&](int k, int i) {  // the plane of offer k at sample i, exactly
                return planes[k][0] + planes[k][1] * ((kPattern[i] + 0.5) / 16 - 0.5) +
                       planes[k][2] * ((i + 0.5) / 16 - 0.5);
            };
            planes[id][0] = z0, planes[id][1] = dx, planes[id][2] = dy;
            for (int i = 0; i < 16; ++i) {
                if (((mask >> i) & 1) == 0) continue;
                std::vector<int>& list = expected[i];
                auto at = list.begin();
                while (at != list.end() && depth(*at, i) > depth(id, i)) ++at;
                list.insert(at, id);
            }
        }
        int calls = 0;
        for (const auto& m : materials) calls += m->_calls;
        std::vector<std::vector<int>> got(16);
        for (const RsAFragment* f = buffer.getLists()[0]; f != nullptr; f = f->_next) {
            const int id = int(f->_color.r);
            if (!zBuffer) {
                got[0].push_back(id);
                EXPECT_EQ(f->_coverage, masks[id]) << "trial " << trial << ": the whole mask";
            }
            for (int i = 0; zBuffer && i < 16; ++i)
                if ((f->_coverage >> i) & 1) got[i].push_back(id);
        }
        EXPECT_EQ(got, expected) << "trial " << trial;
        EXPECT_EQ(calls, made) << "trial " << trial;
        if (HasFailure()) return;
    }
}

// The corners of a grid of cells x cells over [x0, x1) x [y0, y1) on the 1/256 pixel grid, the inner
// ones moved at random by up to a third of a cell, and its two triangles per cell, cut along either
// diagonal: a closed mesh whose triangles share every inner edge.
struct GridMesh {
    std::vector<Pt> corners;
    std::vector<std::uint32_t> triangles;
};
GridMesh jitteredGrid(std::mt19937& rng, int cells, int x0, int x1, int y0, int y1) {
    GridMesh grid;
    const i64 cw = (x1 - x0) * kPixelUnit / cells, ch = (y1 - y0) * kPixelUnit / cells;
    for (int j = 0; j <= cells; ++j)
        for (int i = 0; i <= cells; ++i) {
            const bool inner = i > 0 && i < cells && j > 0 && j < cells;
            const auto jitter = [&](i64 size) { return inner ? i64(rng() % (2 * size / 3)) - size / 3 : 0; };
            grid.corners.push_back({i == cells ? x1 * kPixelUnit : x0 * kPixelUnit + i * cw + jitter(cw),
                                    j == cells ? y1 * kPixelUnit : y0 * kPixelUnit + j * ch + jitter(ch)});
        }
    for (int j = 0; j < cells; ++j)
        for (int i = 0; i < cells; ++i) {
            const std::uint32_t a = j * (cells + 1) + i, b = a + 1, c = a + cells + 1, d = c + 1;
            const std::vector<std::uint32_t> cut = rng() % 2 ? std::vector<std::uint32_t>{a, b, d, a, d, c}
                                                             : std::vector<std::uint32_t>{a, b, c, b, d, c};
            grid.triangles.insert(grid.triangles.end(), cut.begin(), cut.end());
        }
    return grid;
}

// A closed mesh drawn straight into the buffer in both modes, on a tilted plane and transparent so
// that nothing is hidden: each pixel inside the mesh gets masks that are disjoint and together
// complete, each one outside none, and the material is shaded once per fragment.
TEST(RsABuffer, SharedEdgesGiveDisjointCompleteMasks) {
    std::mt19937 rng(9);
    for (int trial = 0; trial < 8; ++trial) {
        const GeRectangle<int> region{3, 29, -4, 18};
        const GeRectangle<int> covered{5, 27, -2, 15};
        const GridMesh grid = jitteredGrid(rng, 2 + trial, covered.x0, covered.x1, covered.y0, covered.y1);
        RsABuffer buffer(region.x0, region.y0, region.getWidth(), region.getHeight(), trial % 2 == 0, true);
        TestMaterial material(Rgba(0.5f, 0.5f, 0.5f, 0.5f));
        RsDrawContext context;
        context._transfer = RsTransferFunc::getFunction(Mode::normal);
        context._canBeOpaque = true;
        context._material = &material;
        const auto vertex = [&](std::uint32_t k) {
            const Pt p = grid.corners[k];
            return makeVertex<RsNormalVertex>(p, 0.25 + toPixels(p.x) / 64 + toPixels(p.y) / 128);
        };
        for (std::size_t t = 0; t < grid.triangles.size(); t += 3)
            buffer.rasterizeTriangle(context, vertex(grid.triangles[t]), vertex(grid.triangles[t + 1]),
                                     vertex(grid.triangles[t + 2]));
        int fragments = 0;
        for (int y = region.y0; y < region.y1; ++y)
            for (int x = region.x0; x < region.x1; ++x) {
                unsigned int all = 0;
                int count = 0;
                for (const RsAFragment* f = buffer.getLists()[(y - region.y0) * region.getWidth() + x - region.x0];
                     f != nullptr; f = f->_next, ++fragments) {
                    EXPECT_NE(f->_coverage, 0);
                    all |= f->_coverage;
                    count += std::popcount(f->_coverage);
                }
                const bool inside = covered.contains(x, y);
                EXPECT_EQ(all, inside ? 0xffffu : 0u) << x << "," << y << " trial " << trial;
                EXPECT_EQ(count, inside ? 16 : 0) << x << "," << y << " trial " << trial;
            }
        EXPECT_EQ(material._calls, fragments);
    }
}

// Overlapping transparent and opaque triangles seen in perspective, with a kernel of support 2 in
// both modes: windows drawn as one region each equal the picture drawn whole in many regions.
TEST(RsABuffer, PictureInManyRegionsEqualsEachWindowInOne) {
    std::mt19937 rng(21);
    std::uniform_real_distribution<float> xy(-3.0f, 3.0f), depth(-8.0f, -1.0f), unit(0.0f, 1.0f);
    const GeRectangle<int> rect{-20, 150, 7, 120};  // 174 x 117 with the margin: four regions
    const GeProjectiveMatrix3<double> projection = perspective(1.0, 0.5, 100.0);
    std::vector<RCShdPtr<RsGeomInstance>> instances;
    for (int i = 0; i < 24; ++i) {
        std::vector<GePoint3<float>> corners;
        for (int k = 0; k < 3; ++k) corners.emplace_back(xy(rng), xy(rng), depth(rng));
        instances.push_back(
            drawn(makeMesh(corners, {0, 1, 2}), Rgba(unit(rng), unit(rng), unit(rng), i % 2 ? 1.0f : unit(rng))));
    }
    const RCShdPtr<RsScene> scene = makeScene(instances);
    for (const bool zBuffer : {true, false}) {
        RsRenderer renderer;
        renderer.setAntialiasing(true);
        renderer.setZBuffer(zBuffer);
        renderer.setFilterKernel(RsFilterKernel::KernelParabolicPair);
        Picture whole(rect);
        renderer.render({}, projection, scene, rect, whole.guard);
        for (int k = 0; k < 4; ++k) {
            const int x0 = rect.x0 + int(rng() % (rect.getWidth() - 60)), y0 = rect.y0 + int(rng() % (rect.getHeight() - 60));
            Picture window({x0, x0 + 60, y0, y0 + 60});  // 64 x 64 with the margin: one region
            renderer.render({}, projection, scene, rect, window.guard);
            for (int y = y0; y < y0 + 60; ++y)
                for (int x = x0; x < x0 + 60; ++x)
                    expectNearRgba(window.at(x, y), whole.at(x, y), 1e-5, std::to_string(x) + "," + std::to_string(y));
            if (HasFailure()) return;
        }
    }
}

}  // namespace
}  // namespace Zr
