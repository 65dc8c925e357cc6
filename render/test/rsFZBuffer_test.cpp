// The fragment Z-buffer as a whole: its arrays and memory account, pool growth under overlap, and
// triangles drawn through its three rasterizers and resolved by finalize, against a composite of
// the covered layers computed here.
#include <gtest/gtest.h>

#include <algorithm>
#include <cfloat>
#include <vector>

#include "rsFZBufferTestSupport.h"
#include "rsImageCreatorTestSupport.h"
#include "rsTransferFunc.h"

namespace Zr {
namespace {

using namespace RsFZBufferTest;
using RsImageTest::makeTile;
using RsImageTest::pixelColour;
using Mode = SdMaterial::TransferMode;

// A new buffer: every list empty, and either a Z-buffer at the largest finite double or a closed
// map of zeros, never both. The memory account is the object, its pool, one chunk of one
// fragment per pixel, and the arrays that exist.
TEST(RsFZBuffer, NewBufferArraysAndMemoryAccount) {
    const std::pair<int, int> sizes[] = {{1, 1}, {7, 3}, {128, 128}, {0, 5}};
    for (const auto& [w, h] : sizes)
        for (bool zBuffer : {false, true}) {
            RsFZBuffer buffer(-40, 17, w, h, zBuffer, true);
            EXPECT_EQ(buffer.getPixelRegion(), GeRectangle<int>(-40, -40 + w, 17, 17 + h));
            EXPECT_EQ(buffer.hasZBuffer(), zBuffer);
            EXPECT_EQ(buffer.getZBuffer() != nullptr, zBuffer);
            EXPECT_EQ(buffer.getClosed() != nullptr, !zBuffer);
            const std::size_t n = std::size_t(w) * std::size_t(h);
            for (std::size_t i = 0; i < n; ++i) {
                ASSERT_EQ(buffer.getLists()[i], nullptr);
                if (zBuffer) {
                    ASSERT_EQ(buffer.getZBuffer()[i], DBL_MAX);
                } else {
                    ASSERT_EQ(buffer.getClosed()[i], 0);
                }
            }
            EXPECT_EQ(buffer.getPool().getChunkCount(), 1u);
            EXPECT_EQ(buffer.getPool().getFreeFragments(), n);
            const std::size_t perPixel = sizeof(RsFragment) + sizeof(RsFragment*) + (zBuffer ? sizeof(double) : 1);
            EXPECT_EQ(buffer.getMemorySize(), sizeof(RsFZBuffer) + sizeof(RsFragmentPool) + n * perPixel)
                << w << "x" << h;
        }
}

// More fragments than pixels take a second chunk of one fragment per pixel, and the account grows
// by it.
TEST(RsFZBuffer, OverlapGrowsThePoolByWholeChunks) {
    const auto material = makeShared<ScriptedMaterial>([](const RsShadingContext&) { return Rgba(1, 1, 1, 0.5f); });
    RsFZBuffer buffer(0, 0, 5, 2, true, true);
    const std::size_t before = buffer.getMemorySize();
    const RsDrawContext context = makeContext(*material, RsTransferFunc::getFunction(Mode::normal), true);
    for (int layer = 0; layer < 3; ++layer)
        for (int row = 0; row < 2; ++row) feedSpan(buffer, context, row, 0, 5, layer, 0.5 - 0.1 * layer, 0.0);
    EXPECT_EQ(material->_calls, 30);
    EXPECT_EQ(buffer.getPool().getChunkCount(), 3u);
    EXPECT_EQ(buffer.getMemorySize(), before + 2 * 10 * sizeof(RsFragment));
}

template <class Vertex>
Vertex vertexAt(double x, double y, double z) {
    Vertex v{};
    v._pixCoord = GeHomogeneousCoord3<double>(x, y, z, 1.0);
    v._w = 1.0;
    if constexpr (requires { v._normal; }) v._normal = GePoint3<double>(0.0, 0.0, 1.0);
    if constexpr (requires { v._tangent; }) {
        v._tangent = GePoint3<double>(1.0, 0.0, 0.0);
        v._binormal = GePoint3<double>(0.0, 1.0, 0.0);
    }
    return v;
}

// A rectangle of pixels x0 <= x < x1, y0 <= y < y1 at one depth, as two triangles whose edges lie
// on pixel borders, so that exactly those pixels' centres are inside.
struct Quad {
    GeRectangle<int> pixels;
    double depth;
    Rgba colour;  // straight
};

template <class Vertex>
void drawQuad(const RsFZBuffer& buffer, const RsDrawContext& context, const Quad& q) {
    const Vertex a = vertexAt<Vertex>(q.pixels.x0, q.pixels.y0, q.depth);
    const Vertex b = vertexAt<Vertex>(q.pixels.x1, q.pixels.y0, q.depth);
    const Vertex c = vertexAt<Vertex>(q.pixels.x1, q.pixels.y1, q.depth);
    const Vertex d = vertexAt<Vertex>(q.pixels.x0, q.pixels.y1, q.depth);
    buffer.rasterizeTriangle(context, a, b, c);
    buffer.rasterizeTriangle(context, a, c, d);
}

// "Over" of straight layers, far to near, onto a straight start colour; returns the straight
// result (the buffers unpremultiply).
Rgba over(const Rgba& start, const std::vector<Rgba>& layers) {
    double r = start.r * start.a, g = start.g * start.a, b = start.b * start.a, a = start.a;
    for (const Rgba& s : layers) {
        r = s.r * s.a + r * (1 - s.a);
        g = s.g * s.a + g * (1 - s.a);
        b = s.b * s.a + b * (1 - s.a);
        a = s.a + a * (1 - s.a);
    }
    return Rgba(float(r / a), float(g / a), float(b / a), float(a));
}

// Three overlapping quads, one per vertex kind and so per rasterizer, in a region away from the
// origin, resolved into a tile that is larger still. With Z the drawing order does not matter.
// Without Z it does: near to far gives the same picture, far to near lets each opaque quad hide
// whatever is drawn after it.
TEST(RsFZBuffer, TrianglesThroughAllRasterizersResolveToTheLayeredComposite) {
    const GeRectangle<int> region{100, 120, 50, 66};
    const Quad red{{102, 110, 52, 60}, 0.5, Rgba(1.0f, 0.0f, 0.0f, 1.0f)};
    const Quad green{{106, 114, 56, 64}, 0.3, Rgba(0.0f, 1.0f, 0.0f, 0.5f)};
    const Quad blue{{100, 108, 50, 58}, 0.7, Rgba(0.0f, 0.2f, 1.0f, 1.0f)};
    const Rgba fill(0.1f, 0.2f, 0.3f, 1.0f);
    const Quad* quads[] = {&red, &green, &blue};

    struct Run {
        bool zBuffer;
        std::vector<int> order;  // indices into quads
    };
    const Run runs[] = {{true, {1, 0, 2}}, {true, {2, 0, 1}}, {false, {1, 0, 2}}, {false, {2, 0, 1}}};
    for (const Run& run : runs) {
        RsFZBuffer buffer(region.x0, region.y0, region.getWidth(), region.getHeight(), run.zBuffer, true);
        const IxWriteGuard output = makeTile({4, 32}, {95, 125, 45, 70});
        buffer.setOutput(output, IxReadGuard(), fill, false, 1.0f);
        for (int i : run.order) {
            const Quad& q = *quads[i];
            const Rgba colour = q.colour;
            const auto material =
                makeShared<ScriptedMaterial>([colour](const RsShadingContext&) { return colour; });
            const RsDrawContext context = makeContext(*material, RsTransferFunc::getFunction(Mode::normal), true);
            if (i == 0) drawQuad<RsPlainVertex>(buffer, context, q);
            if (i == 1) drawQuad<RsNormalVertex>(buffer, context, q);
            if (i == 2) drawQuad<RsTangentVertex>(buffer, context, q);
        }
        buffer.finalize();

        for (int y = 45; y < 70; ++y)
            for (int x = 95; x < 125; ++x) {
                const Rgba got = pixelColour(output, x, y);
                if (!region.contains(x, y)) {
                    ASSERT_EQ(got, Rgba(0, 0, 0, 0)) << x << "," << y;
                    continue;
                }
                // Without Z: the covering quads in drawing order up to the first opaque one, the
                // last drawn farthest. With Z: the covering quads from far to near, from the
                // nearest opaque one on.
                std::vector<const Quad*> covering;
                for (int i : run.order)
                    if (quads[i]->pixels.contains(x, y)) covering.push_back(quads[i]);
                std::vector<Rgba> layers;
                if (!run.zBuffer) {
                    std::vector<Rgba> taken;
                    for (const Quad* q : covering) {
                        taken.push_back(q->colour);
                        if (q->colour.a == 1.0f) break;
                    }
                    layers.assign(taken.rbegin(), taken.rend());
                } else {
                    std::sort(covering.begin(), covering.end(),
                              [](const Quad* a, const Quad* b) { return a->depth > b->depth; });
                    for (const Quad* q : covering) {
                        if (q->colour.a == 1.0f) layers.clear();
                        layers.push_back(q->colour);
                    }
                }
                int listLength = 0;
                for (const RsFragment* f = buffer.getLists()[(y - 50) * 20 + (x - 100)]; f; f = f->_next) ++listLength;
                EXPECT_EQ(listLength, int(layers.size())) << x << "," << y;
                const Rgba want = over(fill, layers);
                EXPECT_NEAR(got.r, want.r, 1e-6f) << x << "," << y << " Z " << run.zBuffer;
                EXPECT_NEAR(got.g, want.g, 1e-6f) << x << "," << y;
                EXPECT_NEAR(got.b, want.b, 1e-6f) << x << "," << y;
                EXPECT_NEAR(got.a, want.a, 1e-6f) << x << "," << y;
            }
    }
}

}  // namespace
}  // namespace Zr
