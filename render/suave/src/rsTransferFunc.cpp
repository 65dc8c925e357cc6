#include "rsTransferFunc.h"

#include <bit>
#include <cmath>
#include <cstdint>
#include <iterator>

#include "coHsvColor.h"
#include "rsTolerance.h"

namespace Zr {

RnNumRecUniformRng<float> RsTransferFunc::_rand;

namespace {

using Rgb = CoRgbColorTyped<float>;

// The alpha of "over": the source's coverage plus what it leaves of the destination's.
inline float overAlpha(float sa, float da) {
    return sa + (1.0F - sa) * da;
}

// Applies a per-channel formula f(s, d) to r, g and b and stores the "over" alpha. Everything is
// computed before the first store, so result may alias either input.
template <class ChannelFormula>
inline void compositeChannels(const Rgba& source, const Rgba& destination, Rgba& result,
                              ChannelFormula f) {
    const float r = f(source.r, destination.r);
    const float g = f(source.g, destination.g);
    const float b = f(source.b, destination.b);
    const float a = overAlpha(source.a, destination.a);
    result.r = r;
    result.g = g;
    result.b = b;
    result.a = a;
}

// The destination without its alpha: black where the alpha counts as zero, else d * (1 / da).
inline Rgb unpremultiplied(const Rgba& destination) {
    Rgb out;
    if (RsTolerance::isZero(destination.a)) {
        out.r = 0.0F;
        out.g = 0.0F;
        out.b = 0.0F;
    } else {
        const float inverse = 1.0F / destination.a;
        out.r = destination.r * inverse;
        out.g = destination.g * inverse;
        out.b = destination.b * inverse;
    }
    return out;
}

// The value measure of the colour-space modes. A colour whose channels are all equal has value
// 0 here, not its level: the modes that take their value from such a colour produce black.
inline float valueMeasure(const Rgb& c) {
    const float hi = c.getMax();
    const float lo = c.getMin();
    return lo < hi ? hi : 0.0F;
}

// The saturation measure of the colour-space modes: (max - min) / max, 0 for a grey colour.
inline float saturationMeasure(const Rgb& c) {
    const float hi = c.getMax();
    const float lo = c.getMin();
    return lo < hi ? (hi - lo) / hi : 0.0F;
}

// The frame shared by softlight and the four colour-space modes, per channel: the blended colour
// x is weighted by the destination's coverage, and the premultiplied destination is weighted by
// its own alpha once more.
inline float blendFrame(float s, float x, float d, float sa, float da) {
    return (s + (x - s) * da) * sa + d * (1.0F - sa) * da;
}

// Builds R from a hue, saturation and value and lays it over the destination in the shared frame.
inline void compositeHsv(const Rgba& source, const Rgba& destination, Rgba& result, float h,
                         float s, float v) {
    const Rgb blended = CoHsvColor(h, s, v).convertToRgb();
    const float sa = source.a;
    const float da = destination.a;
    const float r = blendFrame(source.r, blended.r, destination.r, sa, da);
    const float g = blendFrame(source.g, blended.g, destination.g, sa, da);
    const float b = blendFrame(source.b, blended.b, destination.b, sa, da);
    const float a = overAlpha(sa, da);
    result.r = r;
    result.g = g;
    result.b = b;
    result.a = a;
}

// The factor shared by subtract and difference; negative for a destination alpha below 0.5, so
// that the source is then added.
inline float subtractFactor(float da) {
    return da - 1.0F + da;
}

// Overlay's and hardlight's two branches; they differ only in what the branch tests.
inline float overlayDark(float s, float d, float sa, float da) {
    return d * (1.0F - sa) + s * sa * (1.0F - da + d);
}

inline float overlayLight(float s, float d, float sa) {
    return s * (1.0F - d) * sa + d;
}

// Darken's and lighten's two branches.
inline float keepDestination(float s, float d, float sa, float da) {
    return (1.0F - da) * s * sa + d;
}

inline float sourceOver(float s, float d, float sa) {
    return s * sa + d * (1.0F - sa);
}

inline float softlightChannel(float s, float unpremultipliedD) {
    const float dd = unpremultipliedD;
    if (0.5F > s) return dd * ((1.0F - dd) * s * 2.0F + dd);
    const float e = dd > 0.0F ? dd : 0.0F;
    return (s - 1.0F + s) * (std::sqrt(e) - e) + e;
}

// The threshold below which a draw lets the dissolving source through is u times 0.9999, so
// that a source of alpha 1 passes for every draw in [0, 1).
constexpr float kDissolveScale = 0.9999F;
static_assert(std::bit_cast<std::uint32_t>(kDissolveScale) == 0x3f7ff972U);

// Indexed by the mode's number, which is fixed by the scene description.
constexpr RsTransferFunc::Function kFunctions[] = {
    &RsTransferFunc::normal,     &RsTransferFunc::lumapremul,     &RsTransferFunc::dissolve,
    &RsTransferFunc::add,        &RsTransferFunc::subtract,       &RsTransferFunc::multiply,
    &RsTransferFunc::spotlight,  &RsTransferFunc::spotlightBlend, &RsTransferFunc::screen,
    &RsTransferFunc::overlay,    &RsTransferFunc::softlight,      &RsTransferFunc::hardlight,
    &RsTransferFunc::darken,     &RsTransferFunc::lighten,        &RsTransferFunc::difference,
    &RsTransferFunc::exclusion,  &RsTransferFunc::hue,            &RsTransferFunc::saturation,
    &RsTransferFunc::color,      &RsTransferFunc::luminance,
};
static_assert(std::size(kFunctions) == SdMaterial::transferModeCount);
static_assert(static_cast<int>(SdMaterial::TransferMode::screen) == 8);
static_assert(static_cast<int>(SdMaterial::TransferMode::luminance) == 19);

}  // namespace

RsTransferFunc::Function RsTransferFunc::getFunction(SdMaterial::TransferMode mode) {
    const auto index = static_cast<long long>(mode);
    if (index < 0 || index >= SdMaterial::transferModeCount) return nullptr;
    return kFunctions[index];
}

bool RsTransferFunc::canBeOpaque(SdMaterial::TransferMode mode) {
    using Mode = SdMaterial::TransferMode;
    return mode == Mode::normal || mode == Mode::lumapremul || mode == Mode::dissolve;
}

void RsTransferFunc::normal(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    compositeChannels(source, destination, result,
                      [sa](float s, float d) { return s * sa + d * (1.0F - sa); });
}

void RsTransferFunc::lumapremul(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    compositeChannels(source, destination, result,
                      [sa](float s, float d) { return s + d * (1.0F - sa); });
}

void RsTransferFunc::dissolve(const Rgba& source, const Rgba& destination, Rgba& result) {
    // The qualified call goes straight to the generator's own function, not through its table.
    const float u = _rand.RnNumRecUniformRng<float>::eval();
    if (source.a > u * kDissolveScale) {
        const float r = source.r;
        const float g = source.g;
        const float b = source.b;
        result.r = r;
        result.g = g;
        result.b = b;
        result.a = 1.0F;
    } else {
        result = destination;
    }
}

void RsTransferFunc::add(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    compositeChannels(source, destination, result, [sa](float s, float d) { return s * sa + d; });
}

void RsTransferFunc::subtract(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    const float factor = subtractFactor(destination.a);
    compositeChannels(source, destination, result,
                      [sa, factor](float s, float d) { return d - s * sa * factor; });
}

void RsTransferFunc::multiply(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    const float da = destination.a;
    compositeChannels(source, destination, result, [sa, da](float s, float d) {
        return d * (1.0F - sa) + s * sa * (d + 1.0F - da);
    });
}

void RsTransferFunc::spotlight(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    const float da = destination.a;
    compositeChannels(source, destination, result, [sa, da](float s, float d) {
        return d * (1.0F - sa) + s * sa * (d + d + 1.0F - da);
    });
}

void RsTransferFunc::spotlightBlend(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    const float da = destination.a;
    compositeChannels(source, destination, result,
                      [sa, da](float s, float d) { return d + s * sa * (1.0F + d - da); });
}

void RsTransferFunc::screen(const Rgba& source, const Rgba& destination, Rgba& result) {
    // The colour is evaluated in double and rounded once at the store; a destination above 1
    // counts as 1 in the factor.
    const double sa = source.a;
    compositeChannels(source, destination, result, [sa](float sf, float df) {
        const double s = sf;
        const double d = df;
        const double limited = 1.0 > d ? d : 1.0;
        return static_cast<float>(d + s * (1.0 - limited) * sa);
    });
}

void RsTransferFunc::overlay(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    const float da = destination.a;
    compositeChannels(source, destination, result, [sa, da](float s, float d) {
        return 0.5F * da > d ? overlayDark(s, d, sa, da) : overlayLight(s, d, sa);
    });
}

void RsTransferFunc::softlight(const Rgba& source, const Rgba& destination, Rgba& result) {
    const Rgb dd = unpremultiplied(destination);
    const float sa = source.a;
    const float da = destination.a;
    const float r =
        blendFrame(source.r, softlightChannel(source.r, dd.r), destination.r, sa, da);
    const float g =
        blendFrame(source.g, softlightChannel(source.g, dd.g), destination.g, sa, da);
    const float b =
        blendFrame(source.b, softlightChannel(source.b, dd.b), destination.b, sa, da);
    const float a = overAlpha(sa, da);
    result.r = r;
    result.g = g;
    result.b = b;
    result.a = a;
}

void RsTransferFunc::hardlight(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    const float da = destination.a;
    compositeChannels(source, destination, result, [sa, da](float s, float d) {
        return 0.5F > s ? overlayDark(s, d, sa, da) : overlayLight(s, d, sa);
    });
}

void RsTransferFunc::darken(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    const float da = destination.a;
    compositeChannels(source, destination, result, [sa, da](float s, float d) {
        return s * da > d ? keepDestination(s, d, sa, da) : sourceOver(s, d, sa);
    });
}

void RsTransferFunc::lighten(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    const float da = destination.a;
    compositeChannels(source, destination, result, [sa, da](float s, float d) {
        return d > s * da ? keepDestination(s, d, sa, da) : sourceOver(s, d, sa);
    });
}

void RsTransferFunc::difference(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    const float da = destination.a;
    const float factor = subtractFactor(da);
    compositeChannels(source, destination, result, [sa, da, factor](float s, float d) {
        return d > s * da ? d - s * sa * factor : d * ((1.0F - sa) - sa) + s * sa;
    });
}

void RsTransferFunc::exclusion(const Rgba& source, const Rgba& destination, Rgba& result) {
    const float sa = source.a;
    compositeChannels(source, destination, result,
                      [sa](float s, float d) { return (1.0F - d - d) * s * sa + d; });
}

void RsTransferFunc::hue(const Rgba& source, const Rgba& destination, Rgba& result) {
    const Rgb dd = unpremultiplied(destination);
    const CoHsvColor fromSource = CoHsvColor::convertFromRgb(source.getRgb());
    compositeHsv(source, destination, result, fromSource.h, saturationMeasure(dd),
                 valueMeasure(dd));
}

void RsTransferFunc::saturation(const Rgba& source, const Rgba& destination, Rgba& result) {
    const CoHsvColor fromDestination = CoHsvColor::convertFromRgb(unpremultiplied(destination));
    compositeHsv(source, destination, result, fromDestination.h,
                 saturationMeasure(source.getRgb()), fromDestination.v);
}

void RsTransferFunc::color(const Rgba& source, const Rgba& destination, Rgba& result) {
    const Rgb dd = unpremultiplied(destination);
    const CoHsvColor fromSource = CoHsvColor::convertFromRgb(source.getRgb());
    compositeHsv(source, destination, result, fromSource.h, fromSource.s, valueMeasure(dd));
}

void RsTransferFunc::luminance(const Rgba& source, const Rgba& destination, Rgba& result) {
    const CoHsvColor fromDestination = CoHsvColor::convertFromRgb(unpremultiplied(destination));
    compositeHsv(source, destination, result, fromDestination.h, fromDestination.s,
                 valueMeasure(source.getRgb()));
}

}  // namespace Zr
