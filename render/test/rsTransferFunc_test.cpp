// Transfer functions: every blending mode against a double-precision formula table over a grid of
// colours, the colour-space modes against a hexcone conversion written here, dissolve's
// all-or-nothing draws, the mode tables and a few worked examples.
#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstdint>
#include <functional>
#include <sstream>
#include <string>
#include <vector>

#include "rsTransferFunc.h"

namespace Zr {
namespace {

using Mode = SdMaterial::TransferMode;

// A colour in double precision for the reference formulas.
struct Ref {
    double c[3];
    double a;
};

Ref toRef(const Rgba& x) { return Ref{{x.r, x.g, x.b}, x.a}; }

std::string describe(const Rgba& x) {
    std::ostringstream os;
    os << "(" << x.r << ", " << x.g << ", " << x.b << ", " << x.a << ")";
    return os.str();
}

// ---- An independent hexcone conversion, hue in degrees ----------------------------------------

struct Hsv {
    double h, s, v;
};

Hsv referenceRgbToHsv(const double c[3]) {
    const double hi = std::max({c[0], c[1], c[2]});
    const double lo = std::min({c[0], c[1], c[2]});
    const double delta = hi - lo;
    Hsv out{0.0, hi > 0.0 ? delta / hi : 0.0, hi};
    if (delta > 0.0) {
        double h;
        if (hi == c[0])
            h = (c[1] - c[2]) / delta;
        else if (hi == c[1])
            h = 2.0 + (c[2] - c[0]) / delta;
        else
            h = 4.0 + (c[0] - c[1]) / delta;
        h *= 60.0;
        if (h < 0.0) h += 360.0;
        out.h = h;
    }
    return out;
}

void referenceHsvToRgb(const Hsv& x, double out[3]) {
    const double chroma = x.v * x.s;
    const double sector = std::fmod(x.h / 60.0, 6.0);
    const double rise = chroma * (1.0 - std::fabs(std::fmod(sector, 2.0) - 1.0));
    double r = 0, g = 0, b = 0;
    if (sector < 1.0) {
        r = chroma, g = rise;
    } else if (sector < 2.0) {
        r = rise, g = chroma;
    } else if (sector < 3.0) {
        g = chroma, b = rise;
    } else if (sector < 4.0) {
        g = rise, b = chroma;
    } else if (sector < 5.0) {
        r = rise, b = chroma;
    } else {
        r = chroma, b = rise;
    }
    const double lift = x.v - chroma;
    out[0] = r + lift;
    out[1] = g + lift;
    out[2] = b + lift;
}

// The measures that the colour-space modes define: a grey colour has value 0 and saturation 0.
double measureValue(const double c[3]) {
    const double hi = std::max({c[0], c[1], c[2]});
    const double lo = std::min({c[0], c[1], c[2]});
    return lo < hi ? hi : 0.0;
}

double measureSat(const double c[3]) {
    const double hi = std::max({c[0], c[1], c[2]});
    const double lo = std::min({c[0], c[1], c[2]});
    return lo < hi ? (hi - lo) / hi : 0.0;
}

// ---- The formula table -------------------------------------------------------------------------

double over(double sa, double da) { return sa + (1.0 - sa) * da; }

// Modes whose colour channel depends on that channel alone.
using ChannelRule = std::function<double(double s, double d, double sa, double da)>;

Ref byChannel(const Ref& src, const Ref& dst, const ChannelRule& rule) {
    Ref out{};
    for (int i = 0; i < 3; ++i) out.c[i] = rule(src.c[i], dst.c[i], src.a, dst.a);
    out.a = over(src.a, dst.a);
    return out;
}

// The destination divided by its alpha, black for alpha 0.
void straightDestination(const Ref& dst, double out[3]) {
    for (int i = 0; i < 3; ++i) out[i] = dst.a == 0.0 ? 0.0 : dst.c[i] / dst.a;
}

// The frame of softlight and the colour-space modes: blended colour x weighted by da, plus the
// premultiplied destination weighted by (1 - sa) and by da again.
Ref frame(const Ref& src, const Ref& dst, const double x[3]) {
    Ref out{};
    for (int i = 0; i < 3; ++i) {
        const double s = src.c[i];
        out.c[i] = (s + (x[i] - s) * dst.a) * src.a + dst.c[i] * (1.0 - src.a) * dst.a;
    }
    out.a = over(src.a, dst.a);
    return out;
}

Ref referenceSoftlight(const Ref& src, const Ref& dst) {
    double dd[3];
    straightDestination(dst, dd);
    double x[3];
    for (int i = 0; i < 3; ++i) {
        const double s = src.c[i];
        const double d = dd[i];
        if (s < 0.5) {
            x[i] = d * (2.0 * s * (1.0 - d) + d);
        } else {
            const double e = std::max(0.0, d);
            x[i] = (2.0 * s - 1.0) * (std::sqrt(e) - e) + e;
        }
    }
    return frame(src, dst, x);
}

enum class Take { fromSource, fromDestination, measureSource, measureDestination };

// A colour-space mode: which colour gives each of hue, saturation and value, and whether the
// colour's own HSV component or the mode's measure is used.
Ref referenceColourSpace(const Ref& src, const Ref& dst, Take hue, Take sat, Take value) {
    double dd[3];
    straightDestination(dst, dd);
    const Hsv hs = referenceRgbToHsv(src.c);
    const Hsv hd = referenceRgbToHsv(dd);
    auto pick = [&](Take t, double Hsv::*component, double (*measure)(const double*)) {
        switch (t) {
        case Take::fromSource: return hs.*component;
        case Take::fromDestination: return hd.*component;
        case Take::measureSource: return measure(src.c);
        case Take::measureDestination: return measure(dd);
        }
        return 0.0;
    };
    const Hsv mixed{pick(hue, &Hsv::h, nullptr), pick(sat, &Hsv::s, measureSat),
                    pick(value, &Hsv::v, measureValue)};
    double x[3];
    referenceHsvToRgb(mixed, x);
    return frame(src, dst, x);
}

struct ModeCase {
    Mode mode;
    const char* name;
    bool colourSpace;  // needs colours that a hexcone conversion handles (no negative channels)
    std::function<Ref(const Ref&, const Ref&)> reference;
};

std::vector<ModeCase> referenceTable() {
    auto rule = [](ChannelRule r) {
        return [r](const Ref& s, const Ref& d) { return byChannel(s, d, r); };
    };
    const auto srcOver = [](double s, double d, double sa) { return s * sa + d * (1.0 - sa); };
    return {
        {Mode::normal, "normal", false, rule([=](double s, double d, double sa, double) {
             return srcOver(s, d, sa);
         })},
        {Mode::lumapremul, "lumapremul", false,
         rule([](double s, double d, double sa, double) { return s + (1.0 - sa) * d; })},
        {Mode::add, "add", false,
         rule([](double s, double d, double sa, double) { return d + sa * s; })},
        {Mode::subtract, "subtract", false,
         rule([](double s, double d, double sa, double da) {
             return d - (2.0 * da - 1.0) * sa * s;
         })},
        {Mode::multiply, "multiply", false,
         rule([](double s, double d, double sa, double da) {
             return (1.0 - sa) * d + sa * s * (1.0 - da + d);
         })},
        {Mode::spotlight, "spotlight", false,
         rule([](double s, double d, double sa, double da) {
             return (1.0 - sa) * d + sa * s * (1.0 - da + 2.0 * d);
         })},
        {Mode::spotlightBlend, "spotlightBlend", false,
         rule([](double s, double d, double sa, double da) {
             return d + sa * s * (1.0 - da + d);
         })},
        {Mode::screen, "screen", false,
         rule([](double s, double d, double sa, double) {
             return d + sa * s * (1.0 - std::min(d, 1.0));
         })},
        {Mode::overlay, "overlay", false,
         rule([](double s, double d, double sa, double da) {
             if (d < da / 2.0) return (1.0 - sa) * d + sa * s * (1.0 - da + d);
             return d + sa * s * (1.0 - d);
         })},
        {Mode::softlight, "softlight", false, referenceSoftlight},
        {Mode::hardlight, "hardlight", false,
         rule([](double s, double d, double sa, double da) {
             if (s < 0.5) return (1.0 - sa) * d + sa * s * (1.0 - da + d);
             return d + sa * s * (1.0 - d);
         })},
        {Mode::darken, "darken", false,
         rule([=](double s, double d, double sa, double da) {
             return d < s * da ? d + sa * s * (1.0 - da) : srcOver(s, d, sa);
         })},
        {Mode::lighten, "lighten", false,
         rule([=](double s, double d, double sa, double da) {
             return s * da < d ? d + sa * s * (1.0 - da) : srcOver(s, d, sa);
         })},
        {Mode::difference, "difference", false,
         rule([](double s, double d, double sa, double da) {
             if (s * da < d) return d - (2.0 * da - 1.0) * sa * s;
             return (1.0 - 2.0 * sa) * d + sa * s;
         })},
        {Mode::exclusion, "exclusion", false,
         rule([](double s, double d, double sa, double) {
             return d + sa * s * (1.0 - 2.0 * d);
         })},
        {Mode::hue, "hue", true,
         [](const Ref& s, const Ref& d) {
             return referenceColourSpace(s, d, Take::fromSource, Take::measureDestination,
                                         Take::measureDestination);
         }},
        {Mode::saturation, "saturation", true,
         [](const Ref& s, const Ref& d) {
             return referenceColourSpace(s, d, Take::fromDestination, Take::measureSource,
                                         Take::fromDestination);
         }},
        {Mode::color, "color", true,
         [](const Ref& s, const Ref& d) {
             return referenceColourSpace(s, d, Take::fromSource, Take::fromSource,
                                         Take::measureDestination);
         }},
        {Mode::luminance, "luminance", true,
         [](const Ref& s, const Ref& d) {
             return referenceColourSpace(s, d, Take::fromDestination, Take::fromDestination,
                                         Take::measureSource);
         }},
    };
}

// Colour channels on a grid of values with few significant bits, so that every comparison in a
// branch decides the same in float and in double. They include black, white, greys, colours with
// two equal channels, values above 1 and one negative channel.
struct Triple {
    float r, g, b;
    bool negative;
};

const std::vector<Triple>& gridColours() {
    static const std::vector<Triple> colours = {
        {0.0f, 0.0f, 0.0f, false},    {1.0f, 1.0f, 1.0f, false},   {0.5f, 0.5f, 0.5f, false},
        {2.0f, 2.0f, 2.0f, false},    {1.0f, 0.5f, 0.0f, false},   {0.25f, 0.75f, 0.5f, false},
        {0.5f, 0.0f, 1.0f, false},    {1.5f, 0.25f, 0.75f, false}, {0.75f, 0.75f, 0.25f, false},
        {0.0f, 0.25f, 0.0f, false},   {0.125f, 0.5f, 0.5f, false}, {0.25f, 1.25f, 3.0f, false},
        {-0.25f, 0.5f, 1.0f, true},   {0.75f, -0.5f, 0.25f, true},
    };
    return colours;
}

const float gridSourceAlphas[] = {0.0f, 0.25f, 0.5f, 0.75f, 1.0f, 1.25f};
const float gridDestinationAlphas[] = {0.0f, 0.25f, 0.5f, 0.75f, 1.0f, 1.5f};

// Runs the mode on one pair and compares with its reference within a relative tolerance;
// reports the first few mismatches of a mode in full and counts them all.
bool matchesReference(const ModeCase& m, const Rgba& src, const Rgba& dst, double tolerance,
                      int& failures) {
    Rgba got(-9.0f, -9.0f, -9.0f, -9.0f);
    RsTransferFunc::getFunction(m.mode)(src, dst, got);
    const Ref want = m.reference(toRef(src), toRef(dst));
    auto near = [tolerance](double g, double w) {
        return std::fabs(g - w) <= tolerance * std::max(1.0, std::fabs(w));
    };
    if (near(got.r, want.c[0]) && near(got.g, want.c[1]) && near(got.b, want.c[2]) &&
        near(got.a, want.a))
        return true;
    if (++failures <= 5) {
        ADD_FAILURE() << m.name << " source " << describe(src) << " destination " << describe(dst)
                      << " gave " << describe(got) << ", expected (" << want.c[0] << ", "
                      << want.c[1] << ", " << want.c[2] << ", " << want.a << ")";
    }
    return false;
}

TEST(RsTransferFuncTest, EveryModeMatchesItsFormulaOverAGridOfColours) {
    for (const ModeCase& m : referenceTable()) {
        ASSERT_NE(RsTransferFunc::getFunction(m.mode), nullptr) << m.name;
        int failures = 0;
        for (const Triple& sc : gridColours()) {
            for (const Triple& dc : gridColours()) {
                if (m.colourSpace && (sc.negative || dc.negative)) continue;
                for (float sa : gridSourceAlphas) {
                    for (float da : gridDestinationAlphas) {
                        matchesReference(m, Rgba(sc.r, sc.g, sc.b, sa), Rgba(dc.r, dc.g, dc.b, da),
                                         2e-6, failures);
                    }
                }
            }
        }
        EXPECT_EQ(failures, 0) << m.name;
    }
}

// The same modes over colours off the coarse grid, where products are inexact: the rounding of
// single precision must stay small. Every branch test either compares exact values (against 0.5,
// or half of an alpha) or sits where its two branches meet, so rounding cannot move a result far.
// The colour-space modes get channels of 0 or above, where the hexcone conversion is defined.
TEST(RsTransferFuncTest, EveryModeMatchesItsFormulaForInexactColours) {
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
            const Rgba src(channel(), channel(), channel(), unit());
            const Rgba dst(channel(), channel(), channel(), 0.05f + unit());
            matchesReference(m, src, dst, 2e-5, failures);
        }
        EXPECT_EQ(failures, 0) << m.name;
    }
}

// screen rounds once, from double precision: its result is exactly the double formula rounded
// to float, which single-precision evaluation would miss in the last bit for many inputs.
TEST(RsTransferFuncTest, ScreenIsEvaluatedInDoublePrecision) {
    std::uint32_t state = 777u;
    auto next = [&state]() {
        state = state * 1664525u + 1013904223u;
        return static_cast<float>(state >> 8) / 16777216.0f * 1.5f;
    };
    int singleWouldDiffer = 0;
    for (int i = 0; i < 5000; ++i) {
        const Rgba src = Rgba(next(), next(), next(), next() / 1.5f);
        const Rgba dst = Rgba(next(), next(), next(), next() / 1.5f);
        Rgba got;
        RsTransferFunc::screen(src, dst, got);
        const float channels[3][3] = {{src.r, dst.r, got.r}, {src.g, dst.g, got.g},
                                      {src.b, dst.b, got.b}};
        for (const auto& ch : channels) {
            const double s = ch[0], d = ch[1];
            const float inDouble =
                static_cast<float>(d + s * (1.0 - (d < 1.0 ? d : 1.0)) * double(src.a));
            EXPECT_EQ(ch[2], inDouble) << describe(src) << " " << describe(dst);
            const float sf = ch[0], df = ch[1];
            const float inSingle = df + sf * (1.0f - (df < 1.0f ? df : 1.0f)) * src.a;
            if (inSingle != inDouble) ++singleWouldDiffer;
        }
        const float alpha = src.a + (1.0f - src.a) * dst.a;
        EXPECT_EQ(got.a, alpha);
    }
    EXPECT_GT(singleWouldDiffer, 0) << "the inputs do not tell the two precisions apart";
}

// Worked examples with numbers computed by hand.
TEST(RsTransferFuncTest, WorkedExamples) {
    struct Example {
        Mode mode;
        Rgba src, dst, expected;
        const char* why;
    };
    const Example examples[] = {
        {Mode::normal, Rgba(0.8f, 0.4f, 0.2f, 0.5f), Rgba(0, 0, 0, 0),
         Rgba(0.4f, 0.2f, 0.1f, 0.5f), "over nothing: the premultiplied source"},
        {Mode::add, Rgba(1, 1, 1, 1), Rgba(1, 1, 1, 1), Rgba(2, 2, 2, 1),
         "nothing clamps"},
        {Mode::screen, Rgba(1, 1, 1, 1), Rgba(1, 1, 1, 1), Rgba(1, 1, 1, 1),
         "white on white keeps the destination"},
        {Mode::screen, Rgba(0.5f, 0.5f, 0.5f, 1), Rgba(1.5f, 0.5f, 0, 1),
         Rgba(1.5f, 0.75f, 0.5f, 1), "a destination above 1 counts as 1 in the factor"},
        {Mode::subtract, Rgba(1, 1, 1, 1), Rgba(0.3f, 0.2f, 0.1f, 0.5f),
         Rgba(0.3f, 0.2f, 0.1f, 1), "destination alpha 0.5: factor 0"},
        {Mode::subtract, Rgba(0.5f, 0.5f, 0.5f, 0.5f), Rgba(0.75f, 0.75f, 0.75f, 1),
         Rgba(0.5f, 0.5f, 0.5f, 1), "destination alpha 1: plain subtraction"},
        {Mode::subtract, Rgba(1, 1, 1, 1), Rgba(0.25f, 0.25f, 0.25f, 0.25f),
         Rgba(0.75f, 0.75f, 0.75f, 1), "destination alpha 0.25: the source adds"},
        {Mode::luminance, Rgba(0.5f, 0.5f, 0.5f, 1), Rgba(0.25f, 0.5f, 0.75f, 1),
         Rgba(0, 0, 0, 1), "a grey source gives value 0"},
        {Mode::luminance, Rgba(0.5f, 0.5f, 0.5f, 0.5f), Rgba(0.25f, 0.5f, 0.75f, 1),
         Rgba(0.125f, 0.25f, 0.375f, 1), "half of black plus half of the destination"},
        {Mode::color, Rgba(1, 0, 0, 1), Rgba(0.5f, 0.5f, 0.5f, 1), Rgba(0, 0, 0, 1),
         "a grey destination gives value 0"},
        {Mode::color, Rgba(0.5f, 0, 0, 1), Rgba(0.25f, 0.5f, 0.25f, 0.5f),
         Rgba(0.75f, 0, 0, 1), "red raised to the destination's value 1, half weighted"},
        {Mode::softlight, Rgba(0.25f, 0.75f, 0.5f, 0.5f), Rgba(0.3f, 0.2f, 0.1f, 0),
         Rgba(0.125f, 0.375f, 0.25f, 0.5f), "a transparent destination counts as black"},
        {Mode::softlight, Rgba(0.75f, 0.75f, 0.75f, 1), Rgba(-0.5f, 0.25f, 1, 1),
         Rgba(0, 0.375f, 1, 1), "a negative channel reaches the root as 0"},
        {Mode::hue, Rgba(0, 0, 1, 1), Rgba(0.5f, 0.25f, 0.25f, 0.5f),
         Rgba(0.25f, 0.25f, 1, 1), "blue hue at saturation 0.5 and value 1, half weighted"},
        {Mode::saturation, Rgba(1, 1, 1, 1), Rgba(0.25f, 0.5f, 0.75f, 1),
         Rgba(0.75f, 0.75f, 0.75f, 1), "a grey source takes all saturation away"},
    };
    for (const Example& e : examples) {
        Rgba got;
        RsTransferFunc::getFunction(e.mode)(e.src, e.dst, got);
        EXPECT_NEAR(got.r, e.expected.r, 1e-6) << e.why;
        EXPECT_NEAR(got.g, e.expected.g, 1e-6) << e.why;
        EXPECT_NEAR(got.b, e.expected.b, 1e-6) << e.why;
        EXPECT_NEAR(got.a, e.expected.a, 1e-6) << e.why;
    }
}

// Every function reads its inputs before it stores, so the destination may receive the result.
TEST(RsTransferFuncTest, ResultMayBeTheDestination) {
    for (int m = 0; m < SdMaterial::transferModeCount; ++m) {
        if (m == static_cast<int>(Mode::dissolve)) continue;
        const RsTransferFunc::Function f = RsTransferFunc::getFunction(static_cast<Mode>(m));
        const Rgba src = Rgba(0.75f, 0.25f, 0.5f, 0.75f);
        const Rgba dst = Rgba(0.25f, 0.5f, 0.125f, 0.5f);
        Rgba separate;
        f(src, dst, separate);
        Rgba inPlace = dst;
        f(src, inPlace, inPlace);
        EXPECT_EQ(describe(inPlace), describe(separate)) << "mode " << m;
    }
}

// ---- dissolve --------------------------------------------------------------------------------

bool sameBits(const Rgba& x, const Rgba& y) {
    return std::bit_cast<std::uint32_t>(x.r) == std::bit_cast<std::uint32_t>(y.r) &&
           std::bit_cast<std::uint32_t>(x.g) == std::bit_cast<std::uint32_t>(y.g) &&
           std::bit_cast<std::uint32_t>(x.b) == std::bit_cast<std::uint32_t>(y.b) &&
           std::bit_cast<std::uint32_t>(x.a) == std::bit_cast<std::uint32_t>(y.a);
}

// Each result is either the source at alpha 1, unscaled, or the destination whole; never a
// blend. The share of sources that pass follows the source's alpha.
TEST(RsTransferFuncTest, DissolveIsAllOrNothing) {
    const Rgba dst = Rgba(0.1f, 0.2f, 0.3f, 0.4f);
    for (float sa : {0.0f, 0.1f, 0.5f, 0.9f, 1.0f, 1.5f}) {
        const Rgba src = Rgba(0.7f, 1.5f, -0.25f, sa);
        const Rgba opaqueSource = Rgba(0.7f, 1.5f, -0.25f, 1.0f);
        const int draws = 20000;
        int passed = 0;
        for (int i = 0; i < draws; ++i) {
            Rgba got = Rgba(-9, -9, -9, -9);
            RsTransferFunc::dissolve(src, dst, got);
            if (sameBits(got, opaqueSource)) {
                ++passed;
            } else {
                ASSERT_TRUE(sameBits(got, dst)) << "blended result " << describe(got);
            }
        }
        const double share = static_cast<double>(passed) / draws;
        if (sa <= 0.0f) {
            EXPECT_EQ(passed, 0) << "an invisible source never passes";
        } else if (sa >= 1.0f) {
            EXPECT_EQ(passed, draws) << "an opaque source always passes";
        } else {
            EXPECT_NEAR(share, sa, 0.02) << "alpha " << sa;
        }
    }
}

// The decision is the shared generator's next draw u against sa > u * 0.9999: a copy of the
// generator taken before the call predicts it, and each call takes exactly one draw.
TEST(RsTransferFuncTest, DissolveDrawsOncePerCallFromTheSharedGenerator) {
    const Rgba dst = Rgba(0.1f, 0.2f, 0.3f, 0.4f);
    for (int i = 0; i < 5000; ++i) {
        RnNumRecUniformRng<float> twin = RsTransferFunc::_rand;
        const float u = twin.eval();
        // An alpha just above or just below the threshold, alternately.
        const float threshold = u * 0.9999f;
        const float sa = (i % 2 == 0) ? std::nextafter(threshold, 2.0f) : threshold;
        const Rgba src = Rgba(0.5f, 0.5f, 0.5f, sa);
        Rgba got;
        RsTransferFunc::dissolve(src, dst, got);
        const bool passed = got.a == 1.0f && got.r == 0.5f;
        EXPECT_EQ(passed, i % 2 == 0) << "u " << u << " alpha " << sa;
        // The shared generator advanced by exactly one draw.
        RnNumRecUniformRng<float> shared = RsTransferFunc::_rand;
        EXPECT_EQ(shared.eval(), twin.eval());
    }
}

// ---- the tables --------------------------------------------------------------------------------

TEST(RsTransferFuncTest, FunctionTableFollowsTheModeNumbers) {
    using F = RsTransferFunc;
    const RsTransferFunc::Function expected[] = {
        &F::normal,     &F::lumapremul,     &F::dissolve,  &F::add,       &F::subtract,
        &F::multiply,   &F::spotlight,      &F::spotlightBlend, &F::screen, &F::overlay,
        &F::softlight,  &F::hardlight,      &F::darken,    &F::lighten,   &F::difference,
        &F::exclusion,  &F::hue,            &F::saturation, &F::color,    &F::luminance,
    };
    static_assert(sizeof(expected) / sizeof(expected[0]) == SdMaterial::transferModeCount);
    for (int m = 0; m < SdMaterial::transferModeCount; ++m)
        EXPECT_EQ(F::getFunction(static_cast<Mode>(m)), expected[m]) << "mode " << m;
    for (int m : {-1, 20, 21, 1000})
        EXPECT_EQ(F::getFunction(static_cast<Mode>(m)), nullptr) << "mode " << m;
}

TEST(RsTransferFuncTest, OnlyNormalLumapremulAndDissolveCanBeOpaque) {
    for (int m = -1; m <= 25; ++m) {
        const bool expected = m == 0 || m == 1 || m == 2;
        EXPECT_EQ(RsTransferFunc::canBeOpaque(static_cast<Mode>(m)), expected) << "mode " << m;
    }
}

}  // namespace
}  // namespace Zr
