#pragma once
// What the image creators share: the row readers and writers between a tile's pixels and a row of
// float colours, for the nine pixel formats of one, three or four channels of 8-bit, half or float.
//
// The image creators do all their work on one row of Rgba colours; pixel formats exist only at the
// two ends of that row. A creator picks its reader and writer once per call, by the formats of the
// background and the output, and calls them per row through plain function pointers.
//
// Readers always produce all four floats of each colour: a missing alpha reads as 1, the colour of
// an alpha-only pixel as 0. Writers store only the channels the format has: RGB drops alpha,
// ALPHA keeps alpha alone. Channels convert through IxPixelConvert.
//
// The adding writers add a row to what the output holds, for renders that accumulate several
// passes: a colour whose alpha is zero adds nothing and is skipped (even for an RGB output that
// stores no alpha); float channels add without clamp, half channels add in float and store the
// rounded half of the sum, bytes add the rounded byte of the colour and saturate at 255, so that
// each pass is rounded and saturated on its own.
#include "coRgbaColorTyped.h"

namespace Zr {

class RsImageCreatorUtil {
public:
    using Rgba = CoRgbaColorTyped<float>;

    // Fills the colours [rowBegin, rowEnd) from the pixels starting at pixels.
    using RowReader = void (*)(Rgba* rowBegin, Rgba* rowEnd, const unsigned char* pixels);
    // Stores the colours [rowBegin, rowEnd) into the pixels starting at pixels.
    using RowWriter = void (*)(const Rgba* rowBegin, const Rgba* rowEnd, unsigned char* pixels);

    // The pair of row functions of one call.
    struct RowFunctions {
        RowReader _reader = nullptr;
        RowWriter _writer = nullptr;
    };

    // Stores the reader of (comps, depth) in the table. An unknown channel count at a known depth
    // aborts through Assertions::throwProgramAborted; an unknown depth leaves the table's reader
    // as it was, which does no harm where nothing is read.
    static void selectRowReader(RowFunctions& table, int comps, int depth);
    // Stores the replacing (accumulate false) or adding (accumulate true) writer of (comps, depth)
    // in the table. An unknown channel count or depth aborts.
    static void selectRowWriter(RowFunctions& table, int comps, int depth, bool accumulate);
    // The replacing writer of (comps, depth), with the abort rules of selectRowWriter.
    static RowWriter getReplacingRowWriter(int comps, int depth);

    RsImageCreatorUtil() = delete;
};

}  // namespace Zr
