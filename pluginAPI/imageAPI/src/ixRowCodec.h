#pragma once
// Row readers and writers between tile memory in any pixel format and float RGBA colours.
// A loop picks its reader or writer once for the format and then calls it per row, so the format
// decision is never taken per pixel.
//
// Readers always produce all four channels: a missing alpha reads as 1, missing colour channels
// of an ALPHA pixel read as 0. Writers store only the channels the format has: RGB drops alpha,
// ALPHA keeps alpha only. Channels convert through IxPixelConvert; a COMPLEX channel reads its
// real part and is written as (value, 0).
#include "coRgbaColorTyped.h"
#include "ixPixelFormat.h"

namespace Zr {

class IxRowCodec {
public:
    using Rgba = CoRgbaColorTyped<float>;
    // Reads count pixels from src into dst.
    using Reader = void (*)(const unsigned char* src, Rgba* dst, int count);
    // Writes count colours from src into the pixels at dst.
    using Writer = void (*)(unsigned char* dst, const Rgba* src, int count);

    // Both abort through Assertions::throwProgramAborted for a channel count or depth outside
    // the enumerations of IxPixelFormat.
    static Reader selectReader(const IxPixelFormat& format);
    static Writer selectWriter(const IxPixelFormat& format);
};

}  // namespace Zr
