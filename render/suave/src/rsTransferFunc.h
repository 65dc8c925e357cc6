#pragma once
// The twenty blending modes with which a fragment is laid over the pixel behind it.
//
// A material's transfer mode picks one function once, when its fragments are stored; the image
// creators call the stored pointer per fragment while they resolve a pixel. Each function reads a
// source (the fragment's colour, straight in every mode but lumapremul, where it is premultiplied)
// and a destination (the pixel so far, premultiplied) and writes a premultiplied result. Colours
// are floats and nothing is clamped, so values above 1 and below 0 pass through.
//
// Several formulas deliberately differ from the textbook forms of the same names (subtract's
// factor, screen's double precision, the extra factor of destination alpha in softlight and the
// four modes of colour space, the value of a grey colour being 0): the pictures that existing
// scenes produce depend on them, so they are kept as they are.
//
// All functions are plain, allocate nothing and call nothing virtual; all but dissolve are pure.
// Every function reads all of its inputs before it stores the result, so the result may even be
// the destination itself.
#include "coRgbaColorTyped.h"
#include "rnNumRecUniformRng.h"
#include "sdMaterial.h"

namespace Zr {

class RsTransferFunc {
public:
    using Rgba = CoRgbaColorTyped<float>;
    using Function = void (*)(const Rgba& source, const Rgba& destination, Rgba& result);

    // The function of a mode; a null pointer for a value outside the twenty modes.
    static Function getFunction(SdMaterial::TransferMode mode);
    // True for the modes whose fragment, at alpha 1, hides whatever lies behind it: normal,
    // lumapremul and dissolve.
    static bool canBeOpaque(SdMaterial::TransferMode mode);

    // Unless stated otherwise the result's alpha is sa + (1 - sa) * da ("over" alpha).
    static void normal(const Rgba& source, const Rgba& destination, Rgba& result);
    // The source is premultiplied already.
    static void lumapremul(const Rgba& source, const Rgba& destination, Rgba& result);
    // All or nothing: the opaque source or the destination, chosen by a draw from _rand.
    static void dissolve(const Rgba& source, const Rgba& destination, Rgba& result);
    static void add(const Rgba& source, const Rgba& destination, Rgba& result);
    static void subtract(const Rgba& source, const Rgba& destination, Rgba& result);
    static void multiply(const Rgba& source, const Rgba& destination, Rgba& result);
    static void spotlight(const Rgba& source, const Rgba& destination, Rgba& result);
    static void spotlightBlend(const Rgba& source, const Rgba& destination, Rgba& result);
    // Colour in double precision, alpha in single.
    static void screen(const Rgba& source, const Rgba& destination, Rgba& result);
    static void overlay(const Rgba& source, const Rgba& destination, Rgba& result);
    static void softlight(const Rgba& source, const Rgba& destination, Rgba& result);
    static void hardlight(const Rgba& source, const Rgba& destination, Rgba& result);
    static void darken(const Rgba& source, const Rgba& destination, Rgba& result);
    static void lighten(const Rgba& source, const Rgba& destination, Rgba& result);
    static void difference(const Rgba& source, const Rgba& destination, Rgba& result);
    static void exclusion(const Rgba& source, const Rgba& destination, Rgba& result);
    // The four modes of colour space: they mix hue, saturation and value of the source and of
    // the unpremultiplied destination.
    static void hue(const Rgba& source, const Rgba& destination, Rgba& result);
    static void saturation(const Rgba& source, const Rgba& destination, Rgba& result);
    static void color(const Rgba& source, const Rgba& destination, Rgba& result);
    static void luminance(const Rgba& source, const Rgba& destination, Rgba& result);

    // The one generator that dissolve draws from, shared by the whole process and not locked:
    // the order of draws follows the order of calls.
    static RnNumRecUniformRng<float> _rand;

    RsTransferFunc() = delete;
};

}  // namespace Zr
