#pragma once
// Row readers and writers between tile memory in any pixel format and float RGBA colours.
// A loop picks its reader or writer once for the format and then calls it per row through a plain
// function pointer, so the format decision is never taken per pixel.
//
// Readers always produce all four channels: a missing alpha reads as 1, missing colour channels
// of an ALPHA pixel read as 0. Writers store only the channels the format has: RGB drops alpha,
// ALPHA keeps alpha only. Channels convert through IxPixelConvert; a COMPLEX channel reads its
// real part and is written as (value, 0).
//
// The adding writers add a row to what the pixels hold, for renders that accumulate several
// passes into one tile. A colour whose alpha is zero (either sign) adds nothing and is skipped,
// also where the format stores no alpha. Float channels add without clamp; half channels add the
// colour rounded to a half and store the rounded half of the sum; byte channels add the colour's
// rounded byte and saturate at 255; so each pass is rounded and saturated on its own. A COMPLEX
// channel adds to its real part.
#include "coRgbaColorTyped.h"
#include "ixPixelFormat.h"

namespace Zr {

class IxRowCodec {
public:
    using Rgba = CoRgbaColorTyped<float>;
    // Reads count pixels from src into dst.
    using Reader = void (*)(const unsigned char* src, Rgba* dst, int count);
    // Writes (or adds) count colours from src into the pixels at dst.
    using Writer = void (*)(unsigned char* dst, const Rgba* src, int count);

    // Each aborts through Assertions::throwProgramAborted for a channel count or depth outside
    // the enumerations of IxPixelFormat.
    static Reader selectReader(const IxPixelFormat& format);
    static Writer selectWriter(const IxPixelFormat& format);
    static Writer selectAddingWriter(const IxPixelFormat& format);
};

}  // namespace Zr
