// The per-pixel lists of the fragment Z-buffer in both modes, against a brute-force model that
// states what a list must hold without building it: random spans with tied depths, opaque and
// transparent fragments, materials that can or cannot be opaque; then the named cases one by one.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <random>
#include <set>
#include <utility>
#include <vector>

#include "rsFZBufferTestSupport.h"
#include "rsTransferFunc.h"

namespace Zr {
namespace {

using namespace RsFZBufferTest;
using Mode = SdMaterial::TransferMode;

// One fragment that a span offered to a pixel.
struct Offer {
    int seq;  // arrival order at its pixel
    int id;   // span number
    int x;
    double depth;
    bool opaque;
    RsTransferFunc::Function transfer;
};

// What a pixel must hold after the offers, in list order (head first), and its depth or closed
// state.
struct Expected {
    std::vector<Offer> list;
    double nearestOpaque = RsFZBuffer::kEmptyDepth;
    bool closed = false;
    std::vector<Offer> shaded;  // the offers that were shaded, in order
};

// With Z: an offer is taken when it lies strictly before every opaque fragment taken before it. A
// taken one stays unless a later taken opaque fragment lies strictly before it. The list runs by
// depth from far to near, and at equal depth the later arrival lies farther.
Expected modelWithZ(const std::vector<Offer>& offers) {
    Expected e;
    for (const Offer& o : offers) {
        if (!(e.nearestOpaque > o.depth)) continue;
        e.shaded.push_back(o);
        if (o.opaque) e.nearestOpaque = o.depth;
    }
    for (const Offer& f : e.shaded) {
        const bool dropped = std::any_of(e.shaded.begin(), e.shaded.end(), [&](const Offer& g) {
            return g.seq > f.seq && g.opaque && g.depth < f.depth;
        });
        if (!dropped) e.list.push_back(f);
    }
    std::sort(e.list.begin(), e.list.end(), [](const Offer& a, const Offer& b) {
        return a.depth != b.depth ? a.depth > b.depth : a.seq > b.seq;
    });
    return e;
}

// Without Z: every offer is taken until a taken opaque fragment closes the pixel; the last taken
// lies at the head.
Expected modelWithoutZ(const std::vector<Offer>& offers) {
    Expected e;
    for (const Offer& o : offers) {
        if (e.closed) continue;
        e.shaded.push_back(o);
        if (o.opaque) e.closed = true;
    }
    e.list.assign(e.shaded.rbegin(), e.shaded.rend());
    return e;
}

// Runs random spans through a buffer of either mode and checks every pixel against the model
// after every span. The material answers colour (id, x, depth-derived, alpha) so that each list
// entry names the offer it came from; the shade calls are checked against the model's.
void checkAgainstModel(bool zBuffer, unsigned seed) {
    constexpr int width = 6, height = 4;
    std::mt19937 rng(seed);
    const float alphas[] = {1.0f, 1.0000001f, 0.99999994f, 1.5f, 0.5f, 0.0f, 0.8f, 1.0f};
    const double depths[] = {0.25, 0.5, 0.75, 1.0, 1.25};
    const double slopes[] = {0.0, 0.0, 0.25, -0.25};
    const RsTransferFunc::Function transfers[] = {RsTransferFunc::getFunction(Mode::normal),
                                                  RsTransferFunc::getFunction(Mode::add),
                                                  RsTransferFunc::getFunction(Mode::multiply)};
    std::map<std::pair<int, int>, float> alphaOf;  // by (span id, x)
    std::vector<std::pair<int, int>> shadeCalls;
    const auto material = makeShared<ScriptedMaterial>([&](const RsShadingContext& c) {
        const int id = spanIdOf(c), x = pixelOf(c);
        shadeCalls.emplace_back(id, x);
        return Rgba(float(id), float(x), 0.5f, alphaOf.at({id, x}));
    });

    RsFZBuffer buffer(13, -7, width, height, zBuffer, true);
    std::map<std::pair<int, int>, std::vector<Offer>> offers;  // by pixel (x, row)
    std::vector<std::pair<int, int>> expectedCalls;
    std::uniform_int_distribution<int> coin(0, 1), rowOf(0, height - 1), xOf(0, width);
    for (int id = 0; id < 120; ++id) {
        const int row = rowOf(rng);
        const int x1 = xOf(rng);
        const int x2 = std::max(x1 - 1, xOf(rng));  // sometimes empty or inverted
        const double z0 = depths[rng() % std::size(depths)];
        const double slope = slopes[rng() % std::size(slopes)];
        const bool canBeOpaque = coin(rng) == 1;
        const RsTransferFunc::Function transfer = transfers[rng() % std::size(transfers)];
        for (int x = x1; x < x2; ++x) {
            const float alpha = alphas[rng() % std::size(alphas)];
            alphaOf[{id, x}] = alpha;
            std::vector<Offer>& pixel = offers[{x, row}];
            const bool opaque = canBeOpaque && alpha != 1.5f && alpha != 0.5f && alpha != 0.0f && alpha != 0.8f;
            const Offer offer{int(pixel.size()), id, x, z0 + slope * (x - x1), opaque, transfer};
            // The shade calls the model expects from this span, in x order.
            std::vector<Offer> before = pixel;
            pixel.push_back(offer);
            const Expected was = zBuffer ? modelWithZ(before) : modelWithoutZ(before);
            const Expected now = zBuffer ? modelWithZ(pixel) : modelWithoutZ(pixel);
            if (now.shaded.size() > was.shaded.size()) expectedCalls.emplace_back(id, x);
        }
        const RsDrawContext context = makeContext(*material, transfer, canBeOpaque);
        feedSpan(buffer, context, row, x1, x2, id, z0, slope);
        ASSERT_EQ(shadeCalls, expectedCalls) << "after span " << id;

        for (int y = 0; y < height; ++y)
            for (int x = 0; x < width; ++x) {
                const auto found = offers.find({x, y});
                const Expected e = found == offers.end() ? Expected{}
                                   : zBuffer             ? modelWithZ(found->second)
                                                         : modelWithoutZ(found->second);
                std::vector<const RsFragment*> got;
                for (const RsFragment* f = buffer.getLists()[y * width + x]; f != nullptr; f = f->_next)
                    got.push_back(f);
                ASSERT_EQ(got.size(), e.list.size()) << "pixel " << x << "," << y << " after span " << id;
                for (std::size_t i = 0; i < got.size(); ++i) {
                    EXPECT_EQ(int(got[i]->_color.r), e.list[i].id) << "pixel " << x << "," << y << " entry " << i;
                    EXPECT_EQ(int(got[i]->_color.g), e.list[i].x);
                    EXPECT_EQ(got[i]->_depth, e.list[i].depth);
                    EXPECT_EQ(got[i]->_transfer, e.list[i].transfer);
                }
                if (zBuffer) {
                    ASSERT_EQ(buffer.getZBuffer()[y * width + x], e.nearestOpaque);
                } else {
                    ASSERT_EQ(buffer.getClosed()[y * width + x] != 0, e.closed);
                }
            }
    }
}

TEST(RsFZBufferLists, WithZMatchTheModel) {
    for (unsigned seed = 1; seed <= 12; ++seed) checkAgainstModel(true, seed);
}

TEST(RsFZBufferLists, WithoutZMatchTheModel) {
    for (unsigned seed = 1; seed <= 12; ++seed) checkAgainstModel(false, seed);
}

// The depths and transparency of one pixel's list, head first.
std::vector<std::pair<double, float>> listOf(const RsFZBuffer& buffer, int index) {
    std::vector<std::pair<double, float>> out;
    for (const RsFragment* f = buffer.getLists()[index]; f != nullptr; f = f->_next)
        out.emplace_back(f->_depth, f->_color.a);
    return out;
}

// The named cases of the mode with Z, on pixel 0 of a one-pixel buffer: each is a sequence of
// (depth, alpha) offers from materials that can be opaque, the resulting list and the number of
// shade calls.
TEST(RsFZBufferLists, NamedCasesWithZ) {
    struct Case {
        const char* name;
        std::vector<std::pair<double, float>> offers;
        std::vector<std::pair<double, float>> list;
        int shaded;
    };
    const Case cases[] = {
        {"opaque in front of three transparent cuts them, nearer ones stay",
         {{0.9, 0.5f}, {0.8, 0.5f}, {0.7, 0.5f}, {0.2, 0.5f}, {0.5, 1.0f}},
         {{0.5, 1.0f}, {0.2, 0.5f}},
         5},
        {"later fragment behind, or at, the opaque depth is not shaded",
         {{0.5, 1.0f}, {0.6, 0.5f}, {0.5, 0.5f}, {0.4, 0.5f}},
         {{0.5, 1.0f}, {0.4, 0.5f}},
         2},
        {"at equal depth the newcomer lies farther",
         {{0.5, 0.25f}, {0.5, 0.5f}, {0.5, 0.75f}},
         {{0.5, 0.75f}, {0.5, 0.5f}, {0.5, 0.25f}},
         3},
        {"opaque at the depth of transparent ones keeps them, on top",
         {{0.5, 0.25f}, {0.5, 1.0f}, {0.3, 0.5f}},
         {{0.5, 1.0f}, {0.5, 0.25f}, {0.3, 0.5f}},
         3},
        {"alpha 1.0000001 is opaque",
         {{0.5, 0.5f}, {0.4, 1.0000001f}, {0.45, 0.5f}},
         {{0.4, 1.0000001f}},
         2},
        {"alpha 1.5 is not opaque",
         {{0.5, 0.5f}, {0.4, 1.5f}, {0.45, 0.5f}},
         {{0.5, 0.5f}, {0.45, 0.5f}, {0.4, 1.5f}},
         3},
    };
    for (const Case& k : cases) {
        std::size_t next = 0;
        const auto material = makeShared<ScriptedMaterial>(
            [&](const RsShadingContext&) { return Rgba(0, 0, 0, k.offers[next].second); });
        RsFZBuffer buffer(0, 0, 1, 1, true, true);
        const RsDrawContext context = makeContext(*material, RsTransferFunc::getFunction(Mode::normal), true);
        for (; next < k.offers.size(); ++next) feedSpan(buffer, context, 0, 0, 1, 0, k.offers[next].first, 0.0);
        EXPECT_EQ(listOf(buffer, 0), k.list) << k.name;
        EXPECT_EQ(material->_calls, k.shaded) << k.name;
    }
}

// The opaque test at its edges, in both modes: a pixel closes (without Z) or records its depth
// (with Z) only for a material that can be opaque and an alpha that is one within the tolerance.
TEST(RsFZBufferLists, OpaqueToleranceInBothModes) {
    const std::pair<float, bool> alphas[] = {{1.0f, true},        {1.0000001f, true}, {0.99999994f, true},
                                             {0.9999999f, true},  {1.5f, false},      {1.0000003f, false},
                                             {0.999f, false},     {0.0f, false}};
    for (const auto& [alpha, opaque] : alphas)
        for (bool canBeOpaque : {false, true})
            for (bool zBuffer : {false, true}) {
                const float a = alpha;
                const auto material = makeShared<ScriptedMaterial>([a](const RsShadingContext&) { return Rgba(0, 0, 0, a); });
                RsFZBuffer buffer(0, 0, 2, 1, zBuffer, true);
                feedSpan(buffer, makeContext(*material, RsTransferFunc::getFunction(Mode::normal), canBeOpaque), 0, 0, 2, 0,
                         0.5, 0.0);
                const bool closes = canBeOpaque && opaque;
                for (int x = 0; x < 2; ++x) {
                    if (zBuffer) {
                        EXPECT_EQ(buffer.getZBuffer()[x], closes ? 0.5 : RsFZBuffer::kEmptyDepth) << alpha;
                    } else {
                        EXPECT_EQ(buffer.getClosed()[x] != 0, closes) << alpha << " canBeOpaque " << canBeOpaque;
                    }
                }
                // A second fragment behind: taken only where nothing closed the pixel.
                feedSpan(buffer, makeContext(*material, RsTransferFunc::getFunction(Mode::normal), canBeOpaque), 0, 0, 2, 1,
                         0.75, 0.0);
                EXPECT_EQ(material->_calls, closes ? 2 : 4) << alpha << " canBeOpaque " << canBeOpaque << " Z " << zBuffer;
            }
}

// An empty or inverted span touches nothing and shades nothing.
TEST(RsFZBufferLists, EmptySpanTouchesNothing) {
    for (bool zBuffer : {false, true}) {
        const auto material = makeShared<ScriptedMaterial>([](const RsShadingContext&) { return Rgba(0, 0, 0, 1); });
        RsFZBuffer buffer(0, 0, 4, 2, zBuffer, true);
        const RsDrawContext context = makeContext(*material, RsTransferFunc::getFunction(Mode::normal), true);
        feedSpan(buffer, context, 1, 2, 2, 0, 0.5, 0.0);
        feedSpan(buffer, context, 0, 3, 1, 0, 0.5, 0.0);
        EXPECT_EQ(material->_calls, 0);
        for (int i = 0; i < 8; ++i) EXPECT_EQ(buffer.getLists()[i], nullptr);
    }
}

}  // namespace
}  // namespace Zr
