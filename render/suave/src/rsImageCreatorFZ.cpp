#include "rsImageCreatorFZ.h"

#include <cstddef>
#include <vector>

#include "rsDeepShadowMap.h"
#include "rsFZBuffer.h"
#include "rsImageCreatorUtil.h"
#include "rsTolerance.h"

namespace Zr {

namespace {

using Rgba = RsImageCreatorFZ::Rgba;
using Util = RsImageCreatorUtil;

// Lays each pixel's fragments over its start colour and finishes it. The transfer functions take
// the colour by reference, which pins it to memory; the finishing works on a copy in registers, so
// that the row is not written and read back in pieces of different sizes.
void compositeRow(Rgba* row, int width, RsFragment* const* lists, bool scale, float weight,
                  bool unpremultiply) {
    for (int i = 0; i < width; ++i) {
        const Rgba start = row[i];
        Rgba pixel(start.r * start.a, start.g * start.a, start.b * start.a, start.a);
        if (const RsFragment* f = lists[i]) {
            Rgba composite = pixel;
            for (; f != nullptr; f = f->_next) {
                Rgba result(0.0f, 0.0f, 0.0f, 1.0f);
                f->_transfer(f->_color, composite, result);
                composite = result;
            }
            pixel = Rgba(composite.r, composite.g, composite.b, composite.a);
        }
        if (scale) pixel *= weight;
        if (unpremultiply) Util::unpremultiply(pixel);
        row[i] = pixel;
    }
}

}  // namespace

void RsImageCreatorFZ::createImage(RsFZBuffer& buffer, const GeRectangle<int>& region, bool accumulate,
                                   float weight, bool unpremultiply, const Rgba& fillColor,
                                   const IxReadGuard& background, const IxWriteGuard& output) {
    createImage(buffer.getLists(), region, accumulate, weight, unpremultiply, fillColor, background, output);
}

void RsImageCreatorFZ::createImage(RsFragment* const* lists, const GeRectangle<int>& region,
                                   bool accumulate, float weight, bool unpremultiply,
                                   const Rgba& fillColor, const IxReadGuard& background,
                                   const IxWriteGuard& output) {
    const int y0 = region.y0, y1 = region.y1;
    const int width = region.x1 - region.x0;

    // The part of the region that the background covers; without a background no row falls inside.
    const Util::BackgroundWindow window(background, region);
    Util::RowFunctions functions;
    Util::selectRowReader(functions, background._pixelFormat);
    Util::selectRowWriter(functions, output._pixelFormat, accumulate);
    if (width <= 0) return;

    const bool scale = !RsTolerance::isEqual(weight, 1.0f);
    Util::AlignedRow rowBuffer(width);
    Rgba* const row = rowBuffer.get();
    Rgba* const rowEnd = row + width;
    for (int y = y0; y < y1; ++y) {
        if (!window.holdsRow(y)) {
            Util::fill(row, rowEnd, fillColor);
        } else {
            if (window.leftPad > 0) Util::fill(row, row + window.leftPad, fillColor);
            if (window.rightPad > 0) Util::fill(rowEnd - window.rightPad, rowEnd, fillColor);
            Util::readBackground(functions, background, window, y, row, width);
        }
        compositeRow(row, width, lists + std::ptrdiff_t(y - y0) * width, scale, weight, unpremultiply);
        Util::writeOutput(functions, output, region.x0, y, row, width);
    }
}

void RsImageCreatorFZ::createDeepShadowMap(RsFZBuffer& buffer, int x, int y, int width, int height,
                                           RsDeepShadowMap& map) {
    using Element = RsTransmittanceFunction::Element;
    const int intSize = static_cast<int>(map.getSize());
    // Two curves for the whole region: the fragments far to near as they come, then the product
    // of their transmittances near to far. Their room is kept from pixel to pixel.
    std::vector<Element> fragments;
    std::vector<Element> curve;
    fragments.reserve(10);
    curve.reserve(10);
    RsFragment* const* lists = buffer.getLists();
    for (int row = 0; row < height; ++row) {
        RsFragment* const* heads = lists + std::ptrdiff_t(row) * width;
        const int first = (y + row) * intSize + x;
        for (int i = 0; i < width; ++i) {
            if (heads[i] == nullptr) continue;  // no caster: the function stays empty
            fragments.clear();
            curve.clear();
            for (const RsFragment* f = heads[i]; f != nullptr; f = f->_next)
                fragments.push_back({static_cast<float>(f->_depth), {f->_color.r, f->_color.g, f->_color.b}});
            CoRgbColorTyped<float> passed(1.0f);
            for (auto e = fragments.rbegin(); e != fragments.rend(); ++e) {
                passed *= e->transmittance;
                curve.push_back({e->depth, passed});
                // Nothing comes through behind a black layer.
                if (passed.r == 0.0f && passed.g == 0.0f && passed.b == 0.0f) break;
            }
            map.setFunction(first + i, curve.data(), static_cast<int>(curve.size()));
        }
    }
}

}  // namespace Zr
