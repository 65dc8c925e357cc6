#pragma once
// A view of one row of a write guard's tile as an array of colours, addressed by the tile's own
// x coordinates. It holds a copy of the guard, so the row stays valid while the view lives.
//
// Pixel is a colour type laid out exactly like one pixel of the guard's format; IxScanlinePixel
// says which format that is. The library uses IxScanline<CoRgbaColorTyped<float>> on float RGBA
// tiles.
#include <cstddef>

#include "assertions.h"
#include "coRgbaColorTyped.h"
#include "coRgbColorTyped.h"
#include "ixWriteGuard.h"

namespace Zr {

// The pixel format a scanline's colour type stands for.
template <class Pixel>
struct IxScanlinePixel;

template <>
struct IxScanlinePixel<CoRgbaColorTyped<float>> {
    static constexpr IxPixelFormat::Comps COMPS = IxPixelFormat::RGBA;
    static constexpr IxPixelFormat::Depth DEPTH = IxPixelFormat::FLOAT32;
};

template <>
struct IxScanlinePixel<CoRgbColorTyped<float>> {
    static constexpr IxPixelFormat::Comps COMPS = IxPixelFormat::RGB;
    static constexpr IxPixelFormat::Depth DEPTH = IxPixelFormat::FLOAT32;
};

template <>
struct IxScanlinePixel<float> {
    static constexpr IxPixelFormat::Comps COMPS = IxPixelFormat::ALPHA;
    static constexpr IxPixelFormat::Depth DEPTH = IxPixelFormat::FLOAT32;
};

template <class Pixel>
class IxScanline {
public:
    // Row y of the guard's tile. Asserts that the guard holds a tile of Pixel's format and that y
    // lies within its rectangle.
    IxScanline(const IxWriteGuard& guard, int y);
    virtual ~IxScanline() = default;

    int getY() const { return _y; }
    // The row's pixels are x0 up to, not including, x1.
    int getX0() const { return _guard._rectangle.x0; }
    int getX1() const { return _guard._rectangle.x1; }
    int getWidth() const { return getX1() > getX0() ? getX1() - getX0() : 0; }

    // The pixel at column x of the tile's coordinates; x within [x0, x1), unchecked.
    Pixel& operator[](int x) const { return _row[x - getX0()]; }
    Pixel* begin() const { return _row; }
    Pixel* end() const { return _row + getWidth(); }

private:
    static_assert(sizeof(Pixel) == static_cast<std::size_t>(IxScanlinePixel<Pixel>::COMPS) *
                                       (IxScanlinePixel<Pixel>::DEPTH / 8),
                  "a scanline's colour type must have the layout of one pixel");

    IxWriteGuard _guard;
    int _y;
    Pixel* _row;  // the pixel at (x0, y)
};

template <class Pixel>
IxScanline<Pixel>::IxScanline(const IxWriteGuard& guard, int y) : _guard(guard), _y(y), _row(nullptr) {
    constexpr const char* kSourceFile = ".\\pluginAPI/imageAPI/src/ixScanline.h";
    ZR_ASSERT_AT(guard.holdsTile(), kSourceFile, __LINE__);
    ZR_ASSERT_AT(guard._pixelFormat._comps == IxScanlinePixel<Pixel>::COMPS, kSourceFile, __LINE__);
    ZR_ASSERT_AT(guard._pixelFormat._depth == IxScanlinePixel<Pixel>::DEPTH, kSourceFile, __LINE__);
    ZR_ASSERT_AT(y >= guard._rectangle.y0 && y < guard._rectangle.y1, kSourceFile, __LINE__);
    _row = reinterpret_cast<Pixel*>(guard.getPixelAddress(guard._rectangle.x0, y));
}

}  // namespace Zr
