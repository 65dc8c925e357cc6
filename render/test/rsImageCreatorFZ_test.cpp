// The resolve of fragment lists into an output tile: every output format with every kind of
// background, fill colour, accumulation, weight and unpremultiplication against a per-pixel
// reference; the unpremultiply limit; and what happens on failure.
#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <deque>
#include <random>
#include <vector>

#include "exBase.h"
#include "rsImageCreatorFZ.h"
#include "rsTestSupport.h"
#include "rsTransferFunc.h"

namespace Zr {
namespace {

using namespace RsTest;
using Mode = SdMaterial::TransferMode;

// Fragment lists of a region, one head per pixel, row-major.
struct Lists {
    Lists(int width, int height) : width(width), heads(std::size_t(width) * std::size_t(height), nullptr) {}
    // Appends a fragment at the near end of pixel (x, y)'s list (region-relative).
    void add(int x, int y, const Rgba& colour, RsTransferFunc::Function transfer) {
        RsFragment** link = &heads[std::size_t(y) * width + x];
        while (*link != nullptr) link = &(*link)->_next;
        *link = &store.emplace_back(RsFragment{colour, 0.0, transfer, nullptr});
    }
    int width;
    std::vector<RsFragment*> heads;
    std::deque<RsFragment> store;
};

// What the resolve must make of one pixel from its straight start colour: premultiply, lay the
// list over it from the head on, scale when asked, divide by alpha when asked unless the alpha is
// at most 1e-8 in magnitude.
Rgba referencePixel(Rgba pixel, const RsFragment* list, bool scaled, float weight, bool unpremultiply) {
    pixel = Rgba(pixel.r * pixel.a, pixel.g * pixel.a, pixel.b * pixel.a, pixel.a);
    for (const RsFragment* f = list; f != nullptr; f = f->_next) {
        Rgba result(0.0f, 0.0f, 0.0f, 1.0f);
        f->_transfer(f->_color, pixel, result);
        pixel = result;
    }
    if (scaled) pixel = pixel * weight;
    const float factor = !unpremultiply ? 1.0f : std::fabs(pixel.a) <= 1e-8f ? 0.0f : 1.0f / pixel.a;
    return Rgba(pixel.r * factor, pixel.g * factor, pixel.b * factor, pixel.a);
}

// The region lies inside the output tile, and neither starts at the origin. The backgrounds cover
// it, cover part of it (cut on every side), lie beside it or below it, or are absent. The lists
// hold up to three fragments in every mode but dissolve, whose random draws would differ between
// the resolve and the reference. A weight within the tolerance of one does not scale.
TEST(RsImageCreatorFZ, EveryFormatBackgroundAndFillMatchesThePerPixelReference) {
    const GeRectangle<int> outputRect{-6, 14, 3, 13}, region{-4, 9, 5, 11};
    const std::optional<GeRectangle<int>> backgrounds[] = {
        std::nullopt, GeRectangle<int>{-10, 20, 0, 20}, GeRectangle<int>{-2, 5, 7, 9},
        GeRectangle<int>{-9, 2, 8, 30}, GeRectangle<int>{9, 30, 0, 20}, GeRectangle<int>{-10, 20, 11, 15}};
    const Rgba fills[] = {Rgba(0.0f, 0.0f, 0.0f, 1.0f), Rgba(0.3f, 0.6f, 0.9f, 0.25f)};
    const std::pair<float, bool> weights[] = {
        {1.0f, false}, {std::nextafter(1.0f, 2.0f), false}, {0.5f, true}, {0.7f, true}};
    std::mt19937 rng(23);
    std::uniform_int_distribution<int> count(0, 3), mode(0, SdMaterial::transferModeCount - 1);
    std::uniform_real_distribution<float> colour(-0.2f, 1.3f), alpha(0.0f, 1.2f);
    for (std::size_t o = 0; o < allFormats().size(); ++o) {
        const Format& out = allFormats()[o];
        for (std::size_t b = 0; b < std::size(backgrounds); ++b) {
            const std::optional<GeRectangle<int>>& bg = backgrounds[b];
            IxWriteGuard bgTile;
            if (bg) bgTile = makeTile(allFormats()[(o + b + 1) % allFormats().size()], *bg);
            if (bg) fillRandomValues(bgTile, rng, -0.2f, 1.2f);
            for (const Rgba& fill : fills)
                for (bool accumulate : {false, true})
                    for (const auto& [weight, scales] : weights)
                        for (bool unpremultiply : {false, true}) {
                            Lists lists(region.getWidth(), region.getHeight());
                            for (int y = 0; y < region.getHeight(); ++y)
                                for (int x = 0; x < region.getWidth(); ++x)
                                    for (int n = count(rng); n > 0; --n) {
                                        const int m = mode(rng);
                                        lists.add(x, y, Rgba(colour(rng), colour(rng), colour(rng), alpha(rng)),
                                                  RsTransferFunc::getFunction(m == int(Mode::dissolve) ? Mode::normal
                                                                                                       : Mode(m)));
                                    }
                            const IxWriteGuard output = makeTile(out, outputRect);
                            fillRandomValues(output, rng, 0.0f, 1.0f);
                            const std::vector<unsigned char> before = snapshot(output);
                            const IxWriteGuard old = makeTile(out, outputRect);
                            std::memcpy(old.getPixelAddress(outputRect.x0, outputRect.y0), before.data(),
                                        before.size());
                            RsImageCreatorFZ::createImage(lists.heads.data(), region, accumulate, weight, unpremultiply,
                                                          fill, bg ? IxReadGuard(bgTile) : IxReadGuard(), output);
                            for (int y = outputRect.y0; y < outputRect.y1; ++y)
                                for (int x = outputRect.x0; x < outputRect.x1; ++x) {
                                    const bool inRegion = region.contains(x, y);
                                    Rgba expected;
                                    if (inRegion)
                                        expected = referencePixel(
                                            bg && bg->contains(x, y) ? pixelColour(bgTile, x, y) : fill,
                                            lists.heads[(y - region.y0) * region.getWidth() + x - region.x0], scales,
                                            weight, unpremultiply);
                                    for (int c = 0; c < out.comps; ++c) {
                                        const std::uint32_t was = rawChannel(old, x, y, c);
                                        const float value = channelOf(expected, rgbaIndexOf(out.comps, c));
                                        std::uint32_t want = was;
                                        if (inRegion && !accumulate) want = floatToBits(out.depth, value);
                                        if (inRegion && accumulate && expected.a != 0.0f)
                                            want = addToBits(out.depth, was, value);
                                        ASSERT_EQ(rawChannel(output, x, y, c), want)
                                            << "output " << out.comps << "x" << out.depth << ", background " << b
                                            << ", accumulate " << accumulate << ", weight " << weight
                                            << ", unpremultiply " << unpremultiply << ", pixel " << x << "," << y
                                            << " channel " << c;
                                    }
                                }
                        }
        }
    }
}

// An alpha of at most 1e-8 in magnitude (bits 0x322bcc77) is not divided by: the colour goes black
// and the alpha stays; just above, the colour is divided.
TEST(RsImageCreatorFZ, UnpremultiplyStopsAtItsLimit) {
    const float limit = std::bit_cast<float>(std::uint32_t{0x322bcc77});
    const std::pair<Rgba, Rgba> cases[] = {
        {Rgba(5.0f, 5.0f, 5.0f, 1e-9f), Rgba(0.0f, 0.0f, 0.0f, 1e-9f)},
        {Rgba(5.0f, 5.0f, 5.0f, limit), Rgba(0.0f, 0.0f, 0.0f, limit)},
        {Rgba(5.0f, 5.0f, 5.0f, -limit), Rgba(0.0f, 0.0f, 0.0f, -limit)},
        {Rgba(4.0f, 4.0f, 4.0f, 0.0f), Rgba(0.0f, 0.0f, 0.0f, 0.0f)},
        {Rgba(0.5f, 0.5f, 0.5f, std::nextafter(limit, 1.0f)), Rgba(0.5f, 0.5f, 0.5f, std::nextafter(limit, 1.0f))},
    };
    for (const auto& [start, expected] : cases) {
        const IxWriteGuard output = makeTile({4, 32}, {0, 1, 0, 1});
        RsImageCreatorFZ::createImage(Lists(1, 1).heads.data(), {0, 1, 0, 1}, false, 1.0f, true, start, IxReadGuard(),
                                      output);
        expectNearRgba(pixelColour(output, 0, 0), expected, expected.r == 0.0f ? 0.0 : 1e-6,
                       "start alpha " + std::to_string(start.a));
    }
}

// An output format outside the nine aborts before any pixel is written; an empty region writes
// nothing; a failing transfer function passes to the caller with the rows before it written and
// those after it not, and takes the row buffer along.
TEST(RsImageCreatorFZ, FailuresAndEmptyRegionsWriteNothingMore) {
    IxTile complexTile(IxPixelFormat(IxPixelFormat::RGBA, IxPixelFormat::COMPLEX), {0, 2, 0, 2}, Rgba(0.25f, 0, 0, 0));
    const IxWriteGuard complexOut(complexTile);
    const std::vector<unsigned char> complexBefore = snapshot(complexOut);
    EXPECT_THROW(RsImageCreatorFZ::createImage(Lists(2, 2).heads.data(), {0, 2, 0, 2}, false, 1.0f, true,
                                               Rgba(1, 1, 1, 1), IxReadGuard(), complexOut),
                 ExProgramAborted);
    EXPECT_EQ(snapshot(complexOut), complexBefore);

    std::mt19937 rng(5);
    const IxWriteGuard output = makeTile({4, 8}, {0, 4, 0, 4});
    fillRandomValues(output, rng, 0.0f, 1.0f);
    const std::vector<unsigned char> before = snapshot(output);
    for (const GeRectangle<int>& empty : {GeRectangle<int>{1, 1, 0, 4}, GeRectangle<int>{0, 4, 2, 2}})
        RsImageCreatorFZ::createImage(Lists(4, 4).heads.data(), empty, false, 1.0f, true, Rgba(1, 1, 1, 1),
                                      IxReadGuard(output), output);
    EXPECT_EQ(snapshot(output), before);

    Lists lists(3, 4);
    lists.add(1, 2, Rgba(1, 1, 1, 1), [](const Rgba&, const Rgba&, Rgba&) { throw ExBase("transfer", 1, "failing"); });
    const IxWriteGuard rows = makeTile({4, 8}, {0, 3, 0, 4});
    EXPECT_THROW(RsImageCreatorFZ::createImage(lists.heads.data(), {0, 3, 0, 4}, false, 1.0f, false, Rgba(1, 1, 1, 1),
                                               IxReadGuard(), rows),
                 ExBase);
    for (int y = 0; y < 4; ++y)
        for (int x = 0; x < 3; ++x) EXPECT_EQ(rawChannel(rows, x, y, 0), y < 2 ? 255u : 0u) << x << "," << y;
}

}  // namespace
}  // namespace Zr
