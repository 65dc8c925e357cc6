// The fragment Z-buffer: per-pixel lists in both modes against a model that states what a list
// must hold without building it, and what a factory hands the buffers it makes.
//
// Hand-made spans tell the material which fragment it shades through the eye position, which runs
// (x, id, 0) along the span (x the region-relative pixel, id the span's number); the depth starts
// at z0 and changes by slope per pixel. Binary fractions keep every depth exact.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <random>
#include <vector>

#include "rsDrawContext.h"
#include "rsFZBuffer.h"
#include "rsFZBufferFactory.h"
#include "rsTestSupport.h"
#include "rsTransferFunc.h"

namespace Zr {
namespace {

using namespace RsTest;
using Mode = SdMaterial::TransferMode;

RsDrawContext makeContext(RsMaterialShader& material, RsTransferFunc::Function transfer, bool canBeOpaque) {
    RsDrawContext context;
    context._transfer = transfer;
    context._canBeOpaque = canBeOpaque;
    context._material = &material;
    return context;
}

// Feeds the pixels [x1, x2) of region-relative row `row` to the span method of the buffer's mode.
void feedSpan(RsFZBuffer& buffer, const RsDrawContext& context, int row, int x1, int x2, int id, double z0,
              double slope) {
    RsPixelData<RsPlainVertex> data{};
    data._w._q = 1.0;
    data._z._q = z0;
    data._z._dq_dx = slope;
    data._eyeCoord._q = GePoint3<float>(static_cast<float>(x1), static_cast<float>(id), 0.0f);
    data._eyeCoord._dq_dx = GePoint3<float>(1.0f, 0.0f, 0.0f);
    if (buffer.hasZBuffer()) buffer.drawSpanZ(context, row, {x1, x2}, data);
    else buffer.drawSpanNoZ(context, row, {x1, x2}, data);
}

// One fragment that a span offered to a pixel.
struct Offer {
    int seq, id, x;  // arrival order at its pixel, span number, pixel
    double depth;
    bool opaque;
    RsTransferFunc::Function transfer;
};

// What a pixel must hold after its offers, head first, with the offers shaded in order.
struct Expected {
    std::vector<Offer> list, shaded;
    double nearestOpaque = RsFZBuffer::kEmptyDepth;
    bool closed = false;
};

// With Z, an offer is taken when it lies strictly before every opaque fragment taken before it; a
// taken one stays unless a later taken opaque one lies strictly before it; the list runs from far
// to near, and at equal depth the later arrival lies farther. Without Z, every offer is taken
// until a taken opaque one closes the pixel, and the last taken lies at the head.
Expected model(bool zBuffer, const std::vector<Offer>& offers) {
    Expected e;
    for (const Offer& o : offers) {
        if (zBuffer ? !(e.nearestOpaque > o.depth) : e.closed) continue;
        e.shaded.push_back(o);
        if (o.opaque) zBuffer ? void(e.nearestOpaque = o.depth) : void(e.closed = true);
    }
    if (!zBuffer) {
        e.list.assign(e.shaded.rbegin(), e.shaded.rend());
        return e;
    }
    for (const Offer& f : e.shaded)
        if (std::none_of(e.shaded.begin(), e.shaded.end(),
                         [&](const Offer& g) { return g.seq > f.seq && g.opaque && g.depth < f.depth; }))
            e.list.push_back(f);
    std::sort(e.list.begin(), e.list.end(),
              [](const Offer& a, const Offer& b) { return a.depth != b.depth ? a.depth > b.depth : a.seq > b.seq; });
    return e;
}

// Random spans (some empty or inverted) with tied depths, opaque and transparent alphas on both
// sides of the float tolerance of one, materials that can or cannot be opaque, and three transfer
// functions. After every span the shade calls, each pixel's list and its depth or closed state
// match the model. The material answers (id, x, 0.5, alpha) so that an entry names its offer.
TEST(RsFZBuffer, ListsMatchTheModelInBothModes) {
    constexpr int width = 6, height = 4;
    const std::pair<float, bool> alphas[] = {{1.0f, true}, {1.0000001f, true}, {0.99999994f, true}, {0.9999999f, true},
                                             {1.5f, false}, {1.0000003f, false}, {0.999f, false}, {0.0f, false},
                                             {0.5f, false}, {1.0f, true}};
    const double depths[] = {0.25, 0.5, 0.75, 1.0, 1.25}, slopes[] = {0.0, 0.0, 0.25, -0.25};
    const RsTransferFunc::Function transfers[] = {RsTransferFunc::getFunction(Mode::normal),
                                                  RsTransferFunc::getFunction(Mode::add),
                                                  RsTransferFunc::getFunction(Mode::multiply)};
    for (bool zBuffer : {true, false})
        for (unsigned seed = 1; seed <= 12; ++seed) {
            std::mt19937 rng(seed);
            std::map<std::pair<int, int>, float> alphaOf;  // by (span id, x)
            std::vector<std::pair<int, int>> shadeCalls, expectedCalls;
            MaterialSettings settings;
            settings.probe = [&](const RsShadingContext& c) {
                const int id = static_cast<int>(c._eyeCoord.y), x = static_cast<int>(c._eyeCoord.x);
                shadeCalls.emplace_back(id, x);
                return Rgba(float(id), float(x), 0.5f, alphaOf.at({id, x}));
            };
            TestMaterial material(settings);
            RsFZBuffer buffer(13, -7, width, height, zBuffer, true);
            std::map<std::pair<int, int>, std::vector<Offer>> offers;  // by pixel (x, row)
            std::uniform_int_distribution<int> coin(0, 1), rowOf(0, height - 1), xOf(0, width);
            for (int id = 0; id < 120; ++id) {
                const int row = rowOf(rng), x1 = xOf(rng), x2 = std::max(x1 - 1, xOf(rng));
                const double z0 = depths[rng() % std::size(depths)], slope = slopes[rng() % std::size(slopes)];
                const bool canBeOpaque = coin(rng) == 1;
                const RsTransferFunc::Function transfer = transfers[rng() % std::size(transfers)];
                for (int x = x1; x < x2; ++x) {
                    const auto& [alpha, one] = alphas[rng() % std::size(alphas)];
                    alphaOf[{id, x}] = alpha;
                    std::vector<Offer>& pixel = offers[{x, row}];
                    const std::size_t shadedBefore = model(zBuffer, pixel).shaded.size();
                    pixel.push_back({int(pixel.size()), id, x, z0 + slope * (x - x1), canBeOpaque && one, transfer});
                    if (model(zBuffer, pixel).shaded.size() > shadedBefore) expectedCalls.emplace_back(id, x);
                }
                feedSpan(buffer, makeContext(material, transfer, canBeOpaque), row, x1, x2, id, z0, slope);
                ASSERT_EQ(shadeCalls, expectedCalls) << "after span " << id;
                for (int y = 0; y < height; ++y)
                    for (int x = 0; x < width; ++x) {
                        const Expected e = model(zBuffer, offers[{x, y}]);
                        std::vector<const RsFragment*> got;
                        for (const RsFragment* f = buffer.getLists()[y * width + x]; f != nullptr; f = f->_next)
                            got.push_back(f);
                        ASSERT_EQ(got.size(), e.list.size()) << "pixel " << x << "," << y << " after span " << id;
                        for (std::size_t i = 0; i < got.size(); ++i) {
                            EXPECT_EQ(int(got[i]->_color.r), e.list[i].id)
                                << "pixel " << x << "," << y << " entry " << i;
                            EXPECT_EQ(int(got[i]->_color.g), e.list[i].x);
                            EXPECT_EQ(got[i]->_depth, e.list[i].depth);
                            EXPECT_EQ(got[i]->_transfer, e.list[i].transfer);
                        }
                        if (zBuffer) ASSERT_EQ(buffer.getZBuffer()[y * width + x], e.nearestOpaque);
                        else ASSERT_EQ(buffer.getClosed()[y * width + x] != 0, e.closed);
                    }
            }
        }
}

// A factory's buffers cover the region asked for in the factory's depth mode, and resolve with
// what the factory was given: output, background, fill colour, accumulation, weight and
// unpremultiplication. An empty buffer resolves to its start colours (background where it covers,
// fill elsewhere) premultiplied, weighted, perhaps unpremultiplied, replaced or added. A buffer
// keeps the output it was made with.
TEST(RsFZBufferFactory, BuffersTakeTheFactorysRegionModeAndSettings) {
    const Rgba fill(0.2f, 0.4f, 0.6f, 0.5f), bgColour(1.0f, 0.5f, 0.25f, 0.5f), initial(0.125f, 0.125f, 0.125f, 0.125f);
    const IxWriteGuard bgTile = makeTile({4, 32}, {10, 14, 0, 100}, bgColour);
    for (bool accumulate : {false, true})
        for (float weight : {1.0f, 0.5f})
            for (bool unpremultiply : {false, true}) {
                const IxWriteGuard output = makeTile({4, 32}, {0, 20, 0, 6}, initial);
                RsFZBufferFactory factory;
                factory.setZBuffer(accumulate);
                factory.setOutput(output, accumulate, weight);
                factory.setFillColor(fill);
                factory.setBackground(IxReadGuard(bgTile));
                factory.setUnpremultiply(unpremultiply);
                EXPECT_EQ(factory.getPixelRegion(), GeRectangle<int>(0, 20, 0, 6));
                const RCShdPtr<RsFZBuffer> buffer = factory.createBuffer({8, 16, 2, 5});
                EXPECT_EQ(buffer->getPixelRegion(), GeRectangle<int>(8, 16, 2, 5));
                EXPECT_EQ(buffer->hasZBuffer(), accumulate);
                factory.setOutput(makeTile({4, 32}, {0, 20, 0, 6}), false, 1.0f);
                buffer->finalize();
                for (int y = 0; y < 6; ++y)
                    for (int x = 0; x < 20; ++x) {
                        Rgba want = initial;
                        if (x >= 8 && x < 16 && y >= 2 && y < 5) {
                            const Rgba s = x >= 10 && x < 14 ? bgColour : fill;
                            Rgba pixel(s.r * s.a * weight, s.g * s.a * weight, s.b * s.a * weight, s.a * weight);
                            if (unpremultiply) pixel = Rgba(s.r, s.g, s.b, pixel.a);
                            want = accumulate ? initial + pixel : pixel;
                        }
                        expectNearRgba(pixelColour(output, x, y), want, 1e-6,
                                       std::to_string(x) + "," + std::to_string(y));
                    }
            }
}

}  // namespace
}  // namespace Zr
