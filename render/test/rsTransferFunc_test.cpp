// Transfer functions: every blending mode against a double-precision formula table over a grid of
// colours and over inexact ones, the colour-space modes against a hexcone conversion written
// here; screen's double precision, results written over the destination, dissolve's draws, and
// the mode tables.
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <cstdint>
#include <functional>
#include <vector>

#include "rsTestSupport.h"
#include "rsTransferFunc.h"

namespace Zr {
namespace {

using Mode = SdMaterial::TransferMode;
using D = double;

struct Ref {  // a colour in double for the reference formulas
    double c[3], a;
};

using Bits = std::array<std::uint32_t, 4>;  // a colour's exact bits

// ---- An independent hexcone conversion, hue in degrees ------------------------------------------

struct Hsv { double h, s, v; };

Hsv referenceRgbToHsv(const double c[3]) {
    const double hi = std::max({c[0], c[1], c[2]}), lo = std::min({c[0], c[1], c[2]}), delta = hi - lo;
    Hsv out{0.0, hi > 0.0 ? delta / hi : 0.0, hi};
    if (delta > 0.0) {
        const double h = hi == c[0]   ? (c[1] - c[2]) / delta
                         : hi == c[1] ? 2.0 + (c[2] - c[0]) / delta
                                      : 4.0 + (c[0] - c[1]) / delta;
        out.h = h < 0.0 ? h * 60.0 + 360.0 : h * 60.0;
    }
    return out;
}

void referenceHsvToRgb(const Hsv& x, double out[3]) {
    const double chroma = x.v * x.s, sector = std::fmod(x.h / 60.0, 6.0);
    const double rise = chroma * (1.0 - std::fabs(std::fmod(sector, 2.0) - 1.0));
    // Per sector: which of r, g, b gets the chroma and which the rise.
    const int peak[6] = {0, 1, 1, 2, 2, 0}, rising[6] = {1, 0, 2, 1, 0, 2};
    const int k = std::min(5, static_cast<int>(sector));
    out[0] = out[1] = out[2] = x.v - chroma;
    out[peak[k]] += chroma;
    out[rising[k]] += rise;
}

// The measures of the colour-space modes: a grey colour has value 0 and saturation 0.
double measureValue(const double c[3]) {
    const double hi = std::max({c[0], c[1], c[2]}), lo = std::min({c[0], c[1], c[2]});
    return lo < hi ? hi : 0.0;
}
double measureSat(const double c[3]) {
    const double hi = std::max({c[0], c[1], c[2]}), lo = std::min({c[0], c[1], c[2]});
    return lo < hi ? (hi - lo) / hi : 0.0;
}

// ---- The formula table ---------------------------------------------------------------------------

double over(double sa, double da) { return sa + (1.0 - sa) * da; }

// A mode whose colour channel depends on that channel alone.
using ChannelRule = std::function<double(D s, D d, D sa, D da)>;

// The frame of softlight and the colour-space modes: blended colour x weighted by da, plus the
// premultiplied destination weighted by (1 - sa) and by da again.
Ref frame(const Ref& src, const Ref& dst, const double x[3]) {
    Ref out{};
    for (int i = 0; i < 3; ++i)
        out.c[i] = (src.c[i] + (x[i] - src.c[i]) * dst.a) * src.a + dst.c[i] * (1.0 - src.a) * dst.a;
    out.a = over(src.a, dst.a);
    return out;
}

// The destination divided by its alpha, black for alpha 0.
void straight(const Ref& dst, double out[3]) {
    for (int i = 0; i < 3; ++i) out[i] = dst.a == 0.0 ? 0.0 : dst.c[i] / dst.a;
}

Ref referenceSoftlight(const Ref& src, const Ref& dst) {
    double d[3], x[3];
    straight(dst, d);
    for (int i = 0; i < 3; ++i) {
        const double s = src.c[i], e = std::max(0.0, d[i]);
        x[i] = s < 0.5 ? d[i] * (2.0 * s * (1.0 - d[i]) + d[i]) : (2.0 * s - 1.0) * (std::sqrt(e) - e) + e;
    }
    return frame(src, dst, x);
}

// Which colour gives each of hue, saturation and value in a colour-space mode, and whether its own
// HSV component or the mode's measure is used.
enum class Take { fromSource, fromDestination, measureSource, measureDestination };

Ref referenceColourSpace(const Ref& src, const Ref& dst, Take hue, Take sat, Take value) {
    double d[3];
    straight(dst, d);
    const Hsv hs = referenceRgbToHsv(src.c), hd = referenceRgbToHsv(d);
    auto pick = [&](Take t, double Hsv::*component, double (*measure)(const double*)) {
        return t == Take::fromSource ? hs.*component : t == Take::fromDestination ? hd.*component
               : t == Take::measureSource ? measure(src.c) : measure(d);
    };
    double x[3];
    referenceHsvToRgb({pick(hue, &Hsv::h, nullptr), pick(sat, &Hsv::s, measureSat), pick(value, &Hsv::v, measureValue)},
                      x);
    return frame(src, dst, x);
}

struct ModeCase {
    Mode mode;
    bool colourSpace;  // needs colours that a hexcone conversion handles (no negative channels)
    std::function<Ref(const Ref&, const Ref&)> reference;
};

std::vector<ModeCase> referenceTable() {
    auto rule = [](Mode m, ChannelRule r) {
        return ModeCase{m, false, [r](const Ref& s, const Ref& d) {
                            Ref out{
                                {r(s.c[0], d.c[0], s.a, d.a), r(s.c[1], d.c[1], s.a, d.a), r(s.c[2], d.c[2], s.a, d.a)},
                                over(s.a, d.a)};
                            return out;
                        }};
    };
    auto hsv = [](Mode m, Take h, Take s, Take v) {
        return ModeCase{m, true, [=](const Ref& a, const Ref& b) { return referenceColourSpace(a, b, h, s, v); }};
    };
    const auto srcOver = [](double s, double d, double sa) { return s * sa + d * (1.0 - sa); };
    const auto dark = [](D s, D d, D sa, D da) { return (1.0 - sa) * d + sa * s * (1.0 - da + d); };
    const auto light = [](double s, double d, double sa) { return d + sa * s * (1.0 - d); };
    return {
        rule(Mode::normal, [=](D s, D d, D sa, D) { return srcOver(s, d, sa); }),
        rule(Mode::lumapremul, [](D s, D d, D sa, D) { return s + (1.0 - sa) * d; }),
        rule(Mode::add, [](D s, D d, D sa, D) { return d + sa * s; }),
        rule(Mode::subtract, [](D s, D d, D sa, D da) { return d - (2.0 * da - 1.0) * sa * s; }),
        rule(Mode::multiply, dark),
        rule(Mode::spotlight, [](D s, D d, D sa, D da) { return (1.0 - sa) * d + sa * s * (1.0 - da + 2.0 * d); }),
        rule(Mode::spotlightBlend, [](D s, D d, D sa, D da) { return d + sa * s * (1.0 - da + d); }),
        rule(Mode::screen, [](D s, D d, D sa, D) { return d + sa * s * (1.0 - std::min(d, 1.0)); }),
        rule(Mode::overlay, [=](D s, D d, D sa, D da) { return d < da / 2.0 ? dark(s, d, sa, da) : light(s, d, sa); }),
        {Mode::softlight, false, referenceSoftlight},
        rule(Mode::hardlight, [=](D s, D d, D sa, D da) { return s < 0.5 ? dark(s, d, sa, da) : light(s, d, sa); }),
        rule(Mode::darken,
             [=](D s, D d, D sa, D da) { return d < s * da ? d + sa * s * (1.0 - da) : srcOver(s, d, sa); }),
        rule(Mode::lighten,
             [=](D s, D d, D sa, D da) { return s * da < d ? d + sa * s * (1.0 - da) : srcOver(s, d, sa); }),
        rule(Mode::difference, [](D s, D d, D sa, D da) {
            return s * da < d ? d - (2.0 * da - 1.0) * sa * s : (1.0 - 2.0 * sa) * d + sa * s; }),
        rule(Mode::exclusion, [](D s, D d, D sa, D) { return d + sa * s * (1.0 - 2.0 * d); }),
        hsv(Mode::hue, Take::fromSource, Take::measureDestination, Take::measureDestination),
        hsv(Mode::saturation, Take::fromDestination, Take::measureSource, Take::fromDestination),
        hsv(Mode::color, Take::fromSource, Take::fromSource, Take::measureDestination),
        hsv(Mode::luminance, Take::fromDestination, Take::fromDestination, Take::measureSource),
    };
}

// Runs the mode on one pair against its reference within a relative tolerance; reports the first
// few mismatches of a mode in full.
void expectReference(const ModeCase& m, const Rgba& src, const Rgba& dst, double tolerance, int& failures) {
    Rgba got(-9.0f, -9.0f, -9.0f, -9.0f);
    RsTransferFunc::getFunction(m.mode)(src, dst, got);
    const Ref want = m.reference(Ref{{src.r, src.g, src.b}, src.a}, Ref{{dst.r, dst.g, dst.b}, dst.a});
    auto near = [tolerance](double g, double w) { return std::fabs(g - w) <= tolerance * std::max(1.0, std::fabs(w)); };
    if (near(got.r, want.c[0]) && near(got.g, want.c[1]) && near(got.b, want.c[2]) && near(got.a, want.a)) return;
    if (++failures <= 5)
        ADD_FAILURE() << "mode " << int(m.mode) << " source " << src << " destination " << dst << " gave " << got
                      << ", expected (" << want.c[0] << ", " << want.c[1] << ", " << want.c[2] << ", " << want.a << ")";
}

// Channels on a grid of values with few significant bits, so that every branch decides the same
// in float and in double: black, white, greys, two equal channels, values above 1 and (last two)
// a negative channel.
TEST(RsTransferFunc, EveryModeMatchesItsFormulaOverAGridOfColours) {
    const float grid[][3] = {{0, 0, 0},    {1, 1, 1},          {0.5f, 0.5f, 0.5f},    {2, 2, 2},         {1, 0.5f, 0},
                             {0.25f, 0.75f, 0.5f}, {0.5f, 0, 1},   {1.5f, 0.25f, 0.75f},  {0.75f, 0.75f, 0.25f},
                             {0, 0.25f, 0}, {0.125f, 0.5f, 0.5f}, {0.25f, 1.25f, 3},     {-0.25f, 0.5f, 1},
                             {0.75f, -0.5f, 0.25f}};
    const int negatives = 2, count = static_cast<int>(std::size(grid));
    for (const ModeCase& m : referenceTable()) {
        int failures = 0;
        for (int i = 0; i < count - (m.colourSpace ? negatives : 0); ++i)
            for (int j = 0; j < count - (m.colourSpace ? negatives : 0); ++j)
                for (float sa : {0.0f, 0.25f, 0.5f, 0.75f, 1.0f, 1.25f})
                    for (float da : {0.0f, 0.25f, 0.5f, 0.75f, 1.0f, 1.5f})
                        expectReference(m, Rgba(grid[i][0], grid[i][1], grid[i][2], sa),
                                        Rgba(grid[j][0], grid[j][1], grid[j][2], da), 2e-6, failures);
        EXPECT_EQ(failures, 0) << "mode " << int(m.mode);
    }
}

// Off the grid products are inexact; every branch test either compares exact values or sits where
// its two branches meet, so single-precision rounding stays small. The colour-space modes get
// channels of 0 or above, where the hexcone conversion is defined. screen rounds once, from double
// precision: its result is exactly the double formula rounded to float.
TEST(RsTransferFunc, EveryModeMatchesItsFormulaForInexactColours) {
    std::uint32_t state = 12345u;
    auto unit = [&state]() {
        state = state * 1664525u + 1013904223u;
        return static_cast<float>(state >> 8) / 16777216.0f;
    };
    for (const ModeCase& m : referenceTable()) {
        const float low = m.colourSpace ? 0.0f : -0.5f;
        auto channel = [&]() { return low + unit() * 2.0f; };
        int failures = 0;
        for (int i = 0; i < 3000; ++i) {
            const Rgba src(channel(), channel(), channel(), unit()),
                dst(channel(), channel(), channel(), 0.05f + unit());
            expectReference(m, src, dst, 2e-5, failures);
            if (m.mode != Mode::screen) continue;
            Rgba got;
            RsTransferFunc::screen(src, dst, got);
            for (int c = 0; c < 3; ++c) {
                const double s = RsTest::channelOf(src, c), d = RsTest::channelOf(dst, c);
                EXPECT_EQ(RsTest::channelOf(got, c), float(d + s * (1.0 - std::min(d, 1.0)) * double(src.a)));
            }
        }
        EXPECT_EQ(failures, 0) << "mode " << int(m.mode);
    }
}

// Every function reads its inputs before it stores, so the destination may receive the result.
TEST(RsTransferFunc, ResultMayBeTheDestination) {
    for (int m = 0; m < SdMaterial::transferModeCount; ++m) {
        if (m == static_cast<int>(Mode::dissolve)) continue;
        const RsTransferFunc::Function f = RsTransferFunc::getFunction(static_cast<Mode>(m));
        const Rgba src(0.75f, 0.25f, 0.5f, 0.75f), dst(0.25f, 0.5f, 0.125f, 0.5f);
        Rgba separate, inPlace = dst;
        f(src, dst, separate);
        f(src, inPlace, inPlace);
        EXPECT_EQ(std::bit_cast<Bits>(inPlace), std::bit_cast<Bits>(separate)) << "mode " << m;
    }
}

// Dissolve takes the shared generator's next draw u and passes the source at alpha 1, unscaled,
// when sa > u * 0.9999, else keeps the destination whole: never a blend, one draw per call. A copy
// of the generator taken before the call predicts it.
TEST(RsTransferFunc, DissolveDrawsOncePerCallAndPassesAllOrNothing) {
    const Rgba dst(0.1f, 0.2f, 0.3f, 0.4f);
    for (int i = 0; i < 6000; ++i) {
        RnNumRecUniformRng<float> twin = RsTransferFunc::_rand;
        const float threshold = twin.eval() * 0.9999f;
        // Just above or at the threshold, or an alpha that always or never passes.
        const float sa =
            i % 4 == 0 ? std::nextafter(threshold, 2.0f) : i % 4 == 1 ? threshold : i % 4 == 2 ? 1.0f : 0.0f;
        const bool passes = i % 4 == 0 || i % 4 == 2;
        Rgba got(-9, -9, -9, -9);
        RsTransferFunc::dissolve(Rgba(0.7f, 1.5f, -0.25f, sa), dst, got);
        const Rgba want = passes ? Rgba(0.7f, 1.5f, -0.25f, 1.0f) : dst;
        EXPECT_EQ(std::bit_cast<Bits>(got), std::bit_cast<Bits>(want))
            << "alpha " << sa << " gave " << got;
        RnNumRecUniformRng<float> shared = RsTransferFunc::_rand;
        EXPECT_EQ(shared.eval(), twin.eval());
    }
}

// Modes out of range have no function (those in range meet their formulas above, dissolve its own
// test). Only the modes whose result hides the destination at alpha one can be opaque.
TEST(RsTransferFunc, TablesFollowTheModes) {
    EXPECT_EQ(RsTransferFunc::getFunction(Mode::dissolve), &RsTransferFunc::dissolve);
    for (int m = -1; m <= 25; ++m) {
        EXPECT_EQ(RsTransferFunc::getFunction(Mode(m)) == nullptr, m < 0 || m >= SdMaterial::transferModeCount) << m;
        EXPECT_EQ(RsTransferFunc::canBeOpaque(Mode(m)), m == 0 || m == 1 || m == 2) << m;
    }
}

}  // namespace
}  // namespace Zr
