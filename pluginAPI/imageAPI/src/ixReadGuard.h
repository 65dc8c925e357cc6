#pragma once
// Read access to a tile for the guard's lifetime. Pixel (x, y) of the tile's coordinates lies at
// _basePointer + y * _rowStride + x * bytes-per-pixel; _basePointer itself addresses pixel (0, 0),
// not the rectangle's corner, and is null for an empty guard. An empty read guard is a legal
// "no image", for instance as a background.
#include <cstddef>

#include "ixGuardBase.h"
#include "ixTile.h"
#include "ixWriteGuard.h"

namespace Zr {

class IxReadGuard : public IxGuardBase {
public:
    // An empty guard.
    IxReadGuard();
    explicit IxReadGuard(const IxTile& tile);
    // Reads the tile that the write guard holds, sharing its hold; both may live at once and this
    // guard sees what is written through the other. From an empty write guard, an empty guard.
    IxReadGuard(const IxWriteGuard& writer);

    const unsigned char* getPixelAddress(int x, int y) const {
        return _basePointer + static_cast<std::ptrdiff_t>(y) * _rowStride +
               static_cast<std::ptrdiff_t>(x) * getBytesPerPixel();
    }

    const unsigned char* _basePointer;

protected:
    explicit IxReadGuard(const RCShdPtr<IxTileStorage>& storage);
};

}  // namespace Zr
