// The resolve of A-buffer lists: random lists over random backgrounds, resolved with every kernel,
// weight, accumulation and unpremultiplication, against the per-sample reference of the test
// support; the normalising sum of a kernel with negative weights; and the kernels' readable names.
#include <gtest/gtest.h>

#include <cctype>
#include <deque>
#include <random>
#include <set>
#include <string>

#include "rsFilterKernelNames.h"
#include "rsFilterTable.h"
#include "rsImageCreatorA.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;
using Mode = SdMaterial::TransferMode;

// Random regions, some narrower or lower than the kernel's reach, with lists of up to four
// fragments of random masks and modes; backgrounds that cover all, part or none of the region, or
// none at all; an output tile of random values. Only the pixels at least the support inside the
// region change: to the filtered samples, divided by alpha when asked, then weighted, and added
// to what was there when accumulating (unless the alpha is zero).
TEST(RsImageCreatorA, ListsResolveAsTheirSamplesFiltered) {
    std::mt19937 rng(17);
    std::uniform_real_distribution<float> unit(0.0f, 1.0f), alpha(0.3f, 1.0f);
    const Mode modes[] = {Mode::normal, Mode::add, Mode::multiply, Mode::screen, Mode::subtract};
    const auto randomColour = [&] { return Rgba(unit(rng), unit(rng), unit(rng), alpha(rng)); };
    for (int trial = 0; trial < 60; ++trial) {
        const RsFilterKernel kernel(static_cast<RsFilterKernel::KernelType>(trial % 10));
        const int s = kernel.getKernelSupport();
        const int x0 = int(rng() % 9) - 4, y0 = int(rng() % 9) - 4;
        const GeRectangle<int> region{x0, x0 + 1 + int(rng() % 12), y0, y0 + 1 + int(rng() % 12)};
        const int width = region.getWidth();

        std::deque<RsAFragment> store;
        std::vector<RsAFragment*> lists(std::size_t(region.getArea()), nullptr);
        for (RsAFragment*& head : lists)
            for (int k = int(rng() % 5); k > 0; --k) {
                const auto mask = static_cast<std::uint16_t>(1 + rng() % 0xffff);
                head = &store.emplace_back(
                    RsAFragment{randomColour(), 0, 0, 0, 0, 0, mask, RsTransferFunc::getFunction(modes[rng() % 5]), head});
            }

        const int bx = x0 + int(rng() % 12) - 4, by = y0 + int(rng() % 12) - 4;
        const GeRectangle<int> backgroundRect{bx, bx + 1 + int(rng() % 10), by, by + 1 + int(rng() % 10)};
        const bool hasBackground = trial % 4 != 0;
        const IxWriteGuard backgroundTile = makeTile({4, 32}, backgroundRect);
        fillRandomValues(backgroundTile, rng, 0.3f, 1.0f);
        const IxReadGuard background = hasBackground ? IxReadGuard(backgroundTile) : IxReadGuard();
        const Rgba fill = randomColour();
        const float weight = trial % 3 == 0 ? 1.0f : 0.25f + unit(rng);
        const bool unpremultiply = rng() % 2, accumulate = rng() % 2;
        const IxWriteGuard output = makeTile({4, 32}, {x0 - 2, region.x1 + 2, y0 - 2, region.y1 + 2});
        fillRandomValues(output, rng, -1.0f, 1.0f);
        const std::vector<unsigned char> before = snapshot(output);

        SampleGrid grid(region);
        for (int y = region.y0; y < region.y1; ++y)
            for (int x = region.x0; x < region.x1; ++x) {
                const Rgba start = hasBackground && backgroundRect.contains(x, y) ? pixelColour(backgroundTile, x, y) : fill;
                for (int i = 0; i < 16; ++i) {
                    Rgba colour = premultiplied(start);
                    for (const RsAFragment* f = lists[std::size_t(y - y0) * width + (x - x0)]; f; f = f->_next)
                        if ((f->_coverage >> i) & 1) {
                            Rgba result;
                            f->_transfer(f->_color, colour, result);
                            colour = result;
                        }
                    grid.at(x, y, i) = colour;
                }
            }
        Picture previous(output._rectangle);
        std::copy(before.begin(), before.end(), previous.guard.getPixelAddress(output._rectangle.x0, output._rectangle.y0));

        RsImageCreatorA::createImage(lists.data(), region, kernel, accumulate, weight, unpremultiply, fill, background,
                                     output);
        const GeRectangle<int>& all = output._rectangle;
        for (int y = all.y0; y < all.y1; ++y)
            for (int x = all.x0; x < all.x1; ++x) {
                const Rgba old = previous.at(x, y);
                Rgba want = old;
                if (x >= region.x0 + s && x < region.x1 - s && y >= region.y0 + s && y < region.y1 - s) {
                    Rgba value = filterAt(grid, kernel, x, y);
                    if (unpremultiply) value = straight(value);
                    if (weight != 1.0f) value = value * weight;
                    want = !accumulate ? value : value.a == 0.0f ? old : old + value;
                }
                expectNearRgba(pixelColour(output, x, y), want, 2e-5,
                               "trial " + std::to_string(trial) + " at " + std::to_string(x) + "," + std::to_string(y));
            }
        if (HasFailure()) return;
    }
}

// None of the ten kernels has negative weights; the normalising sum of one that had them takes off
// all of its negative weight when the positive one is more than three times as large, and less of
// it the nearer the two are.
TEST(RsFilterTable, NormalisingSumOfNegativeWeights) {
    const struct {
        float positive, negative, sum;
    } cases[] = {{5, 0, 5}, {8, 2, 6}, {3, 1, 2}, {4, 2, 2.6f}, {1, 2, 0.2f}, {2, 2, 1.2f}};
    for (const auto& c : cases)
        EXPECT_NEAR(RsFilterTable::normalisingSum(c.positive, c.negative), c.sum, 1e-6)
            << c.positive << " " << c.negative;
}

// Each kernel has one lower-case name that leads back to it; nothing else names a kernel.
TEST(RsFilterKernelNames, EachKernelHasOneNameThatLeadsBack) {
    std::set<std::string> seen;
    for (int t = 0; t < RsFilterKernel::nbKernelTypes; ++t) {
        const auto type = static_cast<RsFilterKernel::KernelType>(t);
        const std::string name = RsFilterKernelNames::nameOf(type);
        EXPECT_EQ(RsFilterKernelNames::typeOf(name), type);
        EXPECT_TRUE(seen.insert(name).second) << name;
        for (const char ch : name) EXPECT_TRUE(std::islower(ch) || ch == '-' || std::isdigit(ch)) << name;
    }
    EXPECT_EQ(RsFilterKernelNames::nameOf(static_cast<RsFilterKernel::KernelType>(10)), nullptr);
    EXPECT_EQ(RsFilterKernelNames::typeOf("Box"), std::nullopt);
    EXPECT_EQ(RsFilterKernelNames::typeOf(""), std::nullopt);
}

}  // namespace
}  // namespace Zr
