#pragma once
// The resolve of the A-buffer: from per-pixel lists of fragments that own some of the pixel's 16
// samples to filtered pixels of the output tile.
//
// Each pixel starts from the background where the background tile covers it, or from the fill
// colour elsewhere (straight colours, premultiplied first). Its fragments are laid over it in list
// order, each through its own transfer function, separately for each group of samples that the
// same fragments cover: a fragment splits the group it meets into the samples it covers, which go
// on with the blended colour, and those it does not, which go on as they were. Each group's
// colour is then scattered into the output pixels within the kernel's reach with the weight of the
// group's samples (rsFilterTable.h).
//
// Output rows gather in a ring of 2 * support + 1 rows; a row is finished when the last source row
// that reaches it has been scattered: divided by its alpha if asked, then scaled by the weight (so
// that the weight scales the straight colour as well as alpha), and written. Only the pixels at
// least the support inside the region are written: the region's margin serves the filter.
#include "coRgbaColorTyped.h"
#include "geRectangle.h"
#include "ixReadGuard.h"
#include "ixWriteGuard.h"
#include "rsAFragment.h"
#include "rsFilterKernel.h"

namespace Zr {

class RsABuffer;

class RsImageCreatorA {
public:
    using Rgba = CoRgbaColorTyped<float>;

    // Resolves the buffer's fragment lists; region is the buffer's own pixel region.
    static void createImage(RsABuffer& buffer, const GeRectangle<int>& region, const RsFilterKernel& kernel,
                            bool accumulate, float weight, bool unpremultiply, const Rgba& fillColor,
                            const IxReadGuard& background, const IxWriteGuard& output);

    // Resolves the lists of region (one head per pixel, row after row, region width per row) into
    // the output pixels x0 + support <= x < x1 - support, y0 + support <= y < y1 - support.
    // accumulate selects the adding row writers; weight scales the finished pixel; fillColor is the
    // start colour of every pixel the background does not cover, and background may be an empty
    // guard. An output format outside the nine aborts before any pixel is written.
    static void createImage(RsAFragment* const* lists, const GeRectangle<int>& region, const RsFilterKernel& kernel,
                            bool accumulate, float weight, bool unpremultiply, const Rgba& fillColor,
                            const IxReadGuard& background, const IxWriteGuard& output);

    RsImageCreatorA() = delete;
};

}  // namespace Zr
