#pragma once
// Write access to a tile for the guard's lifetime. Pixel (x, y) of the tile's coordinates lies at
// _basePointer + y * _rowStride + x * bytes-per-pixel; _basePointer itself addresses pixel (0, 0),
// not the rectangle's corner, and is null for an empty guard.
#include <cstddef>

#include "ixGuardBase.h"
#include "ixTile.h"

namespace Zr {

class IxWriteGuard : public IxGuardBase {
public:
    // An empty guard.
    IxWriteGuard();
    // Writing needs a tile that may be changed; see IxTileManip for the unchecked form.
    explicit IxWriteGuard(IxTile& tile);

    unsigned char* getPixelAddress(int x, int y) const {
        return _basePointer + static_cast<std::ptrdiff_t>(y) * _rowStride +
               static_cast<std::ptrdiff_t>(x) * getBytesPerPixel();
    }

    unsigned char* _basePointer;

protected:
    explicit IxWriteGuard(const RCShdPtr<IxTileStorage>& storage);
};

}  // namespace Zr
