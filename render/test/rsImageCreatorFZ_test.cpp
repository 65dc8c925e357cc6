// The resolve of fragment lists into an output tile: every output format with every kind of
// background, fill colour, accumulation, weight and unpremultiplication against a per-pixel
// reference; list order against a closed-form "over"; the finishing rules at their limits; and
// what happens on failure.
#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <deque>
#include <random>
#include <vector>

#include "exBase.h"
#include "rsImageCreatorFZ.h"
#include "rsImageCreatorTestSupport.h"
#include "rsTransferFunc.h"

namespace Zr {
namespace {

using namespace RsImageTest;
using Mode = SdMaterial::TransferMode;

// Fragment lists of a region, one head per pixel, row-major; the fragments stay where they are.
class Lists {
public:
    Lists(int width, int height) : _width(width), _heads(std::size_t(width) * std::size_t(height), nullptr) {}

    // Appends a fragment at the near end of pixel (x, y)'s list (region-relative).
    void add(int x, int y, const Rgba& colour, RsTransferFunc::Function transfer) {
        RsFragment& f = _store.emplace_back();
        f._color = colour;
        f._depth = 0.0;
        f._transfer = transfer;
        f._next = nullptr;
        RsFragment** link = &_heads[std::size_t(y) * _width + x];
        while (*link != nullptr) link = &(*link)->_next;
        *link = &f;
    }
    const RsFragment* head(int x, int y) const { return _heads[std::size_t(y) * _width + x]; }
    RsFragment* const* data() const { return _heads.data(); }

private:
    int _width;
    std::vector<RsFragment*> _heads;
    std::deque<RsFragment> _store;
};

// Random lists of up to three fragments per pixel in every mode but dissolve, whose shared random
// draws would differ between the resolve and the reference.
Lists randomLists(int width, int height, std::mt19937& rng) {
    Lists lists(width, height);
    std::uniform_int_distribution<int> count(0, 3);
    std::uniform_int_distribution<int> mode(0, SdMaterial::transferModeCount - 1);
    std::uniform_real_distribution<float> colour(-0.2f, 1.3f);
    std::uniform_real_distribution<float> alpha(0.0f, 1.2f);
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x)
            for (int n = count(rng); n > 0; --n) {
                int m = mode(rng);
                if (m == int(Mode::dissolve)) m = int(Mode::normal);
                lists.add(x, y, Rgba(colour(rng), colour(rng), colour(rng), alpha(rng)),
                          RsTransferFunc::getFunction(static_cast<Mode>(m)));
            }
    return lists;
}

// What the resolve must make of one pixel, from its straight start colour: premultiply, lay the
// list over it from the head on, scale when asked, divide by alpha when asked unless the alpha
// is at most 1e-8 in magnitude.
Rgba referencePixel(Rgba pixel, const RsFragment* list, bool scaled, float weight, bool unpremultiply) {
    pixel = Rgba(pixel.r * pixel.a, pixel.g * pixel.a, pixel.b * pixel.a, pixel.a);
    for (const RsFragment* f = list; f != nullptr; f = f->_next) {
        Rgba result(0.0f, 0.0f, 0.0f, 1.0f);
        f->_transfer(f->_color, pixel, result);
        pixel = result;
    }
    if (scaled) pixel = pixel * weight;
    if (unpremultiply) {
        const float factor = std::fabs(pixel.a) <= 1e-8f ? 0.0f : 1.0f / pixel.a;
        pixel = Rgba(pixel.r * factor, pixel.g * factor, pixel.b * factor, pixel.a);
    }
    return pixel;
}

struct BackgroundCase {
    const char* name;
    bool present;
    GeRectangle<int> rectangle;
};

// The region lies inside the output tile, and neither starts at the origin. The backgrounds cover
// it, cover part of it (cut on the left, the right, the top and the bottom), lie beside it or
// below it, or are absent.
TEST(RsImageCreatorFZ, EveryFormatBackgroundAndFillMatchesThePerPixelReference) {
    const GeRectangle<int> outputRect{-6, 14, 3, 13};
    const GeRectangle<int> region{-4, 9, 5, 11};
    const int width = region.getWidth(), height = region.getHeight();
    const BackgroundCase backgrounds[] = {
        {"none", false, {}},
        {"covering", true, {-10, 20, 0, 20}},
        {"inside", true, {-2, 5, 7, 9}},
        {"overlapping", true, {-9, 2, 8, 30}},
        {"beside", true, {9, 30, 0, 20}},
        {"below", true, {-10, 20, 11, 15}},
    };
    const Rgba fills[] = {Rgba(0.0f, 0.0f, 0.0f, 1.0f), Rgba(0.3f, 0.6f, 0.9f, 0.25f)};
    struct Weight {
        float value;
        bool scales;
    };
    const Weight weights[] = {{1.0f, false}, {std::nextafter(1.0f, 2.0f), false}, {0.5f, true}, {0.7f, true}};

    std::mt19937 rng(23);
    int formatIndex = 0;
    for (const Format& out : allFormats()) {
        ++formatIndex;
        int backgroundIndex = 0;
        for (const BackgroundCase& bg : backgrounds) {
            const Format& bgFormat = allFormats()[std::size_t(formatIndex + backgroundIndex++) % allFormats().size()];
            IxWriteGuard bgTile;
            if (bg.present) {
                bgTile = makeTile(bgFormat, bg.rectangle);
                fillRandomValues(bgTile, rng, -0.2f, 1.2f);
            }
            const IxReadGuard background = bg.present ? IxReadGuard(bgTile) : IxReadGuard();
            for (const Rgba& fill : fills)
                for (bool accumulate : {false, true})
                    for (const Weight& weight : weights)
                        for (bool unpremultiply : {false, true}) {
                            const Lists lists = randomLists(width, height, rng);
                            const IxWriteGuard output = makeTile(out, outputRect);
                            fillRandomValues(output, rng, 0.0f, 1.0f);
                            const IxWriteGuard before = makeTile(out, outputRect);
                            std::memcpy(before.getPixelAddress(outputRect.x0, outputRect.y0),
                                        output.getPixelAddress(outputRect.x0, outputRect.y0),
                                        std::size_t(output._rowStride) * outputRect.getHeight());

                            RsImageCreatorFZ::createImage(lists.data(), region, accumulate, weight.value,
                                                          unpremultiply, fill, background, output);

                            for (int y = outputRect.y0; y < outputRect.y1; ++y)
                                for (int x = outputRect.x0; x < outputRect.x1; ++x) {
                                    const bool inRegion = region.contains(x, y);
                                    Rgba expected;
                                    if (inRegion) {
                                        const Rgba start = bg.present && bg.rectangle.contains(x, y)
                                                               ? pixelColour(bgTile, x, y)
                                                               : fill;
                                        expected = referencePixel(start, lists.head(x - region.x0, y - region.y0),
                                                                  weight.scales, weight.value, unpremultiply);
                                    }
                                    for (int c = 0; c < out.comps; ++c) {
                                        const std::uint32_t old = rawChannel(before, x, y, c);
                                        const float value = channelOf(expected, rgbaIndexOf(out.comps, c));
                                        std::uint32_t want = old;
                                        if (inRegion && !accumulate) want = floatToBits(out.depth, value);
                                        if (inRegion && accumulate && expected.a != 0.0f)
                                            want = addToBits(out.depth, old, value);
                                        ASSERT_EQ(rawChannel(output, x, y, c), want)
                                            << "output " << out.comps << "x" << out.depth << ", background "
                                            << bg.name << ", accumulate " << accumulate << ", weight "
                                            << weight.value << ", unpremultiply " << unpremultiply
                                            << ", pixel " << x << "," << y << " channel " << c;
                                    }
                                }
                        }
        }
    }
}

// Three normal fragments over a background, in the order far to near, against "over" in closed
// form (in double). The head is laid first: the same fragments in reverse order give another,
// equally predictable, result.
TEST(RsImageCreatorFZ, ListOrderIsCompositingOrderFromTheHead) {
    const Format f{4, 32};
    const Rgba background(0.2f, 0.4f, 0.6f, 0.5f);
    const Rgba colours[] = {Rgba(1.0f, 0.0f, 0.0f, 0.5f), Rgba(0.0f, 1.0f, 0.0f, 0.25f), Rgba(0.1f, 0.2f, 0.9f, 0.8f)};
    const RsTransferFunc::Function normal = RsTransferFunc::getFunction(Mode::normal);
    for (bool reversed : {false, true}) {
        Lists lists(1, 1);
        for (int i = 0; i < 3; ++i) lists.add(0, 0, colours[reversed ? 2 - i : i], normal);
        const IxWriteGuard output = makeTile(f, {5, 6, 7, 8});
        for (bool unpremultiply : {false, true}) {
            RsImageCreatorFZ::createImage(lists.data(), {5, 6, 7, 8}, false, 1.0f, unpremultiply, background,
                                          IxReadGuard(), output);
            double r = background.r * background.a, g = background.g * background.a,
                   b = background.b * background.a, a = background.a;
            for (int i = 0; i < 3; ++i) {
                const Rgba& s = colours[reversed ? 2 - i : i];
                r = s.r * s.a + r * (1 - s.a);
                g = s.g * s.a + g * (1 - s.a);
                b = s.b * s.a + b * (1 - s.a);
                a = s.a + a * (1 - s.a);
            }
            const double k = unpremultiply ? 1.0 / a : 1.0;
            const Rgba got = pixelColour(output, 5, 7);
            EXPECT_NEAR(got.r, r * k, 1e-6);
            EXPECT_NEAR(got.g, g * k, 1e-6);
            EXPECT_NEAR(got.b, b * k, 1e-6);
            EXPECT_NEAR(got.a, a, 1e-6);
        }
    }
}

// A pixel without fragments is its start colour premultiplied, then weighted, then possibly
// unpremultiplied: a weight scales alpha with the colour, so the straight colour survives it; an
// alpha of at most 1e-8 gives black with the alpha kept.
TEST(RsImageCreatorFZ, FinishingRulesAtTheirLimits) {
    const Format f{4, 32};
    const float limit = std::bit_cast<float>(std::uint32_t{0x322bcc77});
    struct Case {
        Rgba start;
        float weight;
        bool unpremultiply;
        Rgba expected;
    };
    const Case cases[] = {
        {Rgba(1.0f, 1.0f, 1.0f, 0.5f), 1.0f, false, Rgba(0.5f, 0.5f, 0.5f, 0.5f)},
        {Rgba(1.0f, 1.0f, 1.0f, 0.5f), 1.0f, true, Rgba(1.0f, 1.0f, 1.0f, 0.5f)},
        {Rgba(0.5f, 0.25f, 1.0f, 1.0f), 0.5f, false, Rgba(0.25f, 0.125f, 0.5f, 0.5f)},
        {Rgba(0.5f, 0.25f, 1.0f, 1.0f), 0.5f, true, Rgba(0.5f, 0.25f, 1.0f, 0.5f)},
        {Rgba(5.0f, 5.0f, 5.0f, 1e-9f), 1.0f, true, Rgba(0.0f, 0.0f, 0.0f, 1e-9f)},
        {Rgba(5.0f, 5.0f, 5.0f, limit), 1.0f, true, Rgba(0.0f, 0.0f, 0.0f, limit)},
        {Rgba(5.0f, 5.0f, 5.0f, -limit), 1.0f, true, Rgba(0.0f, 0.0f, 0.0f, -limit)},
        {Rgba(4.0f, 4.0f, 4.0f, 0.0f), 1.0f, true, Rgba(0.0f, 0.0f, 0.0f, 0.0f)},
    };
    for (const Case& k : cases) {
        const IxWriteGuard output = makeTile(f, {0, 1, 0, 1});
        RsImageCreatorFZ::createImage(Lists(1, 1).data(), {0, 1, 0, 1}, false, k.weight, k.unpremultiply, k.start,
                                      IxReadGuard(), output);
        EXPECT_EQ(pixelColour(output, 0, 0), k.expected) << k.start << " weight " << k.weight;
    }
    // Just above the limit the colour is divided by the alpha.
    const float above = std::nextafter(limit, 1.0f);
    const IxWriteGuard output = makeTile(f, {0, 1, 0, 1});
    RsImageCreatorFZ::createImage(Lists(1, 1).data(), {0, 1, 0, 1}, false, 1.0f, true, Rgba(0.5f, 0.5f, 0.5f, above),
                                  IxReadGuard(), output);
    EXPECT_NEAR(pixelColour(output, 0, 0).r, 0.5f, 1e-6f);
}

// An output format outside the nine aborts before any pixel is written; an empty region writes
// nothing.
TEST(RsImageCreatorFZ, BadOutputFormatAbortsAndEmptyRegionWritesNothing) {
    IxTile complexTile(IxPixelFormat(IxPixelFormat::RGBA, IxPixelFormat::COMPLEX), {0, 2, 0, 2}, Rgba(0.25f, 0, 0, 0));
    const IxWriteGuard complexOut(complexTile);
    const std::vector<unsigned char> complexBefore = snapshot(complexOut);
    EXPECT_THROW(RsImageCreatorFZ::createImage(Lists(2, 2).data(), {0, 2, 0, 2}, false, 1.0f, true,
                                               Rgba(1, 1, 1, 1), IxReadGuard(), complexOut),
                 ExProgramAborted);
    EXPECT_EQ(snapshot(complexOut), complexBefore);

    std::mt19937 rng(5);
    const IxWriteGuard output = makeTile({4, 8}, {0, 4, 0, 4});
    fillRandomBits(output, rng);
    const std::vector<unsigned char> before = snapshot(output);
    for (const GeRectangle<int>& empty : {GeRectangle<int>{1, 1, 0, 4}, GeRectangle<int>{0, 4, 2, 2}})
        RsImageCreatorFZ::createImage(Lists(4, 4).data(), empty, false, 1.0f, true, Rgba(1, 1, 1, 1),
                                      IxReadGuard(output), output);
    EXPECT_EQ(snapshot(output), before);
}

// A failure inside a transfer function passes to the caller; the rows before it are written and
// those after it are not. The row buffer goes with the failure (the sanitizer build reports a
// leak otherwise).
TEST(RsImageCreatorFZ, FailureInATransferFunctionLeavesLaterRowsAlone) {
    const RsTransferFunc::Function failing = [](const Rgba&, const Rgba&, Rgba&) {
        throw ExBase("transfer", 1, "failing transfer function");
    };
    const Format f{4, 8};
    const IxWriteGuard output = makeTile(f, {0, 3, 0, 4});
    Lists lists(3, 4);
    lists.add(1, 2, Rgba(1, 1, 1, 1), failing);
    EXPECT_THROW(RsImageCreatorFZ::createImage(lists.data(), {0, 3, 0, 4}, false, 1.0f, false, Rgba(1, 1, 1, 1),
                                               IxReadGuard(), output),
                 ExBase);
    for (int y = 0; y < 4; ++y)
        for (int x = 0; x < 3; ++x) EXPECT_EQ(rawChannel(output, x, y, 0), y < 2 ? 255u : 0u) << x << "," << y;
}

}  // namespace
}  // namespace Zr
