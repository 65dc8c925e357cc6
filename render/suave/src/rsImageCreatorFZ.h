#pragma once
// The resolve of the fragment Z-buffer: from per-pixel fragment lists to the pixels of the output
// tile, one row at a time.
//
// Each pixel starts from the background, where the background tile covers it, or from the fill
// colour elsewhere; both are straight colours and are premultiplied first. The pixel's fragments
// are then laid over it in list order, each through its own transfer function: the head first,
// the last fragment on top. The list order is the compositing order; no depth is looked at. The
// finished pixel is scaled by the weight (unless that is 1 within the float tolerance) and, if
// asked, divided by its alpha, where an alpha of at most 1e-8 in magnitude gives black.
//
// All the work happens on one row of float colours, aligned for whole-colour moves, allocated once
// per call and released on every way out; pixel formats meet it only in the row reader of the
// background and the row writer of the output (rsImageCreatorUtil.h), chosen once per call.
//
// Pixel addresses follow the guards' own coordinates: a guard's base pointer addresses pixel
// (0, 0) of the tile's coordinate system, wherever the tile's rectangle lies.
#include "coRgbaColorTyped.h"
#include "geRectangle.h"
#include "ixReadGuard.h"
#include "ixWriteGuard.h"
#include "rsFragment.h"

namespace Zr {

class RsDeepShadowMap;
class RsFZBuffer;

class RsImageCreatorFZ {
public:
    using Rgba = CoRgbaColorTyped<float>;

    // Resolves the buffer's fragment lists into the pixels of region, which is the buffer's own
    // pixel region: as below, with the buffer's list heads.
    static void createImage(RsFZBuffer& buffer, const GeRectangle<int>& region, bool accumulate, float weight,
                            bool unpremultiply, const Rgba& fillColor, const IxReadGuard& background,
                            const IxWriteGuard& output);

    // Resolves the pixels x0 <= x < x1, y0 <= y < y1 of region into output. lists holds one list
    // head per pixel of the region, row after row, region width entries per row. accumulate
    // selects the adding row writers; weight scales the finished pixel; fillColor is the start
    // colour of every pixel the background does not cover, and background may be an empty guard.
    // An output format outside the nine aborts before any pixel is written.
    static void createImage(RsFragment* const* lists, const GeRectangle<int>& region, bool accumulate,
                            float weight, bool unpremultiply, const Rgba& fillColor,
                            const IxReadGuard& background, const IxWriteGuard& output);

    // Turns the fragments of the buffer's pixels x .. x + width, y .. y + height (map cells) into
    // the deep shadow map's curves. Each fragment's colour is the transmittance of its layer; a
    // pixel's curve is the running product of its layers from the nearest on, one step per layer,
    // and ends at the first layer behind which all three channels are exactly 0. Alpha is not
    // read. A pixel without fragments keeps its empty curve.
    static void createDeepShadowMap(RsFZBuffer& buffer, int x, int y, int width, int height, RsDeepShadowMap& map);

    RsImageCreatorFZ() = delete;
};

}  // namespace Zr
