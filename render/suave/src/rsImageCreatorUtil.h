#pragma once
// What the image creators share: the choice of the row reader of a background and the row writer
// of an output, among the renderer's nine pixel formats of one, three or four channels of 8-bit,
// half or float. The row functions themselves are the plug-in API's (ixRowCodec.h), called
// through plain function pointers.
//
// The image creators do all their work on one row of Rgba colours; pixel formats exist only at the
// two ends of that row. A creator picks its reader and writer once per call, by the formats of the
// background and the output: a replacing writer, or an adding one for renders that accumulate
// passes.
#include "ixPixelFormat.h"
#include "ixRowCodec.h"

namespace Zr {

class RsImageCreatorUtil {
public:
    using Rgba = IxRowCodec::Rgba;
    using RowReader = IxRowCodec::Reader;
    using RowWriter = IxRowCodec::Writer;

    // The pair of row functions of one call.
    struct RowFunctions {
        RowReader _reader = nullptr;
        RowWriter _writer = nullptr;
    };

    // Stores the reader of the format in the table. An unknown channel count at one of the three
    // depths aborts through Assertions::throwProgramAborted; any other depth leaves the table's
    // reader as it was, which does no harm where nothing is read.
    static void selectRowReader(RowFunctions& table, const IxPixelFormat& format);
    // Stores the replacing (accumulate false) or adding (accumulate true) writer of the format in
    // the table. A format outside the nine aborts.
    static void selectRowWriter(RowFunctions& table, const IxPixelFormat& format, bool accumulate);

    RsImageCreatorUtil() = delete;
};

}  // namespace Zr
