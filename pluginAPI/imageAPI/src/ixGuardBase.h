#pragma once
// What read and write guards have in common: the description of the tile they hold, readable
// without a call by the library's inner loops, and the shared hold on its pixels.
//
// A default guard is empty: it holds no tile, its tile handle is null, its rectangle empty.
// Guards are values: copies share one hold on the pixels, which stay locked in memory until the
// last copy goes. Nothing in a guard changes once it is taken, so its members may be read from
// any thread.
#include <ostream>

#include "geRectangle.h"
#include "ixPixelFormat.h"
#include "ixTileLock.h"
#include "ixTileStorage.h"
#include "rcShdPtr.h"

namespace Zr {

class IxGuardBase {
public:
    bool holdsTile() const { return _tileHandle != nullptr; }
    // Bytes from one pixel to the next within a row.
    int getBytesPerPixel() const { return _pixelFormat.getBytesPerPixel(); }

    // Prints the members under their names, for diagnostics.
    void dump(std::ostream& os) const;

    IxPixelFormat _pixelFormat;
    GeRectangle<int> _rectangle;
    // The pixels held; null for an empty guard.
    const IxTileStorage* _tileHandle;
    // Bytes from a pixel row to the next.
    int _rowStride;

protected:
    IxGuardBase();
    explicit IxGuardBase(const RCShdPtr<IxTileStorage>& storage);

    // The storage held, for the guards' own constructors; null for an empty guard.
    IxTileStorage* getStorage() const { return _lock ? _lock->getStorage().get() : nullptr; }
    const RCShdPtr<IxTileLock>& getLock() const { return _lock; }

private:
    RCShdPtr<IxTileLock> _lock;
};

}  // namespace Zr
