#pragma once
// A block of pixels with a format and a rectangle. Access to the pixels goes through guards
// (IxReadGuard, IxWriteGuard), which share the pixels with the tile: a guard keeps them alive
// after the IxTile object itself is gone, so a tile may be made on the stack and handed on as a
// guard.
#include "coRgbaColorTyped.h"
#include "geRectangle.h"
#include "ixPixelFormat.h"
#include "ixTileStorage.h"
#include "rcShdPtr.h"

namespace Zr {

class IxTile {
public:
    // Allocates the pixels and sets each to fill, a straight colour written like any colour in
    // the format: RGB keeps r, g, b; ALPHA keeps a. Throws ExOutOfMemory when the pixels cannot
    // be had.
    IxTile(const IxPixelFormat& format, const GeRectangle<int>& rectangle,
           const CoRgbaColorTyped<float>& fill);
    ~IxTile();
    // One tile object per block of pixels; share it through guards.
    IxTile(const IxTile&) = delete;
    IxTile& operator=(const IxTile&) = delete;

    const IxPixelFormat& getPixelFormat() const { return _storage->getPixelFormat(); }
    const GeRectangle<int>& getRectangle() const { return _storage->getRectangle(); }
    int getRowStride() const { return _storage->getRowStride(); }
    // The pixels, shared with the guards taken on this tile.
    const RCShdPtr<IxTileStorage>& getStorage() const { return _storage; }

private:
    RCShdPtr<IxTileStorage> _storage;
};

}  // namespace Zr
