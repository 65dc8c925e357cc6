#include "rsImageCreatorFZ.h"

#include <bit>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "osMemoryArch.h"
#include "rsDeepShadowMap.h"
#include "rsFZBuffer.h"
#include "rsImageCreatorUtil.h"
#include "rsTolerance.h"

namespace Zr {

namespace {

using Rgba = RsImageCreatorFZ::Rgba;

// Below this magnitude (1e-8, bits 0x322bcc77) an alpha is not divided by: the colour goes black.
constexpr float kUnpremultiplyLimit = std::bit_cast<float>(std::uint32_t{0x322bcc77});

int clampTo(int v, int lo, int hi) { return v < lo ? lo : (v > hi ? hi : v); }

// A row of colours aligned to the memory architecture's alignment: one block of width colours
// plus that alignment, the start rounded up to it. The block goes with the object.
class AlignedRow {
public:
    explicit AlignedRow(int width) {
        const OsMemoryArch* arch = OsMemoryArch::getInstance();
        const std::size_t alignment =
            static_cast<std::size_t>(arch != nullptr ? arch->getAlignment() : OsMemoryArch::DEFAULT_ALIGNMENT);
        const std::size_t bytes = static_cast<std::size_t>(width) * sizeof(Rgba) + alignment;
        _block = std::make_unique_for_overwrite<unsigned char[]>(bytes);
        const std::uintptr_t start = reinterpret_cast<std::uintptr_t>(_block.get());
        const std::uintptr_t aligned = (start + alignment - 1) & ~(std::uintptr_t(alignment) - 1);
        _row = reinterpret_cast<Rgba*>(_block.get() + (aligned - start));
    }
    Rgba* get() const { return _row; }

private:
    std::unique_ptr<unsigned char[]> _block;
    Rgba* _row = nullptr;
};

void fill(Rgba* begin, Rgba* end, const Rgba& colour) {
    for (Rgba* p = begin; p < end; ++p) *p = colour;
}

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
        if (unpremultiply) {
            const float factor = std::fabs(pixel.a) <= kUnpremultiplyLimit ? 0.0f : 1.0f / pixel.a;
            pixel.r *= factor;
            pixel.g *= factor;
            pixel.b *= factor;
        }
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
    const int x0 = region.x0, x1 = region.x1, y0 = region.y0, y1 = region.y1;
    const int width = x1 - x0;

    // The part of the region that the background covers: columns left to right, rows top to
    // bottom. Without a background no row falls inside.
    int left = x0, right = x1, top = y0, bottom = y0;
    if (background.holdsTile()) {
        const GeRectangle<int>& b = background._rectangle;
        left = clampTo(b.x0, x0, x1);
        right = clampTo(b.x1, x0, x1);
        top = clampTo(b.y0, y0, y1);
        bottom = clampTo(b.y1, y0, y1);
    }
    const int leftPad = left - x0;
    const int rightPad = x1 - right;

    RsImageCreatorUtil::RowFunctions functions;
    const IxPixelFormat& inFormat = background._pixelFormat;
    const IxPixelFormat& outFormat = output._pixelFormat;
    RsImageCreatorUtil::selectRowReader(functions, inFormat);
    RsImageCreatorUtil::selectRowWriter(functions, outFormat, accumulate);
    if (width <= 0) return;

    const bool scale = !RsTolerance::isEqual(weight, 1.0f);
    const std::ptrdiff_t inPixelBytes = std::ptrdiff_t(inFormat._comps) * (inFormat._depth / 8);
    const std::ptrdiff_t outPixelBytes = std::ptrdiff_t(outFormat._comps) * (outFormat._depth / 8);

    AlignedRow rowBuffer(width);
    Rgba* const row = rowBuffer.get();
    Rgba* const rowEnd = row + width;
    for (int y = y0; y < y1; ++y) {
        if (y < top || y >= bottom) {
            fill(row, rowEnd, fillColor);
        } else {
            if (leftPad > 0) fill(row, row + leftPad, fillColor);
            if (rightPad > 0) fill(rowEnd - rightPad, rowEnd, fillColor);
            if (leftPad + rightPad < width) {
                const unsigned char* pixels = background._basePointer +
                                              std::ptrdiff_t(y) * background._rowStride +
                                              std::ptrdiff_t(left) * inPixelBytes;
                functions._reader(pixels, row + leftPad, width - leftPad - rightPad);
            }
        }
        compositeRow(row, width, lists + std::ptrdiff_t(y - y0) * width, scale, weight, unpremultiply);
        unsigned char* pixels = output._basePointer + std::ptrdiff_t(y) * output._rowStride +
                                std::ptrdiff_t(x0) * outPixelBytes;
        functions._writer(pixels, row, width);
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
