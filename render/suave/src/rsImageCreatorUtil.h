#pragma once
// What the image creators share: the choice of the row reader of a background and the row writer
// of an output, among the renderer's nine pixel formats of one, three or four channels of 8-bit,
// half or float; the aligned row of colours they work on; the part of a region that the background
// covers and the reading of it; and the division of a finished pixel by its alpha. The row
// functions themselves are the plug-in API's (ixRowCodec.h), called through plain function
// pointers.
//
// The image creators do all their work on rows of Rgba colours; pixel formats exist only at the
// two ends of such a row. A creator picks its reader and writer once per call, by the formats of the
// background and the output: a replacing writer, or an adding one for renders that accumulate
// passes.
//
// Pixel addresses follow the guards' own coordinates: a guard's base pointer addresses pixel
// (0, 0) of the tile's coordinate system, wherever the tile's rectangle lies.
#include <bit>
#include <cmath>
#include <cstdint>
#include <memory>

#include "geRectangle.h"
#include "ixPixelFormat.h"
#include "ixReadGuard.h"
#include "ixRowCodec.h"
#include "ixWriteGuard.h"

namespace Zr {

class RsImageCreatorUtil {
public:
    using Rgba = IxRowCodec::Rgba;
    using RowReader = IxRowCodec::Reader;
    using RowWriter = IxRowCodec::Writer;

    // Below this magnitude (1e-8, bits 0x322bcc77) an alpha is not divided by: the colour goes black.
    static constexpr float kUnpremultiplyLimit = std::bit_cast<float>(std::uint32_t{0x322bcc77});

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

    // A row of colours aligned to the memory architecture's alignment: one block of width colours
    // plus that alignment, the start rounded up to it. The block goes with the object.
    class AlignedRow {
    public:
        explicit AlignedRow(int width);
        Rgba* get() const { return _row; }

    private:
        std::unique_ptr<unsigned char[]> _block;
        Rgba* _row = nullptr;
    };

    // The part of a region that a background covers: columns left to right, rows top to bottom,
    // and the columns of the region on either side of it. Without a background no row falls
    // inside (top = bottom = the region's first row) and there is no padding.
    struct BackgroundWindow {
        BackgroundWindow(const IxReadGuard& background, const GeRectangle<int>& region);
        bool holdsRow(int y) const { return y >= top && y < bottom; }
        int left, right, top, bottom;
        int leftPad, rightPad;
    };

    // Reads scanline y of the background between the window's paddings into row, which holds the
    // region's width colours; the paddings are left as they are.
    static void readBackground(const RowFunctions& table, const IxReadGuard& background,
                               const BackgroundWindow& window, int y, Rgba* row, int width);
    // Writes count colours to the output from pixel (x, y) on.
    static void writeOutput(const RowFunctions& table, const IxWriteGuard& output, int x, int y, const Rgba* row,
                            int count);

    static void fill(Rgba* begin, Rgba* end, const Rgba& colour) {
        for (Rgba* p = begin; p < end; ++p) *p = colour;
    }

    // Divides the colour by alpha, which stays; an alpha of at most 1e-8 in magnitude gives black.
    static void unpremultiply(Rgba& pixel) {
        const float factor = std::fabs(pixel.a) <= kUnpremultiplyLimit ? 0.0f : 1.0f / pixel.a;
        pixel.r *= factor;
        pixel.g *= factor;
        pixel.b *= factor;
    }

    RsImageCreatorUtil() = delete;
};

}  // namespace Zr
